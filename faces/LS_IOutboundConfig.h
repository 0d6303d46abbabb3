// LS_IOutboundConfig: the configuration side of an identity's outbound face:
// its own list of outbound proxies and its transport, timeout and routing
// settings.
//
// Every getter here reads only what this face holds itself; what the face
// inherits from the same face of its base identity, and the values learnt at
// run time, are read through LS_IOutbound. Setters and removers cannot fail.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "LS_ForcedDestination.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "LS_ProtocolConfig.h"
#include "XCode.h"

class LS_EXPORT LS_IOutboundConfig : public LS_Interface<LS_IOutboundConfigIdentifiers> {
 public:
  // Proxies, indexed from 0. Without a list of its own the face reports
  // failure and a count of 0, even when it inherits proxies.
  virtual XCode getNumberOfConfigProxies(unsigned int& count) const = 0;
  virtual XCode getConfigProxy(unsigned int index,
                               CHostPort& address,
                               CHostPort& tlsAddress,
                               bool& strictRoute) const = 0;
  // Moves the entry at index by delta places, stopping at the first and the
  // last place. Fails when index is not below the length.
  virtual XCode moveConfigProxy(unsigned int index, int delta) = 0;
  virtual XCode modifyConfigProxy(unsigned int index,
                                  CHostPort const& address,
                                  CHostPort const& tlsAddress,
                                  bool strictRoute) = 0;
  // Inserts at min(index, length), starting an own (empty) list when the
  // face has none; the inherited list is not copied.
  virtual XCode insertConfigProxy(unsigned int index,
                                  CHostPort const& address,
                                  CHostPort const& tlsAddress,
                                  bool strictRoute) = 0;
  // An index that is not below the length is ignored.
  virtual void removeConfigProxy(unsigned int index) = 0;
  // Leaves the face with an own empty list, which hides the inherited one.
  virtual void clearConfigProxies() = 0;
  // Drops the face's own list, so the inherited one shows again.
  virtual void destroyConfigProxies() = 0;

  virtual void setConfigPreferredProtocol(LS_ProtocolConfig::Type protocol) = 0;
  virtual XCode getConfigPreferredProtocol(LS_ProtocolConfig::Type& protocol) const = 0;
  virtual void removeConfigPreferredProtocol() = 0;
  virtual void setConfigTrafficClass(unsigned int trafficClass) = 0;
  virtual XCode getConfigTrafficClass(unsigned int& trafficClass) const = 0;
  virtual void removeConfigTrafficClass() = 0;
  virtual void setConfigInviteTransactionTimeout(unsigned int timeout) = 0;
  virtual XCode getConfigInviteTransactionTimeout(unsigned int& timeout) const = 0;
  virtual void removeConfigInviteTransactionTimeout() = 0;
  virtual void setConfigNonInviteTransactionTimeout(unsigned int timeout) = 0;
  virtual XCode getConfigNonInviteTransactionTimeout(unsigned int& timeout) const = 0;
  virtual void removeConfigNonInviteTransactionTimeout() = 0;
  virtual void setConfigPenaltyBox(bool penaltyBox) = 0;
  virtual XCode getConfigPenaltyBox(bool& penaltyBox) const = 0;
  virtual void removeConfigPenaltyBox() = 0;
  virtual void setConfigRequestUriDynamicRegistrar(bool requestUri) = 0;
  virtual XCode getConfigRequestUriDynamicRegistrar(bool& requestUri) const = 0;
  virtual void removeConfigRequestUriDynamicRegistrar() = 0;
  virtual void setConfigForcedDestination(LS_ForcedDestination const& destination) = 0;
  virtual void removeConfigForcedDestination() = 0;
  virtual XCode getConfigForcedDestination(LS_ForcedDestination& destination) const = 0;
  virtual void setConfigUseFlows(bool useFlows) = 0;
  virtual XCode getConfigUseFlows(bool& useFlows) const = 0;
  virtual void removeConfigUseFlows() = 0;

 protected:
  ~LS_IOutboundConfig() = default;
};
