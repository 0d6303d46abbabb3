// ModelWatcher: the host program's observer of the whole location model. While
// watching it is registered with the master location service, every location
// service and every identity (configured and dynamic), follows the services
// and identities that are added, and prints one line per event into the
// session's output as the event happens, so that a change on a group shows up
// once for every identity derived from it.
//
// Owned by the session. It holds a counted reference to every subject it is
// registered with and unregisters from all of them when watching stops or
// it dies, so no subject keeps a pointer to a dead watcher. Callbacks only
// print and register; they never change the model.
#pragma once

#include <vector>

#include "LS_IIdentity.h"
#include "LS_ILocationService.h"
#include "LS_ILocationServiceObserver.h"
#include "LS_IMasterLocationServiceObserver.h"
#include "LS_IMwiSubscriptionObserver.h"
#include "LS_IRegistrationInboundObserver.h"
#include "LS_IRegistrationOutboundObserver.h"
#include "RefPtr.h"

class ScriptSession;

class ModelWatcher : public LS_IMasterLocationServiceObserver,
                     public LS_ILocationServiceObserver,
                     public LS_IRegistrationOutboundObserver,
                     public LS_IRegistrationInboundObserver,
                     public LS_IMwiSubscriptionObserver {
 public:
  explicit ModelWatcher(ScriptSession& session) : m_session(session) {}
  ~ModelWatcher();
  ModelWatcher(ModelWatcher const&) = delete;
  ModelWatcher& operator=(ModelWatcher const&) = delete;

  bool isWatching() const { return m_watching; }
  void start();
  void stop();

  void onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) override;
  void onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) override;
  void onIdentityAdded(ObserverEvent<LS_ILocationService>& event) override;
  void onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) override;
  void onRegistrationOutboundChange(ObserverEvent<LS_IRegistrationOutbound>& event) override;
  void onRegistrationInboundChange(ObserverEvent<LS_IRegistrationInbound>& event) override;
  void onRegistrationInboundRegistered(ObserverEvent<LS_IRegistrationInbound>& event) override;
  void onRegistrationInboundUnregistered(ObserverEvent<LS_IRegistrationInbound>& event) override;
  void onMwiSubscriptionChange(ObserverEvent<LS_IMwiSubscription>& event) override;

 private:
  void watchService(LS_ILocationService* service);
  void watchIdentity(LS_IIdentity* identity);
  // Registers with the subject, or unregisters when observe is false.
  void observeMaster(bool observe);
  void observeService(LS_ILocationService* service, bool observe);
  void observeIdentity(LS_IIdentity* identity, bool observe);
  void print(std::string const& line);

  ScriptSession& m_session;
  bool m_watching = false;
  std::vector<RefPtr<LS_ILocationService>> m_services;
  std::vector<RefPtr<LS_IIdentity>> m_identities;
};
