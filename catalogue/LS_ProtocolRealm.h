// LS_ProtocolRealm: one realm, with its authentication protocol, with which
// an inbound request is to be challenged. Choosing the realms belongs to the
// authentication lookups, not here.
#pragma once

#include "Export.h"

#include "LS_AuthenticationProtocol.h"
#include "String.h"

struct LS_EXPORT LS_ProtocolRealm {
  LS_AuthenticationProtocol::Type protocol = LS_AuthenticationProtocol::HTTP;
  String realm;
};
