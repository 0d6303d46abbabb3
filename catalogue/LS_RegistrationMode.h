// How an outbound registration face registers. NAME gives the text that dumps
// and log lines print; any value outside the table gives the platform's
// invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_RegistrationMode {
  enum Type : uint32_t {
    NONE = 0,
    AUTO = 1,
    BACK_TO_BACK = 2,
  };

  static char const* NAME(Type value);
};
