// LS_IMwiSubscription: the run-time side of an identity's message-waiting
// face: the effective subscription settings, and the message server that
// the SIP side learns at run time (the dynamic notifier).
//
// Effective getters show this face's own value, else the one inherited from
// the same face of the base identity, else the default (or failure for the
// notifier addresses). Configuration goes through LS_IMwiSubscriptionConfig.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "LS_MwiSubscriptionMode.h"
#include "XCode.h"

class LS_EXPORT LS_IMwiSubscription : public LS_Interface<LS_IMwiSubscriptionIdentifiers> {
 public:
  // The configured pair, inherited included; the dynamic notifier is not
  // consulted.
  virtual XCode getMwiNotifier(CHostPort& notifier, CHostPort& tlsNotifier) const = 0;
  // This face's own pair only, as LS_IMwiSubscriptionConfig reads it; the
  // run-time side offers it too, as its published method table does.
  virtual XCode getConfigMwiNotifier(CHostPort& notifier, CHostPort& tlsNotifier) const = 0;
  virtual XCode getDynamicMwiNotifier(CHostPort& notifier) const = 0;
  virtual void setDynamicMwiNotifier(CHostPort const& notifier) = 0;
  virtual void removeDynamicMwiNotifier() = 0;
  // 3600 when nothing is configured.
  virtual unsigned int getLifetime() const = 0;
  virtual LS_MwiSubscriptionMode::Type getMwiSubscriptionMode() const = 0;
  // Each 10 when nothing is configured.
  virtual unsigned int getRetryTimeoutOnSystemError() const = 0;
  virtual unsigned int getRetryTimeoutOnClientError() const = 0;
  virtual unsigned int getRetryTimeoutOnServerError() const = 0;

 protected:
  ~LS_IMwiSubscription() = default;
};
