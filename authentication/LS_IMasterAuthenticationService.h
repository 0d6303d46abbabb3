// LS_IMasterAuthenticationService: the registry of the gateway's
// authentication services, keyed by the name each was created with (bytes,
// case-sensitive) and listed in creation order. Finding a service for a
// lookup belongs to the lookup functions.
#pragma once

#include "Export.h"

#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "RefPtr.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

class LS_EXPORT LS_IMasterAuthenticationService : public LS_Interface<LS_IMasterAuthenticationServiceIdentifiers> {
 public:
  virtual XCode getAuthenticationServiceIf(String const& name, UUID const& iid, void** out) = 0;
  // Creates the service when the name is new, then as
  // getAuthenticationServiceIf.
  virtual XCode createAuthenticationServiceIf(String const& name, UUID const& iid, void** out) = 0;
  // Identities whose entries name the service are not told: their entries
  // simply stop resolving.
  virtual void removeAuthenticationService(String const& name) = 0;
  // Replaced by the names, in creation order.
  virtual void getAuthenticationServices(Vector<String>& names) const = 0;

 protected:
  ~LS_IMasterAuthenticationService() = default;
};

// Interface T of the authentication service called name, or null and the
// master's failure. Takes no lock on the master.
template <class T>
XCode LS_getAuthenticationServiceIf(LS_IMasterAuthenticationService* master, String const& name, RefPtr<T>& out) {
  return adoptInterface(
      out, [master, &name](UUID const& iid, void** raw) { return master->getAuthenticationServiceIf(name, iid, raw); });
}
