// LS_IAuthentication: the run-time view of an identity's authentication
// face: the base identity's entries followed by the identity's own, indexed
// from 0 over that concatenation. Resolving an entry to credentials belongs
// to the lookups.
#pragma once

#include "Export.h"

#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "String.h"
#include "XCode.h"

class LS_EXPORT LS_IAuthentication : public LS_Interface<LS_IAuthenticationIdentifiers> {
 public:
  virtual unsigned int getNumberOfAuthenticates() const = 0;
  virtual XCode getAuthenticate(unsigned int index, String& authenticationService, String& userName) const = 0;

 protected:
  ~LS_IAuthentication() = default;
};
