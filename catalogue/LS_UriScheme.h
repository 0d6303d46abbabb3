// The URI scheme with which an outbound registration face registers. NAME
// gives the text that dumps and log lines print; any value outside the table
// gives the platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_UriScheme {
  enum Type : uint32_t {
    SIP = 0,
    SIPS = 1,
    TRANSPARENT = 2,
  };

  static char const* NAME(Type value);
};
