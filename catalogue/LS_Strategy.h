// How a read of a data element treats the element's base: its own value only,
// the base's only, or its own and else the base's. NAME gives the text that
// dumps and log lines print; any value outside the table gives the platform's
// invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_Strategy {
  enum Type : uint32_t {
    LOCAL_ONLY = 0,
    BASE_ONLY = 1,
    LOCAL_OR_BASE = 2,
  };

  static char const* NAME(Type value);
};
