#include "LS_IdentityType.h"

#include "LS_EnumerationText.h"

char const* LS_IdentityType::NAME(Type value) {
  static char const* const kTexts[] = {"Identity", "Identity-Group"};
  return LS_enumerationText(kTexts, value);
}
