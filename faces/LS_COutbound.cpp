#include "LS_COutbound.h"

#include "LS_AddressText.h"
#include "LS_Debug.h"
#include "LS_FaceInfo.h"
#include "LS_ListPosition.h"
#include "PlatformTexts.h"

namespace {

// The face's element keys, made once: every read looks one up.
struct OutboundKeys {
  String const proxy{"proxy"};
  String const dynamicProxy{"dynamic-proxy"};
  String const preferredProtocol{"preferred-protocol"};
  String const trafficClass{"traffic-class"};
  String const inviteTransactionTimeout{"invite-transaction-timeout"};
  String const nonInviteTransactionTimeout{"non-invite-transaction-timeout"};
  String const penaltyBox{"penalty-box"};
  String const requestUri{"request-uri"};
  String const forcedDestination{"forced-destination"};
  String const useFlows{"use-flows"};
};

OutboundKeys const& keys() {
  static OutboundKeys const outboundKeys;
  return outboundKeys;
}

constexpr unsigned int DEFAULT_TRANSACTION_TIMEOUT = 32;

void copyOut(LS_Proxy const& proxy, CHostPort& address, CHostPort& tlsAddress, bool& strictRoute) {
  address = proxy.address;
  tlsAddress = proxy.tlsAddress;
  strictRoute = proxy.strictRoute;
}

void addForcedDestinationRows(LS_COutbound const& face, LS_FaceInfo const& rows, unsigned int row) {
  LS_ForcedDestination destination;
  if (face.getForcedDestination(destination).isFailure())
    return;
  if (destination.type == LS_ForcedDestination::REGISTRAR_ADDRESS) {
    rows.add(row, "Forced Destination", "Registrar-Address");
    return;
  }
  if (destination.type != LS_ForcedDestination::MANUAL)
    return;
  rows.addServer(row, "Forced Destination for UDP/TCP", destination.udpTcpAddress,
                 "Forced Destination for TLS", destination.tlsDestination);
}

// "address tls-port:N (strict route)"; the middle field is empty when the TLS
// port is not to be shown, which leaves two blanks in a row.
String proxyText(CHostPort const& address, CHostPort const& tlsAddress, bool strictRoute) {
  String tlsPort;
  if (tlsAddress.GetPort() != CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT)
    tlsPort.format("tls-port:%u", static_cast<unsigned int>(tlsAddress.GetPort()));
  return String().format("%s %s %s", LS_faceHostPortText(address).c_str(), tlsPort.c_str(),
                         strictRoute ? "(strict route)" : "(loose route)");
}

}  // namespace

LS_COutbound::LS_COutbound() {
  LS_DEBUG("LS_COutbound(%p)::LS_COutbound()\n", logAddress());
}

LS_COutbound::~LS_COutbound() {
  LS_DEBUG("LS_COutbound(%p)::~LS_COutbound()\n", logAddress());
}

Vector<LS_Proxy> const* LS_COutbound::proxies(LS_Strategy::Type strategy) const {
  return valueIn<Vector<LS_Proxy>>(keys().proxy, strategy);
}

Vector<LS_Proxy>* LS_COutbound::ownProxies() {
  return ownValue<Vector<LS_Proxy>>(keys().proxy);
}

Vector<LS_Proxy>* LS_COutbound::ownProxiesCreated() {
  return ownValueCreated<Vector<LS_Proxy>>(keys().proxy);
}

void LS_COutbound::proxiesChanged() {
  changeElement(keys().proxy);
}

XCode LS_COutbound::getNumberOfConfigProxies(unsigned int& count) const {
  count = 0;
  Vector<LS_Proxy> const* const list = proxies(LS_Strategy::LOCAL_ONLY);
  if (!list)
    return XCode::failure();
  count = static_cast<unsigned int>(list->size());
  return XCode::success();
}

XCode LS_COutbound::getConfigProxy(unsigned int index,
                                   CHostPort& address,
                                   CHostPort& tlsAddress,
                                   bool& strictRoute) const {
  Vector<LS_Proxy> const* const list = proxies(LS_Strategy::LOCAL_ONLY);
  if (!list || index >= list->size())
    return XCode::failure();
  copyOut((*list)[index], address, tlsAddress, strictRoute);
  return XCode::success();
}

XCode LS_COutbound::moveConfigProxy(unsigned int index, int delta) {
  LS_DEBUG("LS_COutbound(%p)::moveConfigProxy(%u, %u)\n", logAddress(), index,
           static_cast<unsigned int>(delta));
  Vector<LS_Proxy>* const list = ownProxies();
  if (!list || !LS_moveClamped(*list, index, delta))
    return XCode::failure();
  proxiesChanged();
  return XCode::success();
}

XCode LS_COutbound::modifyConfigProxy(unsigned int index,
                                      CHostPort const& address,
                                      CHostPort const& tlsAddress,
                                      bool strictRoute) {
  LS_DEBUG("LS_COutbound(%p)::modifyConfigProxy(%u, %s, %s)\n", logAddress(), index,
           LS_hostPortToString(address).c_str(), YES_NO(strictRoute));
  Vector<LS_Proxy>* const list = ownProxies();
  if (!list || index >= list->size())
    return XCode::failure();
  (*list)[index] = LS_Proxy(address, tlsAddress, strictRoute);
  proxiesChanged();
  return XCode::success();
}

XCode LS_COutbound::insertConfigProxy(unsigned int index,
                                      CHostPort const& address,
                                      CHostPort const& tlsAddress,
                                      bool strictRoute) {
  LS_DEBUG("LS_COutbound(%p)::insertConfigProxy(%u, %s, %s)\n", logAddress(), index,
           LS_hostPortToString(address).c_str(), YES_NO(strictRoute));
  Vector<LS_Proxy>* const list = ownProxiesCreated();
  if (!list)
    return XCode::failure();
  LS_insertClamped(*list, index, LS_Proxy(address, tlsAddress, strictRoute));
  proxiesChanged();
  return XCode::success();
}

void LS_COutbound::removeConfigProxy(unsigned int index) {
  LS_DEBUG("LS_COutbound(%p)::removeConfigProxy(%u)\n", logAddress(), index);
  Vector<LS_Proxy>* const list = ownProxies();
  if (!list || index >= list->size())
    return;
  list->remove(index);
  proxiesChanged();
}

void LS_COutbound::clearConfigProxies() {
  Vector<LS_Proxy>* const list = ownProxiesCreated();
  if (!list)
    return;
  list->clear();
  proxiesChanged();
}

void LS_COutbound::destroyConfigProxies() {
  removeValue(keys().proxy);
}

void LS_COutbound::setConfigPreferredProtocol(LS_ProtocolConfig::Type protocol) {
  setValue(keys().preferredProtocol, protocol);
}

XCode LS_COutbound::getConfigPreferredProtocol(LS_ProtocolConfig::Type& protocol) const {
  return readValue(keys().preferredProtocol, LS_Strategy::LOCAL_ONLY, protocol);
}

void LS_COutbound::removeConfigPreferredProtocol() {
  removeValue(keys().preferredProtocol);
}

void LS_COutbound::setConfigTrafficClass(unsigned int trafficClass) {
  setValue(keys().trafficClass, trafficClass);
}

XCode LS_COutbound::getConfigTrafficClass(unsigned int& trafficClass) const {
  return readValue(keys().trafficClass, LS_Strategy::LOCAL_ONLY, trafficClass);
}

void LS_COutbound::removeConfigTrafficClass() {
  removeValue(keys().trafficClass);
}

void LS_COutbound::setConfigInviteTransactionTimeout(unsigned int timeout) {
  setValue(keys().inviteTransactionTimeout, timeout);
}

XCode LS_COutbound::getConfigInviteTransactionTimeout(unsigned int& timeout) const {
  return readValue(keys().inviteTransactionTimeout, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_COutbound::removeConfigInviteTransactionTimeout() {
  removeValue(keys().inviteTransactionTimeout);
}

void LS_COutbound::setConfigNonInviteTransactionTimeout(unsigned int timeout) {
  setValue(keys().nonInviteTransactionTimeout, timeout);
}

XCode LS_COutbound::getConfigNonInviteTransactionTimeout(unsigned int& timeout) const {
  return readValue(keys().nonInviteTransactionTimeout, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_COutbound::removeConfigNonInviteTransactionTimeout() {
  removeValue(keys().nonInviteTransactionTimeout);
}

void LS_COutbound::setConfigPenaltyBox(bool penaltyBox) {
  setValue(keys().penaltyBox, penaltyBox);
}

XCode LS_COutbound::getConfigPenaltyBox(bool& penaltyBox) const {
  return readValue(keys().penaltyBox, LS_Strategy::LOCAL_ONLY, penaltyBox);
}

void LS_COutbound::removeConfigPenaltyBox() {
  removeValue(keys().penaltyBox);
}

void LS_COutbound::setConfigRequestUriDynamicRegistrar(bool requestUri) {
  setValue(keys().requestUri, requestUri);
}

XCode LS_COutbound::getConfigRequestUriDynamicRegistrar(bool& requestUri) const {
  return readValue(keys().requestUri, LS_Strategy::LOCAL_ONLY, requestUri);
}

void LS_COutbound::removeConfigRequestUriDynamicRegistrar() {
  removeValue(keys().requestUri);
}

void LS_COutbound::setConfigForcedDestination(LS_ForcedDestination const& destination) {
  setValue(keys().forcedDestination, destination);
}

void LS_COutbound::removeConfigForcedDestination() {
  removeValue(keys().forcedDestination);
}

XCode LS_COutbound::getConfigForcedDestination(LS_ForcedDestination& destination) const {
  return readValue(keys().forcedDestination, LS_Strategy::LOCAL_ONLY, destination);
}

void LS_COutbound::setConfigUseFlows(bool useFlows) {
  setValue(keys().useFlows, useFlows);
}

XCode LS_COutbound::getConfigUseFlows(bool& useFlows) const {
  return readValue(keys().useFlows, LS_Strategy::LOCAL_ONLY, useFlows);
}

void LS_COutbound::removeConfigUseFlows() {
  removeValue(keys().useFlows);
}

unsigned int LS_COutbound::getNumberOfProxies() const {
  Vector<LS_Proxy> const* const list = proxies(LS_Strategy::LOCAL_OR_BASE);
  if (list && !list->isEmpty())
    return static_cast<unsigned int>(list->size());
  return containsElement(keys().dynamicProxy, LS_Strategy::LOCAL_OR_BASE) ? 1 : 0;
}

XCode LS_COutbound::getProxy(unsigned int index,
                             CHostPort& address,
                             CHostPort& tlsAddress,
                             bool& strictRoute) const {
  if (index == 0 && getDynamicProxy(address, strictRoute).isSuccess()) {
    tlsAddress = address;
    return XCode::success();
  }
  Vector<LS_Proxy> const* const list = proxies(LS_Strategy::LOCAL_OR_BASE);
  if (!list || index >= list->size())
    return XCode::failure();
  copyOut((*list)[index], address, tlsAddress, strictRoute);
  return XCode::success();
}

XCode LS_COutbound::getDynamicProxy(CHostPort& address, bool& strictRoute) const {
  LS_Proxy proxy;
  XCode const result = readValue(keys().dynamicProxy, LS_Strategy::LOCAL_OR_BASE, proxy);
  if (result.isFailure())
    return result;
  address = proxy.address;
  strictRoute = proxy.strictRoute;
  return result;
}

void LS_COutbound::setDynamicProxy(CHostPort const& address, bool strictRoute) {
  setValue(keys().dynamicProxy, LS_Proxy(address, address, strictRoute));
}

void LS_COutbound::removeDynamicProxy() {
  removeValue(keys().dynamicProxy);
}

XCode LS_COutbound::getPreferredProtocol(LS_ProtocolConfig::Type& protocol) const {
  return readValue(keys().preferredProtocol, LS_Strategy::LOCAL_OR_BASE, protocol);
}

XCode LS_COutbound::getTrafficClass(unsigned int& trafficClass) const {
  return readValue(keys().trafficClass, LS_Strategy::LOCAL_OR_BASE, trafficClass);
}

unsigned int LS_COutbound::getInviteTransactionTimeout() const {
  return readValueOr(keys().inviteTransactionTimeout, DEFAULT_TRANSACTION_TIMEOUT);
}

unsigned int LS_COutbound::getNonInviteTransactionTimeout() const {
  return readValueOr(keys().nonInviteTransactionTimeout, DEFAULT_TRANSACTION_TIMEOUT);
}

bool LS_COutbound::getPenaltyBox() const {
  return readValueOr(keys().penaltyBox, false);
}

bool LS_COutbound::getRequestUriDynamic() const {
  return readValueOr(keys().requestUri, false);
}

XCode LS_COutbound::getForcedDestination(LS_ForcedDestination& destination) const {
  return readValue(keys().forcedDestination, LS_Strategy::LOCAL_OR_BASE, destination);
}

bool LS_COutbound::getUseFlows() const {
  return readValueOr(keys().useFlows, false);
}

InfoContainer& LS_COutbound::getInfo(InfoContainer& info,
                                     unsigned int maxLevel,
                                     unsigned int level,
                                     unsigned int maxDetail,
                                     unsigned int detail,
                                     String const&) const {
  LS_FaceInfo const rows(info, maxLevel, maxDetail, detail);
  unsigned int const row = level + 1;
  if (!rows.accepts(row))
    return info;

  addForcedDestinationRows(*this, rows, row);
  LS_ProtocolConfig::Type protocol = LS_ProtocolConfig::PREFERRED_NONE;
  if (getPreferredProtocol(protocol).isSuccess())
    rows.add(row, "Transport Protocol", LS_ProtocolConfig::NAME(protocol));
  if (unsigned int const timeout = getInviteTransactionTimeout())
    rows.add(row, "Invite transaction timeout", String().format("%u", timeout));
  if (unsigned int const timeout = getNonInviteTransactionTimeout())
    rows.add(row, "Non-Invite transaction timeout", String().format("%u", timeout));

  unsigned int const count = getNumberOfProxies();
  for (unsigned int index = 0; index < count; ++index) {
    CHostPort address;
    CHostPort tlsAddress;
    bool strictRoute = false;
    if (getProxy(index, address, tlsAddress, strictRoute).isSuccess())
      rows.add(row, "Proxy", proxyText(address, tlsAddress, strictRoute));
  }
  return info;
}
