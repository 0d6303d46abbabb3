// The protocol of an authentication service. An identifier cannot begin with a
// digit, so "3GPP" is THREE_GPP. NAME gives the text that dumps and log lines
// print; any value outside the table gives the platform's invalid-value text.
#pragma once

#include "Export.h"

#include <cstdint>

struct LS_EXPORT LS_AuthenticationProtocol {
  enum Type : uint32_t {
    HTTP = 0,
    THREE_GPP = 1,
  };

  static char const* NAME(Type value);
};
