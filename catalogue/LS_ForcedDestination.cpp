#include "LS_ForcedDestination.h"

#include "LS_EnumerationText.h"

char const* LS_ForcedDestination::NAME(Type value) {
  static char const* const kTexts[] = {"manual", "registrar-address"};
  return LS_enumerationText(kTexts, value, "(invalid)");
}
