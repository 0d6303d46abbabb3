#include "ModelWatcher.h"

#include "LS_ILocationServiceSubject.h"
#include "LS_IMasterLocationServiceSubject.h"
#include "LS_IMwiSubscriptionSubject.h"
#include "LS_IRegistrationInboundSubject.h"
#include "LS_IRegistrationOutboundSubject.h"
#include "ScriptSession.h"

namespace {

// Every subject here announces with its own EvIdentity; the base class only
// carries the subject.
template <class Subject, class Face>
std::string identityOf(ObserverEvent<Face>& event) {
  auto const* concerned = dynamic_cast<typename Subject::EvIdentity*>(&event);
  if (!concerned || !concerned->identity)
    return "?";
  return ScriptSession::pathOf(concerned->identity.get());
}

}  // namespace

ModelWatcher::~ModelWatcher() {
  stop();
}

void ModelWatcher::start() {
  if (m_watching)
    return;
  m_watching = true;
  LS_IMasterLocationService* const master = m_session.locationMaster();
  observeMaster(true);
  Vector<String> names;
  master->getLocationServices(names);
  for (String const& name : names) {
    RefPtr<LS_ILocationService> service;
    if (LS_getLocationServiceIf(master, name, service).isSuccess())
      watchService(service.get());
  }
}

void ModelWatcher::stop() {
  if (!m_watching)
    return;
  m_watching = false;
  observeMaster(false);
  for (RefPtr<LS_ILocationService> const& service : m_services)
    observeService(service.get(), false);
  for (RefPtr<LS_IIdentity> const& identity : m_identities)
    observeIdentity(identity.get(), false);
  m_services.clear();
  m_identities.clear();
}

void ModelWatcher::watchService(LS_ILocationService* service) {
  m_services.push_back(service);
  observeService(service, true);
  Vector<String> names;
  service->getIdentities(names);
  for (String const& name : names) {
    RefPtr<LS_IIdentity> identity;
    if (LS_getIdentityIf(service, name, identity).isSuccess())
      watchIdentity(identity.get());
  }
}

void ModelWatcher::watchIdentity(LS_IIdentity* identity) {
  m_identities.push_back(identity);
  observeIdentity(identity, true);
}

void ModelWatcher::observeMaster(bool observe) {
  RefPtr<LS_IMasterLocationServiceSubject> subject;
  if (m_session.locationMaster()->queryIf(subject).isFailure())
    return;
  if (observe)
    subject->addMasterLocationServiceObserver(this, 0);
  else
    subject->removeMasterLocationServiceObserver(this);
}

void ModelWatcher::observeService(LS_ILocationService* service, bool observe) {
  RefPtr<LS_ILocationServiceSubject> subject;
  if (service->queryIf(subject).isFailure())
    return;
  if (observe)
    subject->addLocationServiceObserver(this, 0);
  else
    subject->removeLocationServiceObserver(this);
}

void ModelWatcher::observeIdentity(LS_IIdentity* identity, bool observe) {
  RefPtr<LS_IRegistrationOutboundSubject> outbound;
  RefPtr<LS_IRegistrationInboundSubject> inbound;
  RefPtr<LS_IMwiSubscriptionSubject> mwi;
  if (identity->queryIf(outbound).isFailure() || identity->queryIf(inbound).isFailure() ||
      identity->queryIf(mwi).isFailure())
    return;
  if (observe) {
    outbound->addRegistrationOutboundObserver(this, 0);
    inbound->addRegistrationInboundObserver(this, 0);
    mwi->addMwiSubscriptionObserver(this, 0);
    return;
  }
  outbound->removeRegistrationOutboundObserver(this);
  inbound->removeRegistrationInboundObserver(this);
  mwi->removeMwiSubscriptionObserver(this);
}

void ModelWatcher::print(std::string const& line) {
  m_session.event("event: " + line + "\n");
}

void ModelWatcher::onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) {
  auto const* added = dynamic_cast<LS_IMasterLocationServiceSubject::EvLocationService*>(&event);
  if (!added || !added->locationService)
    return;
  print("location service \"" + added->locationService->getName().str() + "\" added");
  watchService(added->locationService.get());
}

void ModelWatcher::onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) {
  auto const* removed = dynamic_cast<LS_IMasterLocationServiceSubject::EvLocationService*>(&event);
  if (removed && removed->locationService)
    print("location service \"" + removed->locationService->getName().str() + "\" removed");
}

void ModelWatcher::onIdentityAdded(ObserverEvent<LS_ILocationService>& event) {
  auto const* added = dynamic_cast<LS_ILocationServiceSubject::EvIdentity*>(&event);
  if (!added || !added->identity)
    return;
  print("identity " + event.getSubject()->getName().str() + "/" + added->identity->getName().str() + " added");
  watchIdentity(added->identity.get());
}

void ModelWatcher::onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) {
  auto const* removed = dynamic_cast<LS_ILocationServiceSubject::EvIdentity*>(&event);
  if (removed && removed->identity)
    print("identity " + event.getSubject()->getName().str() + "/" + removed->identity->getName().str() + " removed");
}

void ModelWatcher::onRegistrationOutboundChange(ObserverEvent<LS_IRegistrationOutbound>& event) {
  print("outbound registration of " + identityOf<LS_IRegistrationOutboundSubject>(event) + " changed");
}

void ModelWatcher::onRegistrationInboundChange(ObserverEvent<LS_IRegistrationInbound>& event) {
  print("inbound registration of " + identityOf<LS_IRegistrationInboundSubject>(event) + " changed");
}

void ModelWatcher::onRegistrationInboundRegistered(ObserverEvent<LS_IRegistrationInbound>& event) {
  print(identityOf<LS_IRegistrationInboundSubject>(event) + " registered inbound");
}

void ModelWatcher::onRegistrationInboundUnregistered(ObserverEvent<LS_IRegistrationInbound>& event) {
  print(identityOf<LS_IRegistrationInboundSubject>(event) + " unregistered inbound");
}

void ModelWatcher::onMwiSubscriptionChange(ObserverEvent<LS_IMwiSubscription>& event) {
  print("message-waiting subscription of " + identityOf<LS_IMwiSubscriptionSubject>(event) + " changed");
}
