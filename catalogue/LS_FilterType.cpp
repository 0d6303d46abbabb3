#include "LS_FilterType.h"

#include "LS_EnumerationText.h"

char const* LS_FilterType::NAME(Type value) {
  static char const* const kTexts[] = {"accept", "deny"};
  return LS_enumerationText(kTexts, value);
}
