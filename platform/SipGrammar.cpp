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

size_t find(char const* text, size_t from, size_t length, char c) {
  for (size_t i = from; i < length; ++i) {
    if (text[i] == c)
      return i;
  }
  return length;
}

}  // namespace SipGrammar
