// LS_IMasterLocationServiceObserver: the watcher of the registry of
// location services, implemented by clients. A plain abstract class, not an
// IUnknown: the master borrows its observers and never counts them.
#pragma once

#include "Export.h"

#include "ObserverEvent.h"

class LS_IMasterLocationService;

class LS_EXPORT LS_IMasterLocationServiceObserver {
 public:
  // Each event is an LS_IMasterLocationServiceSubject::EvLocationService.
  virtual void onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) = 0;
  // Sent once the service's identities no longer point back at it.
  virtual void onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) = 0;

 protected:
  ~LS_IMasterLocationServiceObserver() = default;
};
