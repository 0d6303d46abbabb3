// Whether an identity stands for one subscriber or for a group of them. NAME
// gives the text that dumps and log lines print; any value outside the table
// gives the platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_IdentityType {
  enum Type : uint32_t {
    IDENTITY = 0,
    IDENTITY_GROUP = 1,
  };

  static char const* NAME(Type value);
};
