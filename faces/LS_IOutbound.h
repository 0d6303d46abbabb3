// LS_IOutbound: the run-time side of an identity's outbound face, what the
// SIP stack needs to send a request on behalf of the identity.
//
// Every getter shows the effective setting: this face's own value, else the
// one inherited from the same face of the base identity, else the default
// (for the getters that return a value) or failure. The only value written
// here is the proxy learnt at run time; configuration goes through
// LS_IOutboundConfig.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "LS_ForcedDestination.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "LS_ProtocolConfig.h"
#include "XCode.h"

class LS_EXPORT LS_IOutbound : public LS_Interface<LS_IOutboundIdentifiers> {
 public:
  // The dynamic proxy takes the place of the first configured proxy: index 0
  // yields it when there is one, indices from 1 the configured entries at
  // the same index, and the count stays the configured count. With no
  // configured proxies the dynamic proxy is the only one.
  virtual unsigned int getNumberOfProxies() const = 0;
  virtual XCode getProxy(unsigned int index,
                         CHostPort& address,
                         CHostPort& tlsAddress,
                         bool& strictRoute) const = 0;
  virtual XCode getDynamicProxy(CHostPort& address, bool& strictRoute) const = 0;
  // The dynamic proxy's TLS address is its address.
  virtual void setDynamicProxy(CHostPort const& address, bool strictRoute) = 0;
  virtual void removeDynamicProxy() = 0;

  virtual XCode getPreferredProtocol(LS_ProtocolConfig::Type& protocol) const = 0;
  virtual XCode getTrafficClass(unsigned int& trafficClass) const = 0;
  // 32 when nothing is configured.
  virtual unsigned int getInviteTransactionTimeout() const = 0;
  // 32 when nothing is configured.
  virtual unsigned int getNonInviteTransactionTimeout() const = 0;
  virtual bool getPenaltyBox() const = 0;
  virtual bool getRequestUriDynamic() const = 0;
  virtual XCode getForcedDestination(LS_ForcedDestination& destination) const = 0;
  virtual bool getUseFlows() const = 0;

 protected:
  ~LS_IOutbound() = default;
};
