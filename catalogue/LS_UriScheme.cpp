#include "LS_UriScheme.h"

#include "LS_EnumerationText.h"

char const* LS_UriScheme::NAME(Type value) {
  static char const* const kTexts[] = {"sip", "sips", "transparent"};
  return LS_enumerationText(kTexts, value);
}
