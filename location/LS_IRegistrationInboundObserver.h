// LS_IRegistrationInboundObserver: the watcher of an identity's inbound
// registration, implemented by clients. A plain abstract class, not an
// IUnknown: the identity borrows its observers and never counts them.
#pragma once

#include "Export.h"

#include "ObserverEvent.h"

class LS_IRegistrationInbound;

class LS_EXPORT LS_IRegistrationInboundObserver {
 public:
  // Each event is an LS_IRegistrationInboundSubject::EvIdentity. A change
  // of the settings or contacts, own or inherited:
  virtual void onRegistrationInboundChange(ObserverEvent<LS_IRegistrationInbound>& event) = 0;
  // The SIP side reported the identity registered or unregistered at this
  // gateway; only sent while the identity has the face.
  virtual void onRegistrationInboundRegistered(ObserverEvent<LS_IRegistrationInbound>& event) = 0;
  virtual void onRegistrationInboundUnregistered(ObserverEvent<LS_IRegistrationInbound>& event) = 0;

 protected:
  ~LS_IRegistrationInboundObserver() = default;
};
