#include "control/ModelChanges.h"

#include <algorithm>

#include "LS_ILocationServiceSubject.h"
#include "LS_IMasterLocationServiceSubject.h"
#include "LS_IMwiSubscriptionSubject.h"
#include "LS_IRegistrationOutboundSubject.h"

ModelChanges::ModelChanges(LS_IMasterLocationService& master) : m_master(master) {
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

ModelChanges::~ModelChanges() {
  RefPtr<LS_IMasterLocationServiceSubject> master;
  if (m_master.queryIf(master).isSuccess())
    master->removeMasterLocationServiceObserver(this);
  for (RefPtr<LS_ILocationService> const& service : m_services) {
    RefPtr<LS_ILocationServiceSubject> subject;
    if (service->queryIf(subject).isSuccess())
      subject->removeLocationServiceObserver(this);
  }
  for (RefPtr<LS_IIdentity> const& identity : m_identities) {
    RefPtr<LS_IRegistrationOutboundSubject> subject;
    if (identity->queryIf(subject).isSuccess())
      subject->removeRegistrationOutboundObserver(this);
    RefPtr<LS_IMwiSubscriptionSubject> mwi;
    if (identity->queryIf(mwi).isSuccess())
      mwi->removeMwiSubscriptionObserver(this);
  }
}

void ModelChanges::begin() {
  m_removed.clear();
  m_touched.clear();
  m_mwiTouched.clear();
  m_anyServiceChanged = false;
  m_recording = true;
}

void ModelChanges::end() {
  m_recording = false;
}

void ModelChanges::observe(LS_ILocationService* service) {
  RefPtr<LS_ILocationServiceSubject> subject;
  if (service->queryIf(subject).isFailure())
    return;
  subject->addLocationServiceObserver(this, 0);
  m_services.push_back(service);
  Vector<String> names;
  service->getIdentities(names);
  for (String const& name : names) {
    RefPtr<LS_IIdentity> identity;
    if (LS_getIdentityIf(service, name, identity).isSuccess())
      observe(identity.get());
  }
}

void ModelChanges::observe(LS_IIdentity* identity) {
  RefPtr<LS_IRegistrationOutboundSubject> subject;
  if (identity->queryIf(subject).isFailure())
    return;
  subject->addRegistrationOutboundObserver(this, 0);
  RefPtr<LS_IMwiSubscriptionSubject> mwi;
  if (identity->queryIf(mwi).isSuccess())
    mwi->addMwiSubscriptionObserver(this, 0);
  m_identities.push_back(identity);
}

void ModelChanges::onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) {
  auto const* added = dynamic_cast<LS_IMasterLocationServiceSubject::EvLocationService*>(&event);
  if (!added || !added->locationService)
    return;
  observe(added->locationService.get());
  m_anyServiceChanged = m_anyServiceChanged || m_recording;
}

void ModelChanges::onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) {
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
  m_anyServiceChanged = m_anyServiceChanged || m_recording;
}

void ModelChanges::onIdentityAdded(ObserverEvent<LS_ILocationService>& event) {
  auto const* added = dynamic_cast<LS_ILocationServiceSubject::EvIdentity*>(&event);
  if (!m_recording || !added || !added->identity)
    return;
  observe(added->identity.get());
  m_touched.push_back(added->identity);
}

// Outside a line only identities the gateway made itself go, which were
// never observed: the search through every identity observed is made for
// the operator's removals only.
void ModelChanges::onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) {
  auto const* removed = dynamic_cast<LS_ILocationServiceSubject::EvIdentity*>(&event);
  if (!m_recording || !removed || !removed->identity)
    return;
  LS_IIdentity* const identity = removed->identity.get();
  m_removed.push_back(identity);
  auto const found =
      std::find_if(m_identities.begin(), m_identities.end(),
                   [&](RefPtr<LS_IIdentity> const& observed) { return observed.get() == identity; });
  if (found == m_identities.end())
    return;
  RefPtr<LS_IRegistrationOutboundSubject> subject;
  if (identity->queryIf(subject).isSuccess())
    subject->removeRegistrationOutboundObserver(this);
  RefPtr<LS_IMwiSubscriptionSubject> mwi;
  if (identity->queryIf(mwi).isSuccess())
    mwi->removeMwiSubscriptionObserver(this);
  *found = std::move(m_identities.back());
  m_identities.pop_back();
}

void ModelChanges::onRegistrationOutboundChange(ObserverEvent<LS_IRegistrationOutbound>& event) {
  auto const* changed = dynamic_cast<LS_IRegistrationOutboundSubject::EvIdentity*>(&event);
  if (m_recording && changed && changed->identity)
    m_touched.push_back(changed->identity);
}

void ModelChanges::onMwiSubscriptionChange(ObserverEvent<LS_IMwiSubscription>& event) {
  auto const* changed = dynamic_cast<LS_IMwiSubscriptionSubject::EvIdentity*>(&event);
  if (m_recording && changed && changed->identity)
    m_mwiTouched.push_back(changed->identity);
}
