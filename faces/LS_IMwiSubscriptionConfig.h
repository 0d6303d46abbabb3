// LS_IMwiSubscriptionConfig: the configuration side of an identity's
// message-waiting face: the message server (MWI notifier) with its TLS
// counterpart, the subscription lifetime and mode, and the retry timeouts
// after system, client and server errors.
//
// Every getter here reads only what this face holds itself. The outbound
// settings common to all outbound faces are in LS_IOutboundConfig; the
// effective settings and the notifier learnt at run time in
// LS_IMwiSubscription. Setters and removers cannot fail.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "LS_MwiSubscriptionMode.h"
#include "XCode.h"

class LS_EXPORT LS_IMwiSubscriptionConfig : public LS_Interface<LS_IMwiSubscriptionConfigIdentifiers> {
 public:
  // Fails unless this face holds both addresses; notifier may be filled
  // already when only the TLS address is missing.
  virtual XCode getConfigMwiNotifier(CHostPort& notifier, CHostPort& tlsNotifier) const = 0;
  virtual void setConfigMwiNotifier(CHostPort const& notifier, CHostPort const& tlsNotifier) = 0;
  // Removes both addresses.
  virtual void removeConfigMwiNotifier() = 0;
  virtual XCode getConfigLifetime(unsigned int& lifetime) const = 0;
  virtual void setConfigLifetime(unsigned int lifetime) = 0;
  virtual void removeConfigLifetime() = 0;
  virtual XCode getConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::Type& mode) const = 0;
  virtual void setConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::Type mode) = 0;
  virtual void removeConfigMwiSubscriptionMode() = 0;
  virtual XCode getConfigRetryTimeoutOnSystemError(unsigned int& timeout) const = 0;
  virtual void setConfigRetryTimeoutOnSystemError(unsigned int timeout) = 0;
  virtual void removeConfigRetryTimeoutOnSystemError() = 0;
  virtual XCode getConfigRetryTimeoutOnClientError(unsigned int& timeout) const = 0;
  virtual void setConfigRetryTimeoutOnClientError(unsigned int timeout) = 0;
  virtual void removeConfigRetryTimeoutOnClientError() = 0;
  virtual XCode getConfigRetryTimeoutOnServerError(unsigned int& timeout) const = 0;
  virtual void setConfigRetryTimeoutOnServerError(unsigned int timeout) = 0;
  virtual void removeConfigRetryTimeoutOnServerError() = 0;

 protected:
  ~LS_IMwiSubscriptionConfig() = default;
};
