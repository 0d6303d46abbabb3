// LS_IAuthenticationConfig: the configuration view of an identity's
// authentication face: its own authentication entries (service name, user
// name), in order. Inherited entries are not seen or changed here; the
// run-time view is LS_IAuthentication.
#pragma once

#include "Export.h"

#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "String.h"
#include "XCode.h"

class LS_EXPORT LS_IAuthenticationConfig : public LS_Interface<LS_IAuthenticationConfigIdentifiers> {
 public:
  // Fails, with count 0, while the face holds no list of its own.
  virtual XCode getNumberOfConfigAuthenticates(unsigned int& count) const = 0;
  virtual XCode getConfigAuthenticate(unsigned int index, String& authenticationService, String& userName) const = 0;
  // Stops at the first and the last place.
  virtual XCode moveConfigAuthenticate(unsigned int index, int delta) = 0;
  virtual XCode modifyConfigAuthenticate(unsigned int index,
                                         String const& authenticationService,
                                         String const& userName) = 0;
  // Creates the own list when there is none; an index past the end appends,
  // and duplicates are allowed.
  virtual XCode insertConfigAuthenticate(unsigned int index,
                                         String const& authenticationService,
                                         String const& userName) = 0;
  // An index past the end is ignored.
  virtual void removeConfigAuthenticate(unsigned int index) = 0;
  // Empties the own list but keeps it.
  virtual void clearConfigAuthenticates() = 0;
  // Drops the own list: only the inherited entries remain.
  virtual void destroyConfigAuthenticates() = 0;

 protected:
  ~LS_IAuthenticationConfig() = default;
};
