// CDriverRepository: the driver repository a host creates, fills with its
// drivers and installs as the process-wide one (SYSTEM::
// SET_DRIVER_REPOSITORY). Creating drivers belongs to the host.
//
// The repository owns one counted reference to each registered driver,
// keyed by the name the driver had when it was registered, and points the
// driver back at itself with a borrowed pointer, which it clears when the
// driver leaves (at unregisterDriver or when the repository dies). Its own
// re-entrant lock, also the one getLock() yields, guards the table, so
// drivers may be registered and looked up from any thread.
#pragma once

#include "Export.h"

#include "CInherit.h"
#include "IDriver.h"
#include "IDriverRepository.h"
#include "Lock.h"
#include "RefPtr.h"
#include "StringHashTable.h"

class LS_EXPORT CDriverRepository : public CInherit<CDriverRepository, CObject, IDriverRepository> {
 public:
  CDriverRepository();
  ~CDriverRepository() override;

  // Keeps a counted reference to driver under its driver name and sets its
  // repository to this one. Fails, and nothing changes, for a null driver
  // or a name that is already registered.
  XCode registerDriver(IDriver* driver);
  // Clears the driver's repository and releases it; an unknown name is
  // ignored.
  void unregisterDriver(String const& driverName);

  XCode getDriverIf(String const& driverName, UUID const& iid, void** out) override;

 private:
  // Declared before the table, so it outlives the drivers' release.
  Lock m_lock;
  StringHashTable<RefPtr<IDriver>> m_drivers;
};
