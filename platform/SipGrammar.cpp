#include "SipGrammar.h"

namespace SipGrammar {

bool equalsIgnoreCase(char const* text, size_t length, char const* word) {
  size_t i = 0;
  for (; i < length; ++i) {
    unsigned char c = static_cast<unsigned char>(text[i]);
    if (word[i] == '\0')
      return false;
    if (c >= 'A' && c <= 'Z')
      c = static_cast<unsigned char>(c - 'A' + 'a');
    if (c != static_cast<unsigned char>(word[i]))
      return false;
  }
  return word[i] == '\0';
}

// The letter that must start the last label is what tells "10.0.0.1", an
// address, from a name, and "1.2.3.256" from both.
bool isHostName(char const* text, size_t length) {
  if (length > 1 && text[length - 1] == '.')
    --length;
  size_t labelBegin = 0;
  while (true) {
    size_t const labelEnd = find(text, labelBegin, length, '.');
    if (labelEnd == labelBegin || !isAlphaNum(static_cast<unsigned char>(text[labelBegin])) ||
        !isAlphaNum(static_cast<unsigned char>(text[labelEnd - 1])))
      return false;
    for (size_t i = labelBegin + 1; i + 1 < labelEnd; ++i) {
      unsigned char const c = static_cast<unsigned char>(text[i]);
      if (!isAlphaNum(c) && c != '-')
        return false;
    }
    if (labelEnd == length)
      return isAlpha(static_cast<unsigned char>(text[labelBegin]));
    labelBegin = labelEnd + 1;
  }
}

// Leading zeros are allowed ("010.0.0.1"): the URI grammar counts digits,
// it does not read octal.
bool isIpv4Address(char const* text, size_t length) {
  size_t position = 0;
  for (int part = 0; part < 4; ++part) {
    if (part > 0) {
      if (position == length || text[position] != '.')
        return false;
      ++position;
    }
    size_t digits = 0;
    unsigned int value = 0;
    while (position < length && digits < 3 && isDigit(static_cast<unsigned char>(text[position]))) {
      value = value * 10 + static_cast<unsigned int>(text[position] - '0');
      ++position;
      ++digits;
    }
    if (digits == 0 || value > 255)
      return false;
  }
  return position == length;
}

size_t find(char const* text, size_t from, size_t length, char c) {
  for (size_t i = from; i < length; ++i) {
    if (text[i] == c)
      return i;
  }
  return length;
}

}  // namespace SipGrammar
