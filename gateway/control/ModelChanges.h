// ModelChanges: what a control line changed in the model that the gateway's
// own run-time state depends on, learnt from the model's notifications, so
// that the registrar and the trunks look only at what changed instead of at
// every identity (some 100,000 lookups, a quarter of a second, while SIP
// requests wait). During a line it records the identities removed, the
// identities added or whose outbound registration changed (own face or one
// inherited from a group: the library tells every member), apart from them
// those whose message-waiting face changed, and whether a
// location service came or went, whose identities are not announced one by
// one, so that the holders then look at everything.
//
// It observes the master, every location service and every configured
// identity for as long as it lives, and records only between begin() and
// end(): what the gateway does itself while serving (a dynamic identity for
// a "DEFAULT" user, a trunk's learnt registrar address) is not a change, and
// a pointer kept from then could meet a new identity at the same address.
// So an identity the gateway creates while serving is not observed, and is
// never a trunk.
//
// Owned by the Gateway; a removed identity's pointer is for comparison
// only, never followed. Everything runs on libre's thread.
#pragma once

#include <vector>

#include "LS_IIdentity.h"
#include "LS_ILocationService.h"
#include "LS_ILocationServiceObserver.h"
#include "LS_IMasterLocationService.h"
#include "LS_IMasterLocationServiceObserver.h"
#include "LS_IMwiSubscriptionObserver.h"
#include "LS_IRegistrationOutboundObserver.h"
#include "RefPtr.h"

class ModelChanges final : private LS_IMasterLocationServiceObserver,
                           private LS_ILocationServiceObserver,
                           private LS_IRegistrationOutboundObserver,
                           private LS_IMwiSubscriptionObserver {
 public:
  explicit ModelChanges(LS_IMasterLocationService& master);
  ~ModelChanges();
  ModelChanges(ModelChanges const&) = delete;
  ModelChanges& operator=(ModelChanges const&) = delete;

  void begin();
  void end();

  std::vector<LS_IIdentity const*> const& removed() const { return m_removed; }
  // Added or with a changed outbound registration; may hold one twice, and
  // one removed later in the same line.
  std::vector<RefPtr<LS_IIdentity>> const& touched() const { return m_touched; }
  bool anyServiceChanged() const { return m_anyServiceChanged; }
  // With a changed message-waiting face (own or inherited); may hold one
  // twice, and one removed later in the same line.
  std::vector<RefPtr<LS_IIdentity>> const& mwiTouched() const { return m_mwiTouched; }

 private:
  void observe(LS_ILocationService* service);
  void observe(LS_IIdentity* identity);

  void onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) override;
  void onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) override;
  void onIdentityAdded(ObserverEvent<LS_ILocationService>& event) override;
  void onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) override;
  void onRegistrationOutboundChange(ObserverEvent<LS_IRegistrationOutbound>& event) override;
  void onMwiSubscriptionChange(ObserverEvent<LS_IMwiSubscription>& event) override;

  LS_IMasterLocationService& m_master;
  std::vector<RefPtr<LS_ILocationService>> m_services;
  // Every identity observed, unregistered from when this dies.
  std::vector<RefPtr<LS_IIdentity>> m_identities;
  bool m_recording = false;
  std::vector<LS_IIdentity const*> m_removed;
  std::vector<RefPtr<LS_IIdentity>> m_touched;
  std::vector<RefPtr<LS_IIdentity>> m_mwiTouched;
  bool m_anyServiceChanged = false;
};
