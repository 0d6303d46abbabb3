// String: the utility library's byte string. Equality and order are those of
// the bytes (case-sensitive, no trimming); the text may hold any byte. Code
// that needs a C string reads c_str(), which is always zero-terminated.
// Character-set conversions and case folding do not belong here.
#pragma once

#include "Export.h"

#include <cstddef>
#include <string>

class LS_EXPORT String {
 public:
  // The shared empty text, for operations that hand out a reference.
  static String const s_empty;

  String() = default;
  // A null pointer gives the empty text.
  String(char const* text) : m_text(text ? text : "") {}  // NOLINT: implicit on purpose, like a literal
  String(char const* data, size_t length) : m_text(data, length) {}

  char const* c_str() const { return m_text.c_str(); }
  size_t length() const { return m_text.size(); }
  bool isEmpty() const { return m_text.empty(); }
  char operator[](size_t index) const { return m_text[index]; }

  // printf-style; format replaces the text, concatf appends to it.
  String& format(char const* format, ...) __attribute__((format(printf, 2, 3)));
  String& concatf(char const* format, ...) __attribute__((format(printf, 2, 3)));
  String& append(String const& other) {
    m_text += other.m_text;
    return *this;
  }

  // Position of the first byte equal to c, or -1 when there is none (also
  // for texts longer than an int can index).
  int indexOf(char c) const;

  // Decimal text of a number; only the types the system prints are defined.
  template <class T>
  static String stringOf(T value);

  bool operator==(String const& other) const { return m_text == other.m_text; }
  bool operator!=(String const& other) const { return m_text != other.m_text; }
  // Lexicographic order of the bytes, each taken as unsigned.
  bool operator<(String const& other) const { return m_text < other.m_text; }
  bool operator>(String const& other) const { return other < *this; }
  bool operator<=(String const& other) const { return !(other < *this); }
  bool operator>=(String const& other) const { return !(*this < other); }

  std::string const& str() const { return m_text; }

 private:
  std::string m_text;
};

template <>
String String::stringOf<unsigned short>(unsigned short value);
