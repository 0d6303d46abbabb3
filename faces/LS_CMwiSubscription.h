// LS_CMwiSubscription: an identity's message-waiting face, the child
// "message-subscription" of its identity: how the gateway subscribes, on
// behalf of the identity, to message-waiting notifications. Besides the
// outbound settings it holds the configured message-server pair, the
// subscription lifetime and mode and the retry timeouts, and records the
// message server learnt at run time.
//
// Like every face it keeps each value as a data value of its container, read
// "localOnly" by config getters and "localOrBase" by effective getters. It
// raises no event of its own: a change of any of its values reaches the
// owning identity as a change of its child, and the identity tells its
// message-waiting observers. Ownership and threading as for LS_COutbound.
// How the SIP side subscribes does not belong here.
#pragma once

#include "CInherit.h"
#include "LS_COutbound.h"
#include "LS_IMwiSubscription.h"
#include "LS_IMwiSubscriptionConfig.h"

class LS_CMwiSubscription
    : public CInherit<LS_CMwiSubscription, LS_COutbound, LS_IMwiSubscriptionConfig, LS_IMwiSubscription> {
 public:
  LS_CMwiSubscription();
  ~LS_CMwiSubscription() override;

  // LS_IElement
  XCode create(RefPtr<LS_IElement>& element) override;

  // LS_IMwiSubscriptionConfig
  XCode getConfigMwiNotifier(CHostPort& notifier, CHostPort& tlsNotifier) const override;
  void setConfigMwiNotifier(CHostPort const& notifier, CHostPort const& tlsNotifier) override;
  void removeConfigMwiNotifier() override;
  XCode getConfigLifetime(unsigned int& lifetime) const override;
  void setConfigLifetime(unsigned int lifetime) override;
  void removeConfigLifetime() override;
  XCode getConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::Type& mode) const override;
  void setConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::Type mode) override;
  // Unlike the other removers, writes no log line.
  void removeConfigMwiSubscriptionMode() override;
  XCode getConfigRetryTimeoutOnSystemError(unsigned int& timeout) const override;
  void setConfigRetryTimeoutOnSystemError(unsigned int timeout) override;
  void removeConfigRetryTimeoutOnSystemError() override;
  XCode getConfigRetryTimeoutOnClientError(unsigned int& timeout) const override;
  void setConfigRetryTimeoutOnClientError(unsigned int timeout) override;
  void removeConfigRetryTimeoutOnClientError() override;
  XCode getConfigRetryTimeoutOnServerError(unsigned int& timeout) const override;
  void setConfigRetryTimeoutOnServerError(unsigned int timeout) override;
  void removeConfigRetryTimeoutOnServerError() override;

  // LS_IMwiSubscription
  XCode getMwiNotifier(CHostPort& notifier, CHostPort& tlsNotifier) const override;
  XCode getDynamicMwiNotifier(CHostPort& notifier) const override;
  void setDynamicMwiNotifier(CHostPort const& notifier) override;
  void removeDynamicMwiNotifier() override;
  unsigned int getLifetime() const override;
  LS_MwiSubscriptionMode::Type getMwiSubscriptionMode() const override;
  unsigned int getRetryTimeoutOnSystemError() const override;
  unsigned int getRetryTimeoutOnClientError() const override;
  unsigned int getRetryTimeoutOnServerError() const override;

  // IInfo: the heading "Mwi Subscription" (after prefix) at level, the
  // outbound rows, then the message-server pair, lifetime and mode at
  // level + 1. The dynamic notifier and the retry timeouts are not shown.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;
};
