#include "control/IdentityRemovals.h"

#include <algorithm>

#include "LS_ILocationServiceSubject.h"
#include "LS_IMasterLocationServiceSubject.h"

IdentityRemovals::IdentityRemovals(LS_IMasterLocationService& master) : m_master(master) {
  RefPtr<LS_IMasterLocationServiceSubject> subject;
  if (m_master.queryIf(subject).isSuccess())
    subject->addMasterLocationServiceObserver(this, 0);
  Vector<String> names;
  m_master.getLocationServices(names);
  for (String const& name : names) {
    RefPtr<LS_ILocationService> service;
    if (LS_getLocationServiceIf(&m_master, name, service).isSuccess())
      observe(service.get());
  }
}

IdentityRemovals::~IdentityRemovals() {
  RefPtr<LS_IMasterLocationServiceSubject> master;
  if (m_master.queryIf(master).isSuccess())
    master->removeMasterLocationServiceObserver(this);
  for (RefPtr<LS_ILocationService> const& service : m_services) {
    RefPtr<LS_ILocationServiceSubject> subject;
    if (service->queryIf(subject).isSuccess())
      subject->removeLocationServiceObserver(this);
  }
}

void IdentityRemovals::begin() {
  m_identities.clear();
  m_anyServiceRemoved = false;
  m_recording = true;
}

void IdentityRemovals::end() {
  m_recording = false;
}

void IdentityRemovals::observe(LS_ILocationService* service) {
  RefPtr<LS_ILocationServiceSubject> subject;
  if (service->queryIf(subject).isFailure())
    return;
  subject->addLocationServiceObserver(this, 0);
  m_services.push_back(service);
}

void IdentityRemovals::onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) {
  auto const* added = dynamic_cast<LS_IMasterLocationServiceSubject::EvLocationService*>(&event);
  if (added && added->locationService)
    observe(added->locationService.get());
}

void IdentityRemovals::onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) {
  auto const* removed = dynamic_cast<LS_IMasterLocationServiceSubject::EvLocationService*>(&event);
  if (!removed || !removed->locationService)
    return;
  auto const found = std::find_if(
      m_services.begin(), m_services.end(),
      [&](RefPtr<LS_ILocationService> const& s) { return s.get() == removed->locationService.get(); });
  if (found != m_services.end()) {
    RefPtr<LS_ILocationServiceSubject> subject;
    if ((*found)->queryIf(subject).isSuccess())
      subject->removeLocationServiceObserver(this);
    m_services.erase(found);
  }
  m_anyServiceRemoved = m_anyServiceRemoved || m_recording;
}

void IdentityRemovals::onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) {
  auto const* removed = dynamic_cast<LS_ILocationServiceSubject::EvIdentity*>(&event);
  if (m_recording && removed && removed->identity)
    m_identities.push_back(removed->identity.get());
}
