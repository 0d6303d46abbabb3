// The transport preference of an outbound face. The order of the values is not
// that of the texts: 1 to 6 list the three transports in order of preference,
// 7 to 9 force one transport. NAME gives the text that dumps and log lines
// print; any value outside the table gives the platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_ProtocolConfig {
  enum Type : uint32_t {
    PREFERRED_NONE = 0,
    PREFERRED_UDP_TCP_TLS = 1,
    PREFERRED_UDP_TLS_TCP = 2,
    PREFERRED_TCP_UDP_TLS = 3,
    PREFERRED_TCP_TLS_UDP = 4,
    PREFERRED_TLS_UDP_TCP = 5,
    PREFERRED_TLS_TCP_UDP = 6,
    FORCED_TLS = 7,
    FORCED_TCP = 8,
    FORCED_UDP = 9,
  };

  static char const* NAME(Type value);
};
