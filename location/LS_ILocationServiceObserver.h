// LS_ILocationServiceObserver: the watcher of a location service's
// identities, implemented by clients. A plain abstract class, not an
// IUnknown: the location service borrows its observers and never counts
// them.
#pragma once

#include "Export.h"

#include "ObserverEvent.h"

class LS_ILocationService;

class LS_EXPORT LS_ILocationServiceObserver {
 public:
  // Each event is an LS_ILocationServiceSubject::EvIdentity. A configured
  // identity that takes over a dynamic one is not added again.
  virtual void onIdentityAdded(ObserverEvent<LS_ILocationService>& event) = 0;
  // Sent before the identity announces its destruction to the elements
  // based on it.
  virtual void onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) = 0;

 protected:
  ~LS_ILocationServiceObserver() = default;
};
