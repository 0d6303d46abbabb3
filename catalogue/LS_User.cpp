#include "LS_User.h"

#include "LS_EnumerationText.h"

char const* LS_User::NAME(Type value) {
  static char const* const kTexts[] = {"undefined", "phone", "ip", "dialstring"};
  return LS_enumerationText(kTexts, value);
}
