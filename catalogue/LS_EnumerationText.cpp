#include "LS_EnumerationText.h"

#include "PlatformTexts.h"

char const* LS_enumerationText(char const* const* texts,
                               size_t count,
                               uint32_t value,
                               char const* outOfRange) {
  if (value >= count)
    return outOfRange;
  return texts[value];
}

char const* LS_enumerationText(char const* const* texts, size_t count, uint32_t value) {
  return LS_enumerationText(texts, count, value, ERROR::INVALID);
}
