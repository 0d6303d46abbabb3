// SipGrammar: the character classes and small scanners that the SIP address
// parsers share (host characters, URI escapes, case-insensitive scheme
// names). Only byte-level rules live here; the structure of an address
// belongs to the type that parses it. Every helper takes a pointer and a
// length, never relies on a terminating zero and treats a zero byte as an
// ordinary, disallowed character.
#pragma once

#include <cstddef>

namespace SipGrammar {

inline bool isDigit(unsigned char c) {
  return c >= '0' && c <= '9';
}

inline bool isAlpha(unsigned char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}

inline bool isAlphaNum(unsigned char c) {
  return isDigit(c) || isAlpha(c);
}

inline bool isHexDigit(unsigned char c) {
  return isDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

// Linear white space inside a header value; line folding has been undone
// by the message parser, so CR and LF never count as white space here.
inline bool isWhiteSpace(unsigned char c) {
  return c == ' ' || c == '\t';
}

// True when c is one of the bytes of set (a zero byte never is).
inline bool isOneOf(unsigned char c, char const* set) {
  for (; *set; ++set) {
    if (c == static_cast<unsigned char>(*set))
      return true;
  }
  return false;
}

inline bool isMark(unsigned char c) {
  return isOneOf(c, "-_.!~*'()");
}

inline bool isUnreserved(unsigned char c) {
  return isAlphaNum(c) || isMark(c);
}

// A byte of a URI parameter name or value besides escapes: the unreserved
// ones and "[]/:&+$".
inline bool isParameterCharacter(unsigned char c) {
  return isUnreserved(c) || isOneOf(c, "[]/:&+$");
}

// True when every byte of [text, text + length) satisfies allowed, except
// that '%' must start an escape of exactly two hex digits. Escapes are
// checked, never decoded.
template <class Predicate>
bool isEscapedRun(char const* text, size_t length, Predicate allowed) {
  for (size_t i = 0; i < length; ++i) {
    unsigned char const c = static_cast<unsigned char>(text[i]);
    if (c == '%') {
      if (length - i < 3 || !isHexDigit(static_cast<unsigned char>(text[i + 1])) ||
          !isHexDigit(static_cast<unsigned char>(text[i + 2])))
        return false;
      i += 2;
      continue;
    }
    if (!allowed(c))
      return false;
  }
  return true;
}

// ASCII case-insensitive comparison of [text, text + length) with the
// lower-case literal word.
bool equalsIgnoreCase(char const* text, size_t length, char const* word);

// A host name as a URI from the network may carry it: "example.com",
// "gw-1.example.com."; no wildcard, no empty label, no label that starts
// or ends with '-', and a last label that starts with a letter.
bool isHostName(char const* text, size_t length);

// A dotted-quad IPv4 address of one to three digits per part, each part
// at most 255.
bool isIpv4Address(char const* text, size_t length);

// Position of the first byte equal to c in [from, length), or length.
size_t find(char const* text, size_t from, size_t length, char c);

}  // namespace SipGrammar
