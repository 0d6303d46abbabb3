#include "CDriverRepository.h"

#include <mutex>

CDriverRepository::CDriverRepository() : CInherit(&m_lock) {}

CDriverRepository::~CDriverRepository() {
  for (auto const& entry : m_drivers)
    entry.value->setDriverRepository(nullptr);
}

XCode CDriverRepository::registerDriver(IDriver* driver) {
  if (!driver)
    return XCode::failure();
  std::lock_guard<Lock> guard(m_lock);
  if (!m_drivers.add(driver->getDriverName(), RefPtr<IDriver>(driver)))
    return XCode::failure();
  driver->setDriverRepository(this);
  return XCode::success();
}

void CDriverRepository::unregisterDriver(String const& driverName) {
  // Released outside the lock: a driver's destructor may call back.
  RefPtr<IDriver> driver;
  {
    std::lock_guard<Lock> guard(m_lock);
    RefPtr<IDriver> const* registered = m_drivers.get(driverName);
    if (!registered)
      return;
    driver = *registered;
    m_drivers.remove(driverName);
  }
  driver->setDriverRepository(nullptr);
}

XCode CDriverRepository::getDriverIf(String const& driverName, UUID const& iid, void** out) {
  std::lock_guard<Lock> guard(m_lock);
  RefPtr<IDriver> const* registered = m_drivers.get(driverName);
  if (!registered) {
    if (out)
      *out = nullptr;
    return XCode::failure();
  }
  return (*registered)->queryInterface(iid, out);
}
