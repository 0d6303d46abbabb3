// LS_IMasterLocationServiceSubject: the master location service as the
// subject of location services coming and going. The event names the
// location service concerned.
#pragma once

#include "Export.h"

#include <memory>

#include "LS_ILocationService.h"
#include "LS_IMasterLocationService.h"
#include "LS_IMasterLocationServiceObserver.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "ObserverEvent.h"
#include "RefPtr.h"

class LS_EXPORT LS_IMasterLocationServiceSubject : public LS_Interface<LS_IMasterLocationServiceSubjectIdentifiers> {
 public:
  // Holds the location service by a counted reference, so that a removed
  // service lives at least until every observer has seen it.
  class EvLocationService : public ObserverEvent<LS_IMasterLocationService> {
   public:
    EvLocationService(LS_IMasterLocationService* master, LS_ILocationService* service)
        : ObserverEvent<LS_IMasterLocationService>(master), locationService(service) {}
    EvLocationService(EvLocationService const&) = default;
    std::unique_ptr<ObserverEvent<LS_IMasterLocationService>> clone() const override {
      return std::make_unique<EvLocationService>(*this);
    }

    RefPtr<LS_ILocationService> locationService;
  };

  virtual void addMasterLocationServiceObserver(LS_IMasterLocationServiceObserver* observer,
                                                unsigned int priority) = 0;
  // Undoes one registration; unknown observers are ignored.
  virtual void removeMasterLocationServiceObserver(LS_IMasterLocationServiceObserver* observer) = 0;

 protected:
  ~LS_IMasterLocationServiceSubject() = default;
};
