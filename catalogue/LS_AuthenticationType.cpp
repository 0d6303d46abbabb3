#include "LS_AuthenticationType.h"

#include "LS_EnumerationText.h"

char const* LS_AuthenticationType::NAME(Type value) {
  static char const* const kTexts[] = {"Outbound", "Inbound"};
  return LS_enumerationText(kTexts, value);
}
