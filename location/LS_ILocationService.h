// LS_ILocationService: the run-time view of a location service, as the
// lookups use it: its imperative and domains, whether it answers for a
// host-port, and its identities, configured and dynamic, with the dynamic
// ones that the SIP side creates and removes at run time. Configuration
// belongs to LS_ILocationServiceConfig.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "IUnknown.h"
#include "LS_Imperative.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "RefPtr.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

class LS_EXPORT LS_ILocationService : public LS_Interface<LS_ILocationServiceIdentifiers> {
 public:
  virtual String getName() const = 0;
  virtual LS_Imperative::Type getImperative() const = 0;
  // False, exact false, when this service is less authoritative than
  // imperative. Otherwise true with exact true for a domain or local
  // host-port equal to hostPort, and true with exact false for one with the
  // same host where either side has no port. The default-domain flag is not
  // consulted.
  virtual bool isResponsible(CHostPort const& hostPort,
                             Vector<CHostPort> const& localHostPorts,
                             LS_Imperative::Type imperative,
                             bool& exact) const = 0;
  virtual unsigned int getNumberOfDomains() const = 0;
  // The empty host-port past the end.
  virtual CHostPort getDomain(unsigned int index) const = 0;
  virtual bool getDefaultDomain() const = 0;
  // A configured identity, else a dynamic one.
  virtual XCode getIdentityIf(String const& name, UUID const& iid, void** out) = 0;
  // An identity of that name, configured or dynamic, is handed out when it
  // is no group; otherwise a new dynamic identity inherits from the
  // configured "DEFAULT" identity, if there is one.
  virtual XCode createDynamicIdentityIf(String const& name, UUID const& iid, void** out) = 0;
  // Configured identities are left alone.
  virtual void removeDynamicIdentity(String const& name) = 0;
  // Replaced by the configured names, then the dynamic ones, each in
  // creation order.
  virtual void getIdentities(Vector<String>& names) const = 0;

 protected:
  ~LS_ILocationService() = default;
};

// out receives interface T of the identity name (configured, else dynamic),
// or null. Returns the service's result.
template <class T>
XCode LS_getIdentityIf(LS_ILocationService* service, String const& name, RefPtr<T>& out) {
  return adoptInterface(
      out, [service, &name](UUID const& iid, void** raw) { return service->getIdentityIf(name, iid, raw); });
}
