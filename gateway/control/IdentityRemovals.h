// IdentityRemovals: the identities a control line removed, so that the parts
// holding run-time state for identities (the registrar's bindings) can let
// go of theirs once the line is done. It observes the master location
// service and every location service for as long as it lives, and records
// only between begin() and end(): removals the gateway makes itself while
// serving (a dynamic identity whose last binding went) are its own
// business, and a pointer kept from then could meet a new identity at the
// same address later.
//
// A removed location service is recorded as such: its identities' removals
// are not announced one by one, so a holder then checks all it holds.
//
// Owned by the front-end; the recorded pointers are for comparison only,
// never followed. Everything runs on libre's thread.
#pragma once

#include <vector>

#include "LS_IIdentity.h"
#include "LS_ILocationService.h"
#include "LS_ILocationServiceObserver.h"
#include "LS_IMasterLocationService.h"
#include "LS_IMasterLocationServiceObserver.h"
#include "RefPtr.h"

class IdentityRemovals : private LS_IMasterLocationServiceObserver, private LS_ILocationServiceObserver {
 public:
  explicit IdentityRemovals(LS_IMasterLocationService& master);
  ~IdentityRemovals();
  IdentityRemovals(IdentityRemovals const&) = delete;
  IdentityRemovals& operator=(IdentityRemovals const&) = delete;

  void begin();
  void end();

  std::vector<LS_IIdentity const*> const& identities() const { return m_identities; }
  bool anyServiceRemoved() const { return m_anyServiceRemoved; }

 private:
  void observe(LS_ILocationService* service);

  void onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) override;
  void onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) override;
  void onIdentityAdded(ObserverEvent<LS_ILocationService>&) override {}
  void onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) override;

  LS_IMasterLocationService& m_master;
  std::vector<RefPtr<LS_ILocationService>> m_services;
  bool m_recording = false;
  std::vector<LS_IIdentity const*> m_identities;
  bool m_anyServiceRemoved = false;
};
