#include "LS_CMasterLocationService.h"

#include "IDriver.h"
#include "LS_CLocationService.h"
#include "LS_ClassIdentifiers.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_InfoRows.h"
#include "LockedPtr.h"

namespace {

String driverName() {
  String name;
  IDriver::BUILD_DRIVER_NAME(name, "master-location-service", 0, 0, 0xFFFFFFFFu, String(), String(), String(),
                             String());
  return name;
}

}  // namespace

LS_CMasterLocationService::LS_CMasterLocationService()
    : CInherit(DID_MasterLocationService(), String(), nullptr) {
  setDriverName(driverName());
}

LS_CMasterLocationService::~LS_CMasterLocationService() {
  for (auto const& entry : m_locationServices)
    detachIdentities(entry.value);
}

XCode LS_CMasterLocationService::getLocationServiceIf(String const& name, UUID const& iid, void** out) {
  RefPtr<LS_ILocationService> const* const found = m_locationServices.get(name);
  if (!found) {
    if (out)
      *out = nullptr;
    return XCode::failure();
  }
  return LockedPtr<LS_ILocationService>(*found)->queryInterface(iid, out);
}

// A new service is kept, and announced, only once it has answered both its
// configuration interface and iid.
XCode LS_CMasterLocationService::createLocationServiceIf(String const& name, UUID const& iid, void** out) {
  if (m_locationServices.contains(name))
    return getLocationServiceIf(name, iid, out);
  RefPtr<LS_ILocationService> const service =
      adoptRef(static_cast<LS_ILocationService*>(new LS_CLocationService));
  RefPtr<LS_ILocationServiceConfig> config;
  XCode result = LockedPtr<LS_ILocationService>(service)->queryIf(config);
  if (result.isFailure()) {
    if (out)
      *out = nullptr;
    return result;
  }
  result = LockedPtr<LS_ILocationService>(service)->queryInterface(iid, out);
  if (result.isFailure())
    return result;
  LockedPtr<LS_ILocationServiceConfig>(config)->setConfigName(name);
  m_locationServices.add(name, service);
  notifyLocationServiceAdded(service.get());
  return XCode::success();
}

void LS_CMasterLocationService::removeLocationService(String const& name) {
  RefPtr<LS_ILocationService> const* const found = m_locationServices.get(name);
  if (!found)
    return;
  RefPtr<LS_ILocationService> const service = *found;
  m_locationServices.remove(name);
  detachIdentities(service);
  notifyLocationServiceRemoved(service.get());
}

void LS_CMasterLocationService::detachIdentities(RefPtr<LS_ILocationService> const& service) {
  // Every service in the table was made here.
  LockedPtr<LS_CLocationService>(static_cast<LS_CLocationService*>(service.get()))->detachIdentities();
}

void LS_CMasterLocationService::getLocationServices(Vector<String>& names) const {
  names.clear();
  for (auto const& entry : m_locationServices)
    names.add(entry.key);
}

void LS_CMasterLocationService::addMasterLocationServiceObserver(LS_IMasterLocationServiceObserver* observer,
                                                                 unsigned int priority) {
  m_observers.addObserver(observer, priority);
}

void LS_CMasterLocationService::removeMasterLocationServiceObserver(
    LS_IMasterLocationServiceObserver* observer) {
  m_observers.removeObserver(observer);
}

void LS_CMasterLocationService::notifyLocationServiceAdded(LS_ILocationService* service) {
  RefPtr<LS_CMasterLocationService> const self(this);
  m_observers.broadcastEvent(EvLocationService(this, service),
                             &LS_IMasterLocationServiceObserver::onLocationServiceAdded);
}

void LS_CMasterLocationService::notifyLocationServiceRemoved(LS_ILocationService* service) {
  RefPtr<LS_CMasterLocationService> const self(this);
  m_observers.broadcastEvent(EvLocationService(this, service),
                             &LS_IMasterLocationServiceObserver::onLocationServiceRemoved);
}

InfoContainer& LS_CMasterLocationService::getInfo(InfoContainer& info,
                                                  unsigned int maxLevel,
                                                  unsigned int level,
                                                  unsigned int maxDetail,
                                                  unsigned int detail,
                                                  String const& prefix) const {
  LS_InfoRows const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Location-Services"), String::s_empty);
  if (m_locationServices.isEmpty())
    rows.add(level + 1, "Location-Services", "(none)");
  for (auto const& entry : m_locationServices)
    rows.add(level + 1, LockedPtr<LS_ILocationService>(entry.value)->getName(), String::s_empty);
  return info;
}
