// How a message-waiting subscription face subscribes. NAME gives the text that
// dumps and log lines print; any value outside the table gives the platform's
// invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_MwiSubscriptionMode {
  enum Type : uint32_t {
    NONE = 0,
    EXPLICIT = 1,
    IMPLICIT = 2,
  };

  static char const* NAME(Type value);
};
