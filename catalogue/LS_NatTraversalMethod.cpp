#include "LS_NatTraversalMethod.h"

#include "LS_EnumerationText.h"

char const* LS_NatTraversalMethod::NAME(Type value) {
  static char const* const kTexts[] = {"none", "nortel", "address-detection"};
  return LS_enumerationText(kTexts, value);
}
