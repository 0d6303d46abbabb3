// LS_ILocationServiceConfig: the configuration side of a location service:
// its name, imperative, ordered domains (the first is the master domain),
// default-domain flag and configured identities.
//
// Each domain edit and each setConfigImperative, even one that changes
// nothing, makes every configured identity re-announce its outbound
// registration, inbound registration and message-waiting settings, in that
// order. The run-time view belongs to LS_ILocationService; naming and
// owning location services to the master.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "IUnknown.h"
#include "LS_IdentityType.h"
#include "LS_Imperative.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "RefPtr.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

class LS_EXPORT LS_ILocationServiceConfig : public LS_Interface<LS_ILocationServiceConfigIdentifiers> {
 public:
  virtual String getConfigName() const = 0;
  virtual void setConfigName(String const& name) = 0;
  virtual LS_Imperative::Type getConfigImperative() const = 0;
  virtual void setConfigImperative(LS_Imperative::Type imperative) = 0;

  // The list never holds two equal domains: inserting or modifying with a
  // domain already listed first takes the old entry out (shifting index
  // down when it lay before index). An index at or past the end appends.
  virtual unsigned int getNumberOfConfigDomains() const = 0;
  // The empty host-port past the end.
  virtual CHostPort getConfigDomain(unsigned int index) const = 0;
  // Moves by delta positions, stopping at either end; an index past the end
  // moves nothing.
  virtual void moveConfigDomain(unsigned int index, int delta) = 0;
  virtual void modifyConfigDomain(unsigned int index, CHostPort const& domain) = 0;
  virtual void insertConfigDomain(unsigned int index, CHostPort const& domain) = 0;
  virtual void removeConfigDomain(CHostPort const& domain) = 0;
  // Makes the service a candidate for any domain; sends no notices.
  virtual bool getConfigDefaultDomain() const = 0;
  virtual void setConfigDefaultDomain(bool defaultDomain) = 0;

  virtual XCode getConfigIdentityIf(String const& name, UUID const& iid, void** out) = 0;
  // Creates the configured identity name, or takes over a dynamic one of
  // that name (keeping its base when baseName is empty), or hands out the
  // configured one when its type is type. A non-empty baseName names a
  // configured identity that becomes the base, refused when it would close
  // a loop or make a chain of more than ten identities above this one.
  virtual XCode createConfigIdentityIf(String const& name,
                                       String const& baseName,
                                       LS_IdentityType::Type type,
                                       UUID const& iid,
                                       void** out) = 0;
  // Removes name from both tables; identities based on it lose their base.
  virtual void removeConfigIdentity(String const& name) = 0;
  virtual void getConfigIdentities(Vector<String>& names) const = 0;

 protected:
  ~LS_ILocationServiceConfig() = default;
};

// out receives interface T of the configured identity name, or null.
// Returns the service's result.
template <class T>
XCode LS_getConfigIdentityIf(LS_ILocationServiceConfig* service, String const& name, RefPtr<T>& out) {
  return adoptInterface(out, [service, &name](UUID const& iid, void** raw) {
    return service->getConfigIdentityIf(name, iid, raw);
  });
}
