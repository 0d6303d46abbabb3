// StringTokenizer: splits a text into the tokens between delimiter bytes,
// in order. Quoting, escapes and token types do not belong here.
//
// Empty tokens are skipped: a run of delimiters separates two tokens and
// yields nothing in between, and a text that starts with a delimiter yields
// the token after it first (";user;x" gives "user", then "x"). Callers that
// need the first field of a text even when it is empty must look for the
// delimiter themselves. The tokenizer keeps its own copy of both texts.
#pragma once

#include <cstddef>

#include "String.h"

class StringTokenizer {
 public:
  // Each byte of delimiters is a delimiter; with no delimiters the whole
  // text, when it is not empty, is one token.
  StringTokenizer(String const& text, String const& delimiters);

  bool hasMoreTokens() const;
  // The next token; the empty string when there is none left.
  String nextToken();

 private:
  size_t startOfNextToken() const;

  String m_text;
  String m_delimiters;
  // Where the search for the next token begins.
  size_t m_position = 0;
};
