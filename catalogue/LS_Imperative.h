// The imperative of a location service over its domains. NAME gives the text
// that dumps and log lines print; any value outside the table gives the
// platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_Imperative {
  enum Type : uint32_t {
    AUTHORITATIVE = 0,
    BACKUP = 1,
    FOREIGN = 2,
  };

  static char const* NAME(Type value);
};
