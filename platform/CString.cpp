#include "CString.h"

namespace {

char foldAscii(char c) {
  return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

}  // namespace

bool CString::equalsIgnoringCase(CString const& other) const {
  if (m_text.size() != other.m_text.size())
    return false;
  for (size_t i = 0; i < m_text.size(); ++i) {
    if (foldAscii(m_text[i]) != foldAscii(other.m_text[i]))
      return false;
  }
  return true;
}
