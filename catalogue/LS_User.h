// The user representation of an identity, its "user-representation" value.
// NAME gives the text that dumps and log lines print; any value outside the
// table gives the platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_User {
  enum Type : uint32_t {
    UNDEFINED = 0,
    PHONE = 1,
    IP = 2,
    DIALSTRING = 3,
  };

  static char const* NAME(Type value);
};
