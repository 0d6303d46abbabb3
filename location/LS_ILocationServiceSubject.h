// LS_ILocationServiceSubject: a location service as the subject of its
// identities coming and going. The event names the identity concerned.
#pragma once

#include "Export.h"

#include <memory>

#include "LS_IIdentity.h"
#include "LS_ILocationService.h"
#include "LS_ILocationServiceObserver.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "ObserverEvent.h"
#include "RefPtr.h"

class LS_EXPORT LS_ILocationServiceSubject : public LS_Interface<LS_ILocationServiceSubjectIdentifiers> {
 public:
  // Holds the identity by a counted reference, so that a removed identity
  // lives at least until every observer has seen it.
  class EvIdentity : public ObserverEvent<LS_ILocationService> {
   public:
    EvIdentity(LS_ILocationService* service, LS_IIdentity* concerned)
        : ObserverEvent<LS_ILocationService>(service), identity(concerned) {}
    EvIdentity(EvIdentity const&) = default;
    std::unique_ptr<ObserverEvent<LS_ILocationService>> clone() const override {
      return std::make_unique<EvIdentity>(*this);
    }

    RefPtr<LS_IIdentity> identity;
  };

  virtual void addLocationServiceObserver(LS_ILocationServiceObserver* observer, unsigned int priority) = 0;
  // Undoes one registration; unknown observers are ignored.
  virtual void removeLocationServiceObserver(LS_ILocationServiceObserver* observer) = 0;

 protected:
  ~LS_ILocationServiceSubject() = default;
};
