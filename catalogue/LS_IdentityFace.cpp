#include "LS_IdentityFace.h"

#include "LS_EnumerationText.h"

char const* LS_IdentityFace::NAME(Type value) {
  static char const* const kTexts[] = {
      "Outbound Authentication", "Inbound Authentication", "Outbound Registration", "Inbound Registration",
      "Message Subscription",    "Outbound Call",          "Inbound Call"};
  return LS_enumerationText(kTexts, value);
}
