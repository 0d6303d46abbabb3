#include "LS_AuthenticationProtocol.h"

#include "LS_EnumerationText.h"

char const* LS_AuthenticationProtocol::NAME(Type value) {
  static char const* const kTexts[] = {"HTTP", "3GPP"};
  return LS_enumerationText(kTexts, value);
}
