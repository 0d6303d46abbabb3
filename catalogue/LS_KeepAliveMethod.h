// How an outbound registration face keeps its NAT binding alive. NAME gives
// the text that dumps and log lines print; any value outside the table gives
// the platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_KeepAliveMethod {
  enum Type : uint32_t {
    NONE = 0,
    CRLF = 1,
    OPTIONS = 2,
    PING = 3,
  };

  static char const* NAME(Type value);
};
