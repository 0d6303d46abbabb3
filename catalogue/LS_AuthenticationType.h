// The direction in which an authentication face works. NAME gives the text
// that dumps and log lines print; any value outside the table gives the
// platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_AuthenticationType {
  enum Type : uint32_t {
    OUTBOUND = 0,
    INBOUND = 1,
  };

  static char const* NAME(Type value);
};
