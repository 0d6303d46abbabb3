// LS_IRegistrationOutboundObserver: the watcher of an identity's outbound
// registration, implemented by clients. A plain abstract class, not an
// IUnknown: the identity borrows its observers and never counts them.
#pragma once

#include "Export.h"

#include "ObserverEvent.h"

class LS_IRegistrationOutbound;

class LS_EXPORT LS_IRegistrationOutboundObserver {
 public:
  // The identity's outbound-registration settings, own or inherited, may
  // have changed; event is an LS_IRegistrationOutboundSubject::EvIdentity.
  virtual void onRegistrationOutboundChange(ObserverEvent<LS_IRegistrationOutbound>& event) = 0;

 protected:
  ~LS_IRegistrationOutboundObserver() = default;
};
