// The seven faces of an identity. The name of the child element that holds
// each face belongs to the identity, not here. NAME gives the text that dumps
// and log lines print; any value outside the table gives the platform's
// invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_IdentityFace {
  enum Type : uint32_t {
    AUTHENTICATION_OUTBOUND = 0,
    AUTHENTICATION_INBOUND = 1,
    REGISTRATION_OUTBOUND = 2,
    REGISTRATION_INBOUND = 3,
    MESSAGE_SUBSCRIPTION = 4,
    CALL_OUTBOUND = 5,
    CALL_INBOUND = 6,
  };

  static char const* NAME(Type value);
};
