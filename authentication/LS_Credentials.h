// LS_Credentials: what a credentials lookup found: the authentication
// service, the user name under which it holds the credentials (the one asked
// for, or "DEFAULT" when the lookup fell back to the service's default
// entry) and the password. A value record; its one counted reference keeps
// the service alive while the record is held. The lookup itself does not
// belong here.
#pragma once

#include "Export.h"

#include "LS_IAuthenticationService.h"
#include "RefPtr.h"
#include "String.h"

struct LS_EXPORT LS_Credentials {
  RefPtr<LS_IAuthenticationService> authenticationService;
  String userName;
  String password;
};
