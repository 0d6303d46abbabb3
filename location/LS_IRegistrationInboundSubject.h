// LS_IRegistrationInboundSubject: an identity as the subject of its inbound registration:
// observers register here and receive an EvIdentity whose subject is the
// identity's face (own or inherited; null while the identity has none) and
// which names the identity. When the identity raises the events belongs to
// the identity.
#pragma once

#include "Export.h"

#include <memory>

#include "LS_IIdentity.h"
#include "LS_IRegistrationInbound.h"
#include "LS_IRegistrationInboundObserver.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "ObserverEvent.h"
#include "RefPtr.h"

class LS_EXPORT LS_IRegistrationInboundSubject : public LS_Interface<LS_IRegistrationInboundSubjectIdentifiers> {
 public:
  // Holds the identity by a counted reference, so an observer may drop
  // every other reference to it while the event is being delivered.
  class EvIdentity : public ObserverEvent<LS_IRegistrationInbound> {
   public:
    EvIdentity(LS_IRegistrationInbound* face, LS_IIdentity* concerned)
        : ObserverEvent<LS_IRegistrationInbound>(face), identity(concerned) {}
    EvIdentity(EvIdentity const&) = default;
    std::unique_ptr<ObserverEvent<LS_IRegistrationInbound>> clone() const override {
      return std::make_unique<EvIdentity>(*this);
    }

    RefPtr<LS_IIdentity> identity;
  };

  virtual void addRegistrationInboundObserver(LS_IRegistrationInboundObserver* observer,
                                              unsigned int priority) = 0;
  // Undoes one registration; unknown observers are ignored.
  virtual void removeRegistrationInboundObserver(LS_IRegistrationInboundObserver* observer) = 0;

 protected:
  ~LS_IRegistrationInboundSubject() = default;
};
