// CDriver: the driver framework's base class of a driver: a counted object
// that answers IDriver with a fixed driver identifier and a name. Finding
// drivers belongs to the repository.
//
// The repository a driver is registered in sets and clears the driver's
// repository pointer; that pointer is borrowed, because the repository owns
// its drivers (a counted reference each), not the other way round. The
// lock, as for every CObject, is borrowed and may be null.
#pragma once

#include "Export.h"

#include "CInherit.h"
#include "IDriver.h"

class LS_EXPORT CDriver : public CInherit<CDriver, CObject, IDriver> {
 public:
  CDriver(UUID const& did, String const& name, Lock* lock);

  UUID const& getDID() const override { return m_did; }
  String const& getDriverName() const override { return m_name; }
  IDriverRepository* getDriverRepository() const override { return m_repository; }
  void setDriverRepository(IDriverRepository* repository) override { m_repository = repository; }

 protected:
  // For drivers that can build their name only once constructed; a driver
  // is renamed before it is registered, never after.
  void setDriverName(String const& name) { m_name = name; }

 private:
  UUID const m_did;
  String m_name;
  IDriverRepository* m_repository = nullptr;
};
