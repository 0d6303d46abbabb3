// LS_IMwiSubscriptionObserver: the watcher of an identity's message-waiting
// subscription, implemented by clients. A plain abstract class, not an
// IUnknown: the identity borrows its observers and never counts them.
#pragma once

#include "Export.h"

#include "ObserverEvent.h"

class LS_IMwiSubscription;

class LS_EXPORT LS_IMwiSubscriptionObserver {
 public:
  // The identity's subscription settings, own or inherited, may have
  // changed; event is an LS_IMwiSubscriptionSubject::EvIdentity.
  virtual void onMwiSubscriptionChange(ObserverEvent<LS_IMwiSubscription>& event) = 0;

 protected:
  ~LS_IMwiSubscriptionObserver() = default;
};
