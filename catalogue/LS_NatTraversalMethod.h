// How an outbound registration face traverses a NAT. NAME gives the text that
// dumps and log lines print; any value outside the table gives the platform's
// invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_NatTraversalMethod {
  enum Type : uint32_t {
    NONE = 0,
    NORTEL = 1,
    ADDRESS_DETECTION = 2,
  };

  static char const* NAME(Type value);
};
