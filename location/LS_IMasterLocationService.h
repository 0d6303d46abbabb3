// LS_IMasterLocationService: the registry of the gateway's location
// services, keyed by the name each was created with (bytes, case-sensitive)
// and listed in creation order. Finding the service responsible for a host
// belongs to the lookups.
#pragma once

#include "Export.h"

#include "IUnknown.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "RefPtr.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

class LS_EXPORT LS_IMasterLocationService : public LS_Interface<LS_IMasterLocationServiceIdentifiers> {
 public:
  virtual XCode getLocationServiceIf(String const& name, UUID const& iid, void** out) = 0;
  // Creates the service when the name is new, then as getLocationServiceIf.
  virtual XCode createLocationServiceIf(String const& name, UUID const& iid, void** out) = 0;
  // Cuts every identity's link back to the service, then announces the
  // removal. The identities stay in the service and die with it.
  virtual void removeLocationService(String const& name) = 0;
  // Replaced by the names, in creation order.
  virtual void getLocationServices(Vector<String>& names) const = 0;

 protected:
  ~LS_IMasterLocationService() = default;
};

// Interface T of the location service called name, or null and the
// master's failure. Takes no lock on the master.
template <class T>
XCode LS_getLocationServiceIf(LS_IMasterLocationService* master, String const& name, RefPtr<T>& out) {
  return adoptInterface(
      out, [master, &name](UUID const& iid, void** raw) { return master->getLocationServiceIf(name, iid, raw); });
}
