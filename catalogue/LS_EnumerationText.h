// Picks the text of an enumeration value from the holder's table of texts,
// which is indexed by value (the values of every enumeration run from 0
// without gaps). The tables themselves live with their holders.
#pragma once

#include <cstddef>
#include <cstdint>

// The text of value, or outOfRange when value is past the table.
char const* LS_enumerationText(char const* const* texts,
                               size_t count,
                               uint32_t value,
                               char const* outOfRange);

// The text of value, or the platform's invalid-value text when value is past
// the table.
char const* LS_enumerationText(char const* const* texts, size_t count, uint32_t value);

template <size_t Count>
char const* LS_enumerationText(char const* const (&texts)[Count], uint32_t value) {
  return LS_enumerationText(texts, Count, value);
}

template <size_t Count>
char const* LS_enumerationText(char const* const (&texts)[Count], uint32_t value, char const* outOfRange) {
  return LS_enumerationText(texts, Count, value, outOfRange);
}
