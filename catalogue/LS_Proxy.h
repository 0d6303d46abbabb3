// LS_Proxy: one entry of an outbound face's proxy list. How the entry is
// shown in the face's dump ("tls-port:", "(strict route)") belongs to the
// face, not here.
#pragma once

#include "Export.h"

#include "CHostPort.h"

struct LS_EXPORT LS_Proxy {
  LS_Proxy() = default;
  LS_Proxy(CHostPort const& address, CHostPort const& tlsAddress, bool strictRoute)
      : address(address), tlsAddress(tlsAddress), strictRoute(strictRoute) {}

  // Equal when both host-ports and the routing flag are equal: the same
  // proxy reached with another routing is another entry.
  bool operator==(LS_Proxy const& other) const {
    return address == other.address && tlsAddress == other.tlsAddress && strictRoute == other.strictRoute;
  }
  bool operator!=(LS_Proxy const& other) const { return !(*this == other); }

  CHostPort address;
  // Only its port matters to the dumps.
  CHostPort tlsAddress;
  // false: loose routing.
  bool strictRoute = false;
};
