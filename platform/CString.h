// CString: the SIP stack's byte string, as its address types hand out host
// texts, user parts and display names. Equality is that of the bytes
// (case-sensitive, no trimming) and the text may hold any byte, a zero byte
// included; c_str() is always zero-terminated. Host texts compare with
// equalsIgnoringCase, as hosts do in SIP. Conversion to the utility
// library's String and any other text processing belong to the callers.
#pragma once

#include "Export.h"

#include <cstddef>
#include <string>

class LS_EXPORT CString {
 public:
  CString() = default;
  // A null pointer gives the empty text.
  CString(char const* text) : m_text(text ? text : "") {}  // NOLINT: implicit on purpose, like a literal
  // A null pointer gives the empty text whatever the length.
  CString(char const* data, size_t length) : m_text(data ? std::string(data, length) : std::string()) {}

  char const* c_str() const { return m_text.c_str(); }
  size_t length() const { return m_text.size(); }
  bool isEmpty() const { return m_text.empty(); }

  // Equality of the bytes with ASCII letters folded: "Example.COM" equals
  // "example.com". Bytes above 0x7f are compared as they are.
  bool equalsIgnoringCase(CString const& other) const;

  friend bool operator==(CString const& a, CString const& b) { return a.m_text == b.m_text; }
  friend bool operator!=(CString const& a, CString const& b) { return a.m_text != b.m_text; }
  // A null text compares like the empty text.
  friend bool operator==(CString const& a, char const* b) { return a.m_text == (b ? b : ""); }
  friend bool operator!=(CString const& a, char const* b) { return !(a == b); }
  friend bool operator==(char const* a, CString const& b) { return b == a; }
  friend bool operator!=(char const* a, CString const& b) { return !(b == a); }

 private:
  std::string m_text;
};
