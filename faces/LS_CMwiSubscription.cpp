#include "LS_CMwiSubscription.h"

#include "LS_AddressText.h"
#include "LS_ClassIdentifiers.h"
#include "LS_Debug.h"
#include "LS_ElementClassTable.h"
#include "LS_FaceInfo.h"

namespace {

LS_ElementClassRegistration const registration(CID_LS_MessageSubscription(),
                                               &LS_makeElement<LS_CMwiSubscription>);

// The face's element keys besides the outbound ones, made once. "lifetime",
// "mode" and the retry keys are spelled as on the outbound registration
// face; each face is its own container, so they never meet.
struct MwiKeys {
  String const notifier{"mwi-notifier"};
  String const notifierTls{"mwi-notifier-tls"};
  String const dynamicNotifier{"dynamic-mwi-notifier"};
  String const lifetime{"lifetime"};
  String const mode{"mode"};
  String const onSystemError{"on-system-error"};
  String const onClientError{"on-client-error"};
  String const onServerError{"on-server-error"};
};

MwiKeys const& keys() {
  static MwiKeys const mwiKeys;
  return mwiKeys;
}

constexpr unsigned int DEFAULT_LIFETIME = 3600;
constexpr unsigned int DEFAULT_RETRY_TIMEOUT = 10;

}  // namespace

LS_CMwiSubscription::LS_CMwiSubscription() {
  LS_DEBUG("LS_CMwiSubscription(%p)::LS_CMwiSubscription()\n", logAddress());
}

LS_CMwiSubscription::~LS_CMwiSubscription() {
  LS_DEBUG("LS_CMwiSubscription(%p)::~LS_CMwiSubscription()\n", logAddress());
}

XCode LS_CMwiSubscription::create(RefPtr<LS_IElement>& element) {
  return LS_makeElement<LS_CMwiSubscription>(element);
}

XCode LS_CMwiSubscription::getConfigMwiNotifier(CHostPort& notifier, CHostPort& tlsNotifier) const {
  return readServer(keys().notifier, keys().notifierTls, LS_Strategy::LOCAL_ONLY, notifier, tlsNotifier);
}

void LS_CMwiSubscription::setConfigMwiNotifier(CHostPort const& notifier, CHostPort const& tlsNotifier) {
  LS_DEBUG("LS_CMwiSubscription(%p)::setConfigMwiNotifier(%s)\n", logAddress(),
           hostPortStr(notifier).c_str());
  setValue(keys().notifier, notifier);
  setValue(keys().notifierTls, tlsNotifier);
}

void LS_CMwiSubscription::removeConfigMwiNotifier() {
  LS_DEBUG("LS_CMwiSubscription(%p)::removeConfigMwiNotifier()\n", logAddress());
  removeValue(keys().notifier);
  removeValue(keys().notifierTls);
}

XCode LS_CMwiSubscription::getConfigLifetime(unsigned int& lifetime) const {
  return readValue(keys().lifetime, LS_Strategy::LOCAL_ONLY, lifetime);
}

void LS_CMwiSubscription::setConfigLifetime(unsigned int lifetime) {
  LS_DEBUG("LS_CMwiSubscription(%p)::setConfigLifetime(%u)\n", logAddress(), lifetime);
  setValue(keys().lifetime, lifetime);
}

void LS_CMwiSubscription::removeConfigLifetime() {
  LS_DEBUG("LS_CMwiSubscription(%p)::removeConfigLifetime()\n", logAddress());
  removeValue(keys().lifetime);
}

XCode LS_CMwiSubscription::getConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::Type& mode) const {
  return readValue(keys().mode, LS_Strategy::LOCAL_ONLY, mode);
}

void LS_CMwiSubscription::setConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::Type mode) {
  LS_DEBUG("LS_CMwiSubscription(%p)::setConfigMwiSubscriptionMode(%s)\n", logAddress(),
           LS_MwiSubscriptionMode::NAME(mode));
  setValue(keys().mode, mode);
}

void LS_CMwiSubscription::removeConfigMwiSubscriptionMode() {
  removeValue(keys().mode);
}

XCode LS_CMwiSubscription::getConfigRetryTimeoutOnSystemError(unsigned int& timeout) const {
  return readValue(keys().onSystemError, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_CMwiSubscription::setConfigRetryTimeoutOnSystemError(unsigned int timeout) {
  LS_DEBUG("LS_CMwiSubscription(%p)::setConfigRetryTimeoutOnSystemError(%u)\n", logAddress(), timeout);
  setValue(keys().onSystemError, timeout);
}

void LS_CMwiSubscription::removeConfigRetryTimeoutOnSystemError() {
  LS_DEBUG("LS_CMwiSubscription(%p)::removeConfigRetryTimeoutOnSystemError()\n", logAddress());
  removeValue(keys().onSystemError);
}

XCode LS_CMwiSubscription::getConfigRetryTimeoutOnClientError(unsigned int& timeout) const {
  return readValue(keys().onClientError, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_CMwiSubscription::setConfigRetryTimeoutOnClientError(unsigned int timeout) {
  LS_DEBUG("LS_CMwiSubscription(%p)::setConfigRetryTimeoutOnClientError(%u)\n", logAddress(), timeout);
  setValue(keys().onClientError, timeout);
}

void LS_CMwiSubscription::removeConfigRetryTimeoutOnClientError() {
  LS_DEBUG("LS_CMwiSubscription(%p)::removeConfigRetryTimeoutOnClientError()\n", logAddress());
  removeValue(keys().onClientError);
}

XCode LS_CMwiSubscription::getConfigRetryTimeoutOnServerError(unsigned int& timeout) const {
  return readValue(keys().onServerError, LS_Strategy::LOCAL_ONLY, timeout);
}

void LS_CMwiSubscription::setConfigRetryTimeoutOnServerError(unsigned int timeout) {
  LS_DEBUG("LS_CMwiSubscription(%p)::setConfigRetryTimeoutOnServerError(%u)\n", logAddress(), timeout);
  setValue(keys().onServerError, timeout);
}

void LS_CMwiSubscription::removeConfigRetryTimeoutOnServerError() {
  LS_DEBUG("LS_CMwiSubscription(%p)::removeConfigRetryTimeoutOnServerError()\n", logAddress());
  removeValue(keys().onServerError);
}

XCode LS_CMwiSubscription::getMwiNotifier(CHostPort& notifier, CHostPort& tlsNotifier) const {
  return readServer(keys().notifier, keys().notifierTls, LS_Strategy::LOCAL_OR_BASE, notifier, tlsNotifier);
}

XCode LS_CMwiSubscription::getDynamicMwiNotifier(CHostPort& notifier) const {
  return readValue(keys().dynamicNotifier, LS_Strategy::LOCAL_OR_BASE, notifier);
}

void LS_CMwiSubscription::setDynamicMwiNotifier(CHostPort const& notifier) {
  LS_DEBUG("LS_CMwiSubscription(%p)::setDynamicMwiNotifier(%s)\n", logAddress(),
           hostPortStr(notifier).c_str());
  setValue(keys().dynamicNotifier, notifier);
}

void LS_CMwiSubscription::removeDynamicMwiNotifier() {
  LS_DEBUG("LS_CMwiSubscription(%p)::removeDynamicMwiNotifier()\n", logAddress());
  removeValue(keys().dynamicNotifier);
}

unsigned int LS_CMwiSubscription::getLifetime() const {
  return readValueOr(keys().lifetime, DEFAULT_LIFETIME);
}

LS_MwiSubscriptionMode::Type LS_CMwiSubscription::getMwiSubscriptionMode() const {
  return readValueOr(keys().mode, LS_MwiSubscriptionMode::NONE);
}

unsigned int LS_CMwiSubscription::getRetryTimeoutOnSystemError() const {
  return readValueOr(keys().onSystemError, DEFAULT_RETRY_TIMEOUT);
}

unsigned int LS_CMwiSubscription::getRetryTimeoutOnClientError() const {
  return readValueOr(keys().onClientError, DEFAULT_RETRY_TIMEOUT);
}

unsigned int LS_CMwiSubscription::getRetryTimeoutOnServerError() const {
  return readValueOr(keys().onServerError, DEFAULT_RETRY_TIMEOUT);
}

InfoContainer& LS_CMwiSubscription::getInfo(InfoContainer& info,
                                            unsigned int maxLevel,
                                            unsigned int level,
                                            unsigned int maxDetail,
                                            unsigned int detail,
                                            String const& prefix) const {
  LS_FaceInfo const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Mwi Subscription"), String::s_empty);
  LS_COutbound::getInfo(info, maxLevel, level, maxDetail, detail, String::s_empty);

  unsigned int const row = level + 1;
  if (!rows.accepts(row))
    return info;
  CHostPort notifier;
  CHostPort tlsNotifier;
  if (getMwiNotifier(notifier, tlsNotifier).isSuccess())
    rows.addServer(row, "Message-Server", notifier, "Message-Server TLS", tlsNotifier);
  rows.add(row, "Subscription Lifetime", String().format("%u", getLifetime()));
  rows.add(row, "Subscription Mode", LS_MwiSubscriptionMode::NAME(getMwiSubscriptionMode()));
  return info;
}
