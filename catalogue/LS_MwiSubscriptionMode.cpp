#include "LS_MwiSubscriptionMode.h"

#include "LS_EnumerationText.h"

char const* LS_MwiSubscriptionMode::NAME(Type value) {
  static char const* const kTexts[] = {"none", "explicit", "implicit"};
  return LS_enumerationText(kTexts, value);
}
