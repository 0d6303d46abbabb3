// LS_COutbound: the common base of an identity's outbound faces (outbound
// registration, message-waiting subscription, outbound call): the outbound
// proxies, the dynamic proxy learnt at run time, the transport preference,
// the traffic class, the transaction timeouts, the penalty-box, request-URI
// and use-flows switches and the forced destination.
//
// The face has no state of its own: every setting is a data value stored as
// a child of the face's container under a fixed key. The base of a face is
// the same face of the base identity, so a setting this face lacks is read
// through its shadow from there: config getters read "localOnly", effective
// getters "localOrBase". Proxy-list edits change the face's own list in
// place and announce it with changeElement("proxy").
//
// Ownership: counted; the identity holds the face as its child, and the face
// dies with its last reference, taking its values with it. Threading: no
// lock of its own; callers hold the face's lock for the whole call. create()
// stays abstract: each concrete face makes an empty instance of itself.
// The settings of the derived faces, and their dump headings, do not belong
// here.
#pragma once

#include "CInherit.h"
#include "IInfo.h"
#include "LS_CContainer.h"
#include "LS_CData.h"
#include "LS_IOutbound.h"
#include "LS_IOutboundConfig.h"
#include "LS_Proxy.h"
#include "Vector.h"

class LS_COutbound : public CInherit<LS_COutbound, LS_CContainer, LS_IOutboundConfig, LS_IOutbound, IInfo> {
 public:
  LS_COutbound();
  ~LS_COutbound() override;

  // LS_IOutboundConfig
  XCode getNumberOfConfigProxies(unsigned int& count) const override;
  XCode getConfigProxy(unsigned int index,
                       CHostPort& address,
                       CHostPort& tlsAddress,
                       bool& strictRoute) const override;
  XCode moveConfigProxy(unsigned int index, int delta) override;
  XCode modifyConfigProxy(unsigned int index,
                          CHostPort const& address,
                          CHostPort const& tlsAddress,
                          bool strictRoute) override;
  XCode insertConfigProxy(unsigned int index,
                          CHostPort const& address,
                          CHostPort const& tlsAddress,
                          bool strictRoute) override;
  void removeConfigProxy(unsigned int index) override;
  void clearConfigProxies() override;
  void destroyConfigProxies() override;
  void setConfigPreferredProtocol(LS_ProtocolConfig::Type protocol) override;
  XCode getConfigPreferredProtocol(LS_ProtocolConfig::Type& protocol) const override;
  void removeConfigPreferredProtocol() override;
  void setConfigTrafficClass(unsigned int trafficClass) override;
  XCode getConfigTrafficClass(unsigned int& trafficClass) const override;
  void removeConfigTrafficClass() override;
  void setConfigInviteTransactionTimeout(unsigned int timeout) override;
  XCode getConfigInviteTransactionTimeout(unsigned int& timeout) const override;
  void removeConfigInviteTransactionTimeout() override;
  void setConfigNonInviteTransactionTimeout(unsigned int timeout) override;
  XCode getConfigNonInviteTransactionTimeout(unsigned int& timeout) const override;
  void removeConfigNonInviteTransactionTimeout() override;
  void setConfigPenaltyBox(bool penaltyBox) override;
  XCode getConfigPenaltyBox(bool& penaltyBox) const override;
  void removeConfigPenaltyBox() override;
  void setConfigRequestUriDynamicRegistrar(bool requestUri) override;
  XCode getConfigRequestUriDynamicRegistrar(bool& requestUri) const override;
  void removeConfigRequestUriDynamicRegistrar() override;
  void setConfigForcedDestination(LS_ForcedDestination const& destination) override;
  void removeConfigForcedDestination() override;
  XCode getConfigForcedDestination(LS_ForcedDestination& destination) const override;
  void setConfigUseFlows(bool useFlows) override;
  XCode getConfigUseFlows(bool& useFlows) const override;
  void removeConfigUseFlows() override;

  // LS_IOutbound
  unsigned int getNumberOfProxies() const override;
  XCode getProxy(unsigned int index,
                 CHostPort& address,
                 CHostPort& tlsAddress,
                 bool& strictRoute) const override;
  XCode getDynamicProxy(CHostPort& address, bool& strictRoute) const override;
  void setDynamicProxy(CHostPort const& address, bool strictRoute) override;
  void removeDynamicProxy() override;
  XCode getPreferredProtocol(LS_ProtocolConfig::Type& protocol) const override;
  XCode getTrafficClass(unsigned int& trafficClass) const override;
  unsigned int getInviteTransactionTimeout() const override;
  unsigned int getNonInviteTransactionTimeout() const override;
  bool getPenaltyBox() const override;
  bool getRequestUriDynamic() const override;
  XCode getForcedDestination(LS_ForcedDestination& destination) const override;
  bool getUseFlows() const override;

  // IInfo: the effective settings (inherited ones and the dynamic proxy
  // included) as rows at level + 1, without a heading of their own; prefix
  // is ignored. The derived faces write their heading, then these rows.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 protected:
  // A server and its TLS counterpart, stored under two keys: fails unless
  // both reads succeed, and server may be filled already when only the TLS
  // read fails.
  XCode readServer(String const& key,
                   String const& tlsKey,
                   LS_Strategy::Type strategy,
                   CHostPort& server,
                   CHostPort& tlsServer) const {
    XCode const result = readValue(key, strategy, server);
    if (result.isFailure())
      return result;
    return readValue(tlsKey, strategy, tlsServer);
  }

 private:
  // The list that strategy sees; null when there is none.
  Vector<LS_Proxy> const* proxies(LS_Strategy::Type strategy) const;
  // This face's own list for editing in place; null when it has none.
  Vector<LS_Proxy>* ownProxies();
  // This face's own list, first started empty when it has none.
  Vector<LS_Proxy>* ownProxiesCreated();
  void proxiesChanged();
};
