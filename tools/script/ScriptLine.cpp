#include "ScriptLine.h"

namespace {

bool isBlank(char c) {
  return c == ' ' || c == '\t' || c == '\r';
}

bool needsQuotes(std::string const& text) {
  if (text.empty())
    return true;
  for (char const c : text) {
    unsigned char const byte = static_cast<unsigned char>(c);
    if (byte <= ' ' || byte >= 0x7f || c == '"' || c == '\\' || c == '#')
      return true;
  }
  return false;
}

}  // namespace

std::string quotedWord(std::string const& text) {
  std::string word = "\"";
  for (char const c : text) {
    if (c == '"' || c == '\\')
      word += '\\';
    word += c;
  }
  return word + "\"";
}

std::string scriptWord(std::string const& text) {
  return needsQuotes(text) ? quotedWord(text) : text;
}

ScriptLine::ScriptLine(std::string const& text) : m_endColumn(text.size() + 1) {
  if (text.size() > kMaximumLength)
    throw CommandError(kMaximumLength + 1, "line of " + std::to_string(text.size()) +
                                               " bytes is longer than the limit of " +
                                               std::to_string(kMaximumLength) + " bytes; nothing of it was applied");
  size_t at = 0;
  while (at < text.size()) {
    if (isBlank(text[at])) {
      ++at;
      continue;
    }
    if (text[at] == '#')
      return;
    ScriptWord word{std::string(), at + 1, text[at] == '"'};
    if (!word.quoted) {
      while (at < text.size() && !isBlank(text[at]))
        word.text += text[at++];
      m_words.push_back(word);
      continue;
    }
    ++at;
    for (;;) {
      if (at == text.size())
        throw CommandError(word.column, "unterminated quote: expected a closing '\"' before the end of the line");
      char const c = text[at++];
      if (c == '"')
        break;
      if (c == '\\' && at < text.size() && (text[at] == '"' || text[at] == '\\'))
        word.text += text[at++];
      else
        word.text += c;
    }
    if (at < text.size() && !isBlank(text[at]))
      throw CommandError(at + 1, "expected a blank after the closing quote");
    m_words.push_back(word);
  }
}
