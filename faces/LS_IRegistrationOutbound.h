// LS_IRegistrationOutbound: the run-time side of an identity's
// outbound-registration face: the effective registration settings, and the
// registrar state that the SIP side records (a registrar learnt at run time
// and the registrar address actually used).
//
// Effective getters show this face's own value, else the one inherited from
// the same face of the base identity, else the default (or failure for the
// registrar addresses). Run-time state recorded on a base identity's face is
// seen through every identity that inherits it and has none of its own.
// Configuration goes through LS_IRegistrationOutboundConfig.
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

class LS_EXPORT LS_IRegistrationOutbound : public LS_Interface<LS_IRegistrationOutboundIdentifiers> {
 public:
  // The configured pair, inherited included; the dynamic registrar is not
  // consulted.
  virtual XCode getRegistrar(CHostPort& registrar, CHostPort& tlsRegistrar) const = 0;
  // The same operation as LS_IRegistrationOutboundConfig's: this face's own
  // pair only.
  virtual XCode getConfigRegistrar(CHostPort& registrar, CHostPort& tlsRegistrar) const = 0;
  virtual XCode getDynamicRegistrar(CHostPort& registrar) const = 0;
  virtual void setDynamicRegistrar(CHostPort const& registrar) = 0;
  virtual void removeDynamicRegistrar() = 0;
  // Recorded for good: no operation removes it again.
  virtual void setRegistrarAddr(CHostPort const& address) = 0;
  virtual XCode getRegistrarAddr(CHostPort& address) const = 0;
  // 3600 when nothing is configured.
  virtual unsigned int getLifetime() const = 0;
  virtual bool getDnsSecurityCheck() const = 0;
  virtual LS_RegistrationMode::Type getRegistrationMode() const = 0;
  virtual LS_UriScheme::Type getUriScheme() const = 0;
  // Each 10 when nothing is configured.
  virtual unsigned int getRetryTimeoutOnSystemError() const = 0;
  virtual unsigned int getRetryTimeoutOnClientError() const = 0;
  virtual unsigned int getRetryTimeoutOnServerError() const = 0;
  // All bits set when nothing is configured.
  virtual unsigned int getPriority() const = 0;
  virtual bool getNatTraversalFlows() const = 0;
  virtual LS_NatTraversalMethod::Type getNatTraversalMethod() const = 0;
  virtual LS_KeepAliveMethod::Type getKeepAliveMethod() const = 0;
  // 55 when nothing is configured.
  virtual unsigned int getKeepAliveInterval() const = 0;

 protected:
  ~LS_IRegistrationOutbound() = default;
};
