// Whether an inbound filter rule accepts or denies the addresses it matches.
// NAME gives the text that dumps and log lines print; any value outside the
// table gives the platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_FilterType {
  enum Type : uint32_t {
    ACCEPT = 0,
    DENY = 1,
  };

  static char const* NAME(Type value);
};
