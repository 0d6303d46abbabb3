#include "UUID.h"

#include <cstring>

namespace {

int hexValue(char c) {
  if (c >= '0' && c <= '9')
    return c - '0';
  if (c >= 'a' && c <= 'f')
    return c - 'a' + 10;
  if (c >= 'A' && c <= 'F')
    return c - 'A' + 10;
  return -1;
}

}  // namespace

UUID::UUID(char const* text, char const* name) : m_name(name ? name : "") {
  parse(text, m_bytes);
}

bool UUID::parse(char const* text, unsigned char (&bytes)[16]) {
  if (!text || std::strlen(text) != 36)
    return false;
  // Hexadecimal digits in text order, then reordered into the GUID layout.
  unsigned char inTextOrder[16];
  size_t digit = 0;
  for (size_t i = 0; i < 36; ++i) {
    bool const dashExpected = i == 8 || i == 13 || i == 18 || i == 23;
    if (dashExpected) {
      if (text[i] != '-')
        return false;
      continue;
    }
    int const value = hexValue(text[i]);
    if (value < 0)
      return false;
    if (digit % 2 == 0)
      inTextOrder[digit / 2] = static_cast<unsigned char>(value << 4);
    else
      inTextOrder[digit / 2] |= static_cast<unsigned char>(value);
    ++digit;
  }
  static unsigned char const kLayout[16] = {3, 2, 1, 0, 5, 4, 7, 6, 8, 9, 10, 11, 12, 13, 14, 15};
  for (size_t i = 0; i < 16; ++i)
    bytes[i] = inTextOrder[kLayout[i]];
  return true;
}

bool UUID::isNil() const {
  for (unsigned char byte : m_bytes) {
    if (byte)
      return false;
  }
  return true;
}

bool UUID::operator==(UUID const& other) const {
  return std::memcmp(m_bytes, other.m_bytes, sizeof m_bytes) == 0;
}
