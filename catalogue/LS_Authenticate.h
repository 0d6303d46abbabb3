// LS_Authenticate: one entry of an identity's authentication list, naming the
// authentication service and the user name in it. Resolving the entry to
// credentials belongs to the authentication lookups, not here.
#pragma once

#include "Export.h"

#include "String.h"

struct LS_EXPORT LS_Authenticate {
  // The entry's "Authentication Link".
  String authenticationService;
  String userName;
};
