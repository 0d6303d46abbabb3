// LS_CRegistrationOutbound: an identity's outbound-registration face, the
// child "registration-outbound" of its identity: how the gateway registers
// the identity with a registrar. Besides the outbound settings it holds the
// configured registrar pair, lifetime, retry timeouts, mode, URI scheme,
// DNS security check, NAT traversal, keep-alive and priority, and records
// the registrar learnt at run time and the registrar address in use.
//
// Like every face it keeps each value as a data value of its container, read
// "localOnly" by config getters and "localOrBase" by effective getters. It
// raises no event of its own: a change of any of its values reaches the
// owning identity as a change of its child, and the identity tells its
// outbound-registration observers. Ownership and threading as for
// LS_COutbound. What the SIP side does with the settings does not belong
// here.
#pragma once

#include "CInherit.h"
#include "LS_COutbound.h"
#include "LS_IRegistrationOutbound.h"
#include "LS_IRegistrationOutboundConfig.h"

class LS_CRegistrationOutbound : public CInherit<LS_CRegistrationOutbound,
                                                 LS_COutbound,
                                                 LS_IRegistrationOutboundConfig,
                                                 LS_IRegistrationOutbound> {
 public:
  LS_CRegistrationOutbound();
  ~LS_CRegistrationOutbound() override;

  // LS_IElement
  XCode create(RefPtr<LS_IElement>& element) override;

  // LS_IRegistrationOutboundConfig; getConfigRegistrar serves
  // LS_IRegistrationOutbound as well.
  XCode getConfigRegistrar(CHostPort& registrar, CHostPort& tlsRegistrar) const override;
  void setConfigRegistrar(CHostPort const& registrar, CHostPort const& tlsRegistrar) override;
  void removeConfigRegistrar() override;
  XCode getConfigLifetime(unsigned int& lifetime) const override;
  void setConfigLifetime(unsigned int lifetime) override;
  void removeConfigLifetime() override;
  void setConfigDnsSecurityCheck(bool check) override;
  XCode getConfigDnsSecurityCheck(bool& check) const override;
  void removeConfigDnsSecurityCheck() override;
  XCode getConfigRegistrationMode(LS_RegistrationMode::Type& mode) const override;
  void setConfigRegistrationMode(LS_RegistrationMode::Type mode) override;
  void removeConfigRegistrationMode() override;
  XCode getConfigUriScheme(LS_UriScheme::Type& scheme) const override;
  void setConfigUriScheme(LS_UriScheme::Type scheme) override;
  void removeConfigUriScheme() override;
  XCode getConfigRetryTimeoutOnSystemError(unsigned int& timeout) const override;
  void setConfigRetryTimeoutOnSystemError(unsigned int timeout) override;
  void removeConfigRetryTimeoutOnSystemError() override;
  XCode getConfigRetryTimeoutOnClientError(unsigned int& timeout) const override;
  void setConfigRetryTimeoutOnClientError(unsigned int timeout) override;
  void removeConfigRetryTimeoutOnClientError() override;
  XCode getConfigRetryTimeoutOnServerError(unsigned int& timeout) const override;
  void setConfigRetryTimeoutOnServerError(unsigned int timeout) override;
  void removeConfigRetryTimeoutOnServerError() override;
  XCode getConfigNatTraversalFlows(bool& flows) const override;
  void setConfigNatTraversalFlows(bool flows) override;
  void removeConfigNatTraversalFlows() override;
  XCode getConfigNatTraversalMethod(LS_NatTraversalMethod::Type& method) const override;
  void setConfigNatTraversalMethod(LS_NatTraversalMethod::Type method) override;
  void removeConfigNatTraversalMethod() override;
  XCode getConfigKeepAliveMethod(LS_KeepAliveMethod::Type& method) const override;
  void setConfigKeepAliveMethod(LS_KeepAliveMethod::Type method) override;
  void removeConfigKeepAliveMethod() override;
  XCode getConfigKeepAliveInterval(unsigned int& interval) const override;
  void setConfigKeepAliveInterval(unsigned int interval) override;
  void removeConfigKeepAliveInterval() override;
  XCode getConfigPriority(unsigned int& priority) const override;
  void setConfigPriority(unsigned int priority) override;
  void removeConfigPriority() override;

  // LS_IRegistrationOutbound
  XCode getRegistrar(CHostPort& registrar, CHostPort& tlsRegistrar) const override;
  XCode getDynamicRegistrar(CHostPort& registrar) const override;
  void setDynamicRegistrar(CHostPort const& registrar) override;
  void removeDynamicRegistrar() override;
  void setRegistrarAddr(CHostPort const& address) override;
  XCode getRegistrarAddr(CHostPort& address) const override;
  unsigned int getLifetime() const override;
  bool getDnsSecurityCheck() const override;
  LS_RegistrationMode::Type getRegistrationMode() const override;
  LS_UriScheme::Type getUriScheme() const override;
  unsigned int getRetryTimeoutOnSystemError() const override;
  unsigned int getRetryTimeoutOnClientError() const override;
  unsigned int getRetryTimeoutOnServerError() const override;
  unsigned int getPriority() const override;
  bool getNatTraversalFlows() const override;
  LS_NatTraversalMethod::Type getNatTraversalMethod() const override;
  LS_KeepAliveMethod::Type getKeepAliveMethod() const override;
  unsigned int getKeepAliveInterval() const override;

  // IInfo: the heading "Outbound Registration" (after prefix) at level, the
  // outbound rows, then the registrar pair, lifetime, URI scheme, mode and
  // registrar address at level + 1. The dynamic registrar, retry timeouts,
  // DNS check, NAT traversal, keep-alive and priority are not shown.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;
};
