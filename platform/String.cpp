#include "String.h"

#include <climits>
#include <cstdarg>
#include <cstdio>

String const String::s_empty;

namespace {

void appendFormatted(std::string& out, char const* format, va_list args) {
  va_list measure;
  va_copy(measure, args);
  int const needed = std::vsnprintf(nullptr, 0, format, measure);
  va_end(measure);
  if (needed <= 0)
    return;
  size_t const start = out.size();
  out.resize(start + static_cast<size_t>(needed) + 1);
  std::vsnprintf(&out[start], static_cast<size_t>(needed) + 1, format, args);
  out.resize(start + static_cast<size_t>(needed));
}

}  // namespace

String& String::format(char const* format, ...) {
  m_text.clear();
  va_list args;
  va_start(args, format);
  appendFormatted(m_text, format, args);
  va_end(args);
  return *this;
}

String& String::concatf(char const* format, ...) {
  va_list args;
  va_start(args, format);
  appendFormatted(m_text, format, args);
  va_end(args);
  return *this;
}

int String::indexOf(char c) const {
  size_t const position = m_text.find(c);
  if (position == std::string::npos || position > static_cast<size_t>(INT_MAX))
    return -1;
  return static_cast<int>(position);
}

template <>
String String::stringOf<unsigned short>(unsigned short value) {
  return String().format("%u", static_cast<unsigned int>(value));
}
