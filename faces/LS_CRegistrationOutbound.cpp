#include "LS_CRegistrationOutbound.h"

#include "LS_AddressText.h"
#include "LS_ClassIdentifiers.h"
#include "LS_Debug.h"
#include "LS_ElementClassTable.h"
#include "LS_FaceInfo.h"

namespace {

LS_ElementClassRegistration const registration(CID_LS_RegistrationOutbound(),
                                               &LS_makeElement<LS_CRegistrationOutbound>);

// The face's element keys besides the outbound ones, made once.
struct RegistrationKeys {
  String const registrar{"registrar"};
  String const registrarTls{"registrar-tls"};
  String const dynamicRegistrar{"dynamic-registrar"};
  String const registrarAddr{"registrar-addr"};
  String const lifetime{"lifetime"};
  String const dnsSecurityCheck{"dns-security-check"};
  String const mode{"mode"};
  String const uriScheme{"uri-scheme"};
  String const onSystemError{"on-system-error"};
  String const onClientError{"on-client-error"};
  String const onServerError{"on-server-error"};
  String const natTraversalFlows{"nat-traversal-flows"};
  String const natTraversal{"nat-traversal"};
  String const keepAliveMethod{"keepalive-method"};
  String const keepAliveInterval{"keepalive-interval"};
  String const priority{"priority"};
};

RegistrationKeys const& keys() {
  static RegistrationKeys const registrationKeys;
  return registrationKeys;
}

constexpr unsigned int DEFAULT_LIFETIME = 3600;
constexpr unsigned int DEFAULT_RETRY_TIMEOUT = 10;
constexpr unsigned int DEFAULT_KEEP_ALIVE_INTERVAL = 55;
constexpr unsigned int DEFAULT_PRIORITY = 0xffffffffu;

}  // namespace

LS_CRegistrationOutbound::LS_CRegistrationOutbound() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::LS_CRegistrationOutbound()\n", logAddress());
}

LS_CRegistrationOutbound::~LS_CRegistrationOutbound() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::~LS_CRegistrationOutbound()\n", logAddress());
}

XCode LS_CRegistrationOutbound::create(RefPtr<LS_IElement>& element) {
  return LS_makeElement<LS_CRegistrationOutbound>(element);
}

XCode LS_CRegistrationOutbound::getConfigRegistrar(CHostPort& registrar, CHostPort& tlsRegistrar) const {
  return readServer(keys().registrar, keys().registrarTls, LS_Strategy::LOCAL_ONLY, registrar, tlsRegistrar);
}

void LS_CRegistrationOutbound::setConfigRegistrar(CHostPort const& registrar, CHostPort const& tlsRegistrar) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigRegistrar(%s)\n", logAddress(),
           hostPortStr(registrar).c_str());
  setValue(keys().registrar, registrar);
  setValue(keys().registrarTls, tlsRegistrar);
}

void LS_CRegistrationOutbound::removeConfigRegistrar() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigRegistrar()\n", logAddress());
  removeValue(keys().registrar);
  removeValue(keys().registrarTls);
}

XCode LS_CRegistrationOutbound::getConfigLifetime(unsigned int& lifetime) const {
  return readValue(keys().lifetime, LS_Strategy::LOCAL_ONLY, lifetime);
}

void LS_CRegistrationOutbound::setConfigLifetime(unsigned int lifetime) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigLifetime(%u)\n", logAddress(), lifetime);
  setValue(keys().lifetime, lifetime);
}

void LS_CRegistrationOutbound::removeConfigLifetime() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigLifetime()\n", logAddress());
  removeValue(keys().lifetime);
}

void LS_CRegistrationOutbound::setConfigDnsSecurityCheck(bool check) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigDnsSecurityCheck()\n", logAddress());
  setValue(keys().dnsSecurityCheck, check);
}

XCode LS_CRegistrationOutbound::getConfigDnsSecurityCheck(bool& check) const {
  return readValue(keys().dnsSecurityCheck, LS_Strategy::LOCAL_ONLY, check);
}

void LS_CRegistrationOutbound::removeConfigDnsSecurityCheck() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigDnsSecurityCheck()\n", logAddress());
  removeValue(keys().dnsSecurityCheck);
}

XCode LS_CRegistrationOutbound::getConfigRegistrationMode(LS_RegistrationMode::Type& mode) const {
  return readValue(keys().mode, LS_Strategy::LOCAL_ONLY, mode);
}

void LS_CRegistrationOutbound::setConfigRegistrationMode(LS_RegistrationMode::Type mode) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigRegistrationMode(%s)\n", logAddress(),
           LS_RegistrationMode::NAME(mode));
  setValue(keys().mode, mode);
}

void LS_CRegistrationOutbound::removeConfigRegistrationMode() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigRegistrationMode()\n", logAddress());
  removeValue(keys().mode);
}

XCode LS_CRegistrationOutbound::getConfigUriScheme(LS_UriScheme::Type& scheme) const {
  return readValue(keys().uriScheme, LS_Strategy::LOCAL_ONLY, scheme);
}

void LS_CRegistrationOutbound::setConfigUriScheme(LS_UriScheme::Type scheme) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigUriScheme(%s)\n", logAddress(),
           LS_UriScheme::NAME(scheme));
  setValue(keys().uriScheme, scheme);
}

void LS_CRegistrationOutbound::removeConfigUriScheme() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigUriScheme()\n", logAddress());
  removeValue(keys().uriScheme);
}

XCode LS_CRegistrationOutbound::getConfigRetryTimeoutOnSystemError(unsigned int& timeout) const {
  return readValue(keys().onSystemError, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_CRegistrationOutbound::setConfigRetryTimeoutOnSystemError(unsigned int timeout) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigRetryTimeoutOnSystemError(%u)\n", logAddress(), timeout);
  setValue(keys().onSystemError, timeout);
}

void LS_CRegistrationOutbound::removeConfigRetryTimeoutOnSystemError() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigRetryTimeoutOnSystemError()\n", logAddress());
  removeValue(keys().onSystemError);
}

XCode LS_CRegistrationOutbound::getConfigRetryTimeoutOnClientError(unsigned int& timeout) const {
  return readValue(keys().onClientError, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_CRegistrationOutbound::setConfigRetryTimeoutOnClientError(unsigned int timeout) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigRetryTimeoutOnClientError(%u)\n", logAddress(), timeout);
  setValue(keys().onClientError, timeout);
}

void LS_CRegistrationOutbound::removeConfigRetryTimeoutOnClientError() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigRetryTimeoutOnClientError()\n", logAddress());
  removeValue(keys().onClientError);
}

XCode LS_CRegistrationOutbound::getConfigRetryTimeoutOnServerError(unsigned int& timeout) const {
  return readValue(keys().onServerError, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_CRegistrationOutbound::setConfigRetryTimeoutOnServerError(unsigned int timeout) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigRetryTimeoutOnServerError(%u)\n", logAddress(), timeout);
  setValue(keys().onServerError, timeout);
}

void LS_CRegistrationOutbound::removeConfigRetryTimeoutOnServerError() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigRetryTimeoutOnServerError()\n", logAddress());
  removeValue(keys().onServerError);
}

XCode LS_CRegistrationOutbound::getConfigNatTraversalFlows(bool& flows) const {
  return readValue(keys().natTraversalFlows, LS_Strategy::LOCAL_ONLY, flows);
}

void LS_CRegistrationOutbound::setConfigNatTraversalFlows(bool flows) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigNatTraversalFlows()\n", logAddress());
  setValue(keys().natTraversalFlows, flows);
}

void LS_CRegistrationOutbound::removeConfigNatTraversalFlows() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigNatTraversalFlows()\n", logAddress());
  removeValue(keys().natTraversalFlows);
}

XCode LS_CRegistrationOutbound::getConfigNatTraversalMethod(LS_NatTraversalMethod::Type& method) const {
  return readValue(keys().natTraversal, LS_Strategy::LOCAL_ONLY, method);
}

void LS_CRegistrationOutbound::setConfigNatTraversalMethod(LS_NatTraversalMethod::Type method) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigNatTraversalMethod(%s)\n", logAddress(),
           LS_NatTraversalMethod::NAME(method));
  setValue(keys().natTraversal, method);
}

void LS_CRegistrationOutbound::removeConfigNatTraversalMethod() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::ConfigNatTraversalMethod()\n", logAddress());
  removeValue(keys().natTraversal);
}

XCode LS_CRegistrationOutbound::getConfigKeepAliveMethod(LS_KeepAliveMethod::Type& method) const {
  return readValue(keys().keepAliveMethod, LS_Strategy::LOCAL_ONLY, method);
}

void LS_CRegistrationOutbound::setConfigKeepAliveMethod(LS_KeepAliveMethod::Type method) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigKeepAliveMethod(%s)\n", logAddress(),
           LS_KeepAliveMethod::NAME(method));
  setValue(keys().keepAliveMethod, method);
}

void LS_CRegistrationOutbound::removeConfigKeepAliveMethod() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::ConfigKeepAliveMethod()\n", logAddress());
  removeValue(keys().keepAliveMethod);
}

XCode LS_CRegistrationOutbound::getConfigKeepAliveInterval(unsigned int& interval) const {
  return readValue(keys().keepAliveInterval, LS_Strategy::LOCAL_ONLY, interval);
}

void LS_CRegistrationOutbound::setConfigKeepAliveInterval(unsigned int interval) {
  // Printed signed: intervals above INT_MAX show as negative numbers.
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigKeepAliveInterval(%d)\n", logAddress(),
           static_cast<int>(interval));
  setValue(keys().keepAliveInterval, interval);
}

void LS_CRegistrationOutbound::removeConfigKeepAliveInterval() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::ConfigKeepAliveInterval()\n", logAddress());
  removeValue(keys().keepAliveInterval);
}

XCode LS_CRegistrationOutbound::getConfigPriority(unsigned int& priority) const {
  return readValue(keys().priority, LS_Strategy::LOCAL_ONLY, priority);
}

void LS_CRegistrationOutbound::setConfigPriority(unsigned int priority) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setConfigPriority(%u)\n", logAddress(), priority);
  setValue(keys().priority, priority);
}

void LS_CRegistrationOutbound::removeConfigPriority() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeConfigPriority()\n", logAddress());
  removeValue(keys().priority);
}

XCode LS_CRegistrationOutbound::getRegistrar(CHostPort& registrar, CHostPort& tlsRegistrar) const {
  return readServer(keys().registrar, keys().registrarTls, LS_Strategy::LOCAL_OR_BASE, registrar,
                    tlsRegistrar);
}

XCode LS_CRegistrationOutbound::getDynamicRegistrar(CHostPort& registrar) const {
  return readValue(keys().dynamicRegistrar, LS_Strategy::LOCAL_OR_BASE, registrar);
}

void LS_CRegistrationOutbound::setDynamicRegistrar(CHostPort const& registrar) {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::setDynamicRegistrar(%s)\n", logAddress(),
           hostPortStr(registrar).c_str());
  setValue(keys().dynamicRegistrar, registrar);
}

void LS_CRegistrationOutbound::removeDynamicRegistrar() {
  LS_DEBUG("LS_CRegistrationOutbound(%p)::removeDynamicRegistrar()\n", logAddress());
  removeValue(keys().dynamicRegistrar);
}

void LS_CRegistrationOutbound::setRegistrarAddr(CHostPort const& address) {
  LS_DEBUG("[LS REG OUT] Set registrar address: %s", hostPortStr(address).c_str());
  setValue(keys().registrarAddr, address);
}

XCode LS_CRegistrationOutbound::getRegistrarAddr(CHostPort& address) const {
  return readValue(keys().registrarAddr, LS_Strategy::LOCAL_OR_BASE, address);
}

unsigned int LS_CRegistrationOutbound::getLifetime() const {
  return readValueOr(keys().lifetime, DEFAULT_LIFETIME);
}

bool LS_CRegistrationOutbound::getDnsSecurityCheck() const {
  return readValueOr(keys().dnsSecurityCheck, false);
}

LS_RegistrationMode::Type LS_CRegistrationOutbound::getRegistrationMode() const {
  return readValueOr(keys().mode, LS_RegistrationMode::NONE);
}

LS_UriScheme::Type LS_CRegistrationOutbound::getUriScheme() const {
  return readValueOr(keys().uriScheme, LS_UriScheme::SIP);
}

unsigned int LS_CRegistrationOutbound::getRetryTimeoutOnSystemError() const {
  return readValueOr(keys().onSystemError, DEFAULT_RETRY_TIMEOUT);
}

unsigned int LS_CRegistrationOutbound::getRetryTimeoutOnClientError() const {
  return readValueOr(keys().onClientError, DEFAULT_RETRY_TIMEOUT);
}

unsigned int LS_CRegistrationOutbound::getRetryTimeoutOnServerError() const {
  return readValueOr(keys().onServerError, DEFAULT_RETRY_TIMEOUT);
}

unsigned int LS_CRegistrationOutbound::getPriority() const {
  return readValueOr(keys().priority, DEFAULT_PRIORITY);
}

bool LS_CRegistrationOutbound::getNatTraversalFlows() const {
  return readValueOr(keys().natTraversalFlows, false);
}

LS_NatTraversalMethod::Type LS_CRegistrationOutbound::getNatTraversalMethod() const {
  return readValueOr(keys().natTraversal, LS_NatTraversalMethod::NONE);
}

LS_KeepAliveMethod::Type LS_CRegistrationOutbound::getKeepAliveMethod() const {
  return readValueOr(keys().keepAliveMethod, LS_KeepAliveMethod::NONE);
}

unsigned int LS_CRegistrationOutbound::getKeepAliveInterval() const {
  return readValueOr(keys().keepAliveInterval, DEFAULT_KEEP_ALIVE_INTERVAL);
}

InfoContainer& LS_CRegistrationOutbound::getInfo(InfoContainer& info,
                                                 unsigned int maxLevel,
                                                 unsigned int level,
                                                 unsigned int maxDetail,
                                                 unsigned int detail,
                                                 String const& prefix) const {
  LS_FaceInfo const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Outbound Registration"), String::s_empty);
  LS_COutbound::getInfo(info, maxLevel, level, maxDetail, detail, String::s_empty);

  unsigned int const row = level + 1;
  if (!rows.accepts(row))
    return info;
  CHostPort registrar;
  CHostPort tlsRegistrar;
  if (getRegistrar(registrar, tlsRegistrar).isSuccess())
    rows.addServer(row, "Registrar", registrar, "Registrar TLS", tlsRegistrar);
  rows.add(row, "Registration Lifetime", String().format("%u", getLifetime()));
  rows.add(row, "Registration URI scheme", LS_UriScheme::NAME(getUriScheme()));
  rows.add(row, "Registration Mode", LS_RegistrationMode::NAME(getRegistrationMode()));
  CHostPort address;
  if (getRegistrarAddr(address).isSuccess())
    rows.add(row, "Registrar Address", LS_faceHostPortText(address));
  return info;
}
