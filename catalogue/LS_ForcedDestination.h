// LS_ForcedDestination: where an outbound face sends every request, whatever
// the request URI says. How the face dumps it belongs to the face, not here.
#pragma once

#include "Export.h"

#include <cstdint>

#include "CHostPort.h"

struct LS_EXPORT LS_ForcedDestination {
  enum Type : uint32_t {
    // The two host-ports give the destination.
    MANUAL = 0,
    // The registrar address is the destination; the host-ports are unused.
    REGISTRAR_ADDRESS = 1,
  };

  // Unlike the other enumerations, a value outside the table gives
  // "(invalid)", not the platform's invalid-value text.
  static char const* NAME(Type value);

  // Equal when both host-ports and the type are equal, even where the type
  // leaves the host-ports unused.
  bool operator==(LS_ForcedDestination const& other) const {
    return udpTcpAddress == other.udpTcpAddress && tlsDestination == other.tlsDestination &&
           type == other.type;
  }
  bool operator!=(LS_ForcedDestination const& other) const { return !(*this == other); }

  CHostPort udpTcpAddress;
  CHostPort tlsDestination;
  Type type = MANUAL;
};
