#include "LS_RegistrationMode.h"

#include "LS_EnumerationText.h"

char const* LS_RegistrationMode::NAME(Type value) {
  static char const* const kTexts[] = {"none", "auto", "back-to-back"};
  return LS_enumerationText(kTexts, value);
}
