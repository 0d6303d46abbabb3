#include "LS_Imperative.h"

#include "LS_EnumerationText.h"

char const* LS_Imperative::NAME(Type value) {
  static char const* const kTexts[] = {"authoritative", "backup", "foreign"};
  return LS_enumerationText(kTexts, value);
}
