#include "LS_KeepAliveMethod.h"

#include "LS_EnumerationText.h"

char const* LS_KeepAliveMethod::NAME(Type value) {
  static char const* const kTexts[] = {"none", "crlf", "options", "ping"};
  return LS_enumerationText(kTexts, value);
}
