// ScriptLine: one line of a script cut into words, each with the column it
// starts at, so that every complaint about the line can point at the word it
// is about. Words are separated by blanks and tabs; a word in double quotes
// may hold blanks, and inside quotes \" and \\ stand for " and \. A "#" that
// begins a word starts a comment running to the end of the line. What the
// words mean belongs to the command table. The writing side is here too:
// the word that reads back as a given text.
#pragma once

#include <stdexcept>
#include <string>
#include <vector>

// A line, or one word of it, that cannot be applied. column counts bytes
// from 1; one past the end of the line points behind its last word.
class CommandError : public std::runtime_error {
 public:
  CommandError(size_t column, std::string const& message) : std::runtime_error(message), m_column(column) {}
  size_t column() const { return m_column; }

 private:
  size_t m_column;
};

struct ScriptWord {
  std::string text;
  size_t column;
  // A quoted word is always a value, never a keyword: `set "remove"` sets
  // the text remove.
  bool quoted;
};

class ScriptLine {
 public:
  // Longer lines are refused whole rather than cut, so that no part of a
  // line is ever applied.
  static constexpr size_t kMaximumLength = 64 * 1024;

  // Throws CommandError for an overlong line or an unterminated quote.
  explicit ScriptLine(std::string const& text);

  std::vector<ScriptWord> const& words() const { return m_words; }
  // The column just behind the line's last byte: where a missing word goes.
  size_t endColumn() const { return m_endColumn; }

 private:
  std::vector<ScriptWord> m_words;
  size_t m_endColumn;
};

// text between double quotes, with '"' and '\\' escaped: what a script line
// reads back as exactly text, and how printed values are shown.
std::string quotedWord(std::string const& text);

// text as one word of a script line: bare when it reads back as itself,
// quoted when it is empty or holds a blank, '"', '\\', '#' or a byte
// outside printable ASCII. A line break cannot be in a line at all; the
// caller has to refuse such a text.
std::string scriptWord(std::string const& text);
