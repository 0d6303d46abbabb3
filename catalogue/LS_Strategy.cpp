#include "LS_Strategy.h"

#include "LS_EnumerationText.h"

char const* LS_Strategy::NAME(Type value) {
  static char const* const kTexts[] = {"localOnly", "baseOnly", "localOrBase"};
  return LS_enumerationText(kTexts, value);
}
