// LS_IRegistrationOutboundConfig: the configuration side of an identity's
// outbound-registration face: the registrar with its TLS counterpart, the
// registration lifetime, the retry timeouts after system, client and server
// errors, the registration mode, URI scheme, DNS security check, NAT
// traversal, keep-alive and priority.
//
// Every getter here reads only what this face holds itself. The outbound
// settings common to all outbound faces are in LS_IOutboundConfig; the
// effective settings and the run-time registrar state in
// LS_IRegistrationOutbound. Setters and removers cannot fail.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "LS_KeepAliveMethod.h"
#include "LS_NatTraversalMethod.h"
#include "LS_RegistrationMode.h"
#include "LS_UriScheme.h"
#include "XCode.h"

class LS_EXPORT LS_IRegistrationOutboundConfig : public LS_Interface<LS_IRegistrationOutboundConfigIdentifiers> {
 public:
  // Fails unless this face holds both addresses; registrar may be filled
  // already when only the TLS address is missing.
  virtual XCode getConfigRegistrar(CHostPort& registrar, CHostPort& tlsRegistrar) const = 0;
  virtual void setConfigRegistrar(CHostPort const& registrar, CHostPort const& tlsRegistrar) = 0;
  // Removes both addresses.
  virtual void removeConfigRegistrar() = 0;
  virtual XCode getConfigLifetime(unsigned int& lifetime) const = 0;
  virtual void setConfigLifetime(unsigned int lifetime) = 0;
  virtual void removeConfigLifetime() = 0;
  virtual void setConfigDnsSecurityCheck(bool check) = 0;
  virtual XCode getConfigDnsSecurityCheck(bool& check) const = 0;
  virtual void removeConfigDnsSecurityCheck() = 0;
  virtual XCode getConfigRegistrationMode(LS_RegistrationMode::Type& mode) const = 0;
  virtual void setConfigRegistrationMode(LS_RegistrationMode::Type mode) = 0;
  virtual void removeConfigRegistrationMode() = 0;
  virtual XCode getConfigUriScheme(LS_UriScheme::Type& scheme) const = 0;
  virtual void setConfigUriScheme(LS_UriScheme::Type scheme) = 0;
  virtual void removeConfigUriScheme() = 0;
  virtual XCode getConfigRetryTimeoutOnSystemError(unsigned int& timeout) const = 0;
  virtual void setConfigRetryTimeoutOnSystemError(unsigned int timeout) = 0;
  virtual void removeConfigRetryTimeoutOnSystemError() = 0;
  virtual XCode getConfigRetryTimeoutOnClientError(unsigned int& timeout) const = 0;
  virtual void setConfigRetryTimeoutOnClientError(unsigned int timeout) = 0;
  virtual void removeConfigRetryTimeoutOnClientError() = 0;
  virtual XCode getConfigRetryTimeoutOnServerError(unsigned int& timeout) const = 0;
  virtual void setConfigRetryTimeoutOnServerError(unsigned int timeout) = 0;
  virtual void removeConfigRetryTimeoutOnServerError() = 0;
  virtual XCode getConfigNatTraversalFlows(bool& flows) const = 0;
  virtual void setConfigNatTraversalFlows(bool flows) = 0;
  virtual void removeConfigNatTraversalFlows() = 0;
  virtual XCode getConfigNatTraversalMethod(LS_NatTraversalMethod::Type& method) const = 0;
  virtual void setConfigNatTraversalMethod(LS_NatTraversalMethod::Type method) = 0;
  virtual void removeConfigNatTraversalMethod() = 0;
  virtual XCode getConfigKeepAliveMethod(LS_KeepAliveMethod::Type& method) const = 0;
  virtual void setConfigKeepAliveMethod(LS_KeepAliveMethod::Type method) = 0;
  virtual void removeConfigKeepAliveMethod() = 0;
  virtual XCode getConfigKeepAliveInterval(unsigned int& interval) const = 0;
  virtual void setConfigKeepAliveInterval(unsigned int interval) = 0;
  virtual void removeConfigKeepAliveInterval() = 0;
  virtual XCode getConfigPriority(unsigned int& priority) const = 0;
  virtual void setConfigPriority(unsigned int priority) = 0;
  virtual void removeConfigPriority() = 0;

 protected:
  ~LS_IRegistrationOutboundConfig() = default;
};
