#include "StringTokenizer.h"

#include <string>

StringTokenizer::StringTokenizer(String const& text, String const& delimiters)
    : m_text(text), m_delimiters(delimiters) {}

size_t StringTokenizer::startOfNextToken() const {
  return m_text.str().find_first_not_of(m_delimiters.str(), m_position);
}

bool StringTokenizer::hasMoreTokens() const {
  return startOfNextToken() != std::string::npos;
}

String StringTokenizer::nextToken() {
  size_t const start = startOfNextToken();
  if (start == std::string::npos) {
    m_position = m_text.length();
    return String();
  }
  size_t end = m_text.str().find_first_of(m_delimiters.str(), start);
  if (end == std::string::npos)
    end = m_text.length();
  m_position = end;
  return String(m_text.c_str() + start, end - start);
}
