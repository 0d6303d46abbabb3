#include "trunks/TrunkRegistrations.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <iostream>

#include "LS_CredentialLookup.h"
#include "LS_ILocationService.h"
#include "LS_IOutbound.h"
#include "trunks/InstanceId.h"

namespace {

// Why a request of the trunk found no registrar: libre reports a name
// without any address as "destination address required".
std::string failureCause(int error, std::string const& host) {
  sa numeric;
  bool const named = !host.empty() && host[0] != '[' && sa_set_str(&numeric, host.c_str(), 0) != 0;
  if (named && error == EDESTADDRREQ)
    return host + " does not resolve";
  if (named)
    return "resolving " + host + ": " + std::strerror(error);
  return std::strerror(error);
}

std::string hostPortText(CHostPort const& hostPort) {
  std::string text = hostPort.GetHost().c_str();
  if (hostPort.GetPort() != 0)
    text += ":" + std::to_string(hostPort.GetPort());
  return text;
}

// Appends the address of hostPort when its host is numeric, the port
// aside.
void addAddress(std::vector<sa>& addresses, CHostPort const& hostPort) {
  std::string host = hostPort.GetHost().c_str();
  if (host.size() > 2 && host.front() == '[' && host.back() == ']')
    host = host.substr(1, host.size() - 2);
  sa address;
  if (!host.empty() && sa_set_str(&address, host.c_str(), 0) == 0)
    addresses.push_back(address);
}

bool sameHost(std::vector<sa> const& addresses, sa const& source) {
  return std::any_of(addresses.begin(), addresses.end(),
                     [&](sa const& address) { return sa_cmp(&address, &source, SA_ADDR); });
}

}  // namespace

RefPtr<LS_IIdentity> TrunkRegistrations::trunkAt(sa const& source) const {
  for (std::unique_ptr<Trunk> const& trunk : m_trunks)
    if (sameHost(trunk->carrierAddresses, source))
      return trunk->identity;
  return nullptr;
}

std::string TrunkRegistrations::registrarOf(LS_IIdentity const* identity) const {
  for (std::unique_ptr<Trunk> const& trunk : m_trunks)
    if (trunk->identity.get() == identity)
      return trunk->registrarUri;
  return std::string();
}

void TrunkRegistrations::report(std::string const& line) {
  m_session.flushDebugLines();
  std::cerr << "location-gateway: " << line << std::endl;
}

void TrunkRegistrations::reportFailure(Trunk& trunk, std::string const& failure, unsigned int seconds) {
  if (failure == trunk.lastFailure)
    return;
  trunk.lastFailure = failure;
  report(failure + ", retrying in " + std::to_string(seconds) + " s");
}

TrunkRegistrations::~TrunkRegistrations() {
  stop();
}

void TrunkRegistrations::start() {
  m_trunks = findTrunks();
  for (std::unique_ptr<Trunk> const& trunk : m_trunks)
    registerTrunk(*trunk);
}

void TrunkRegistrations::follow(std::vector<RefPtr<LS_IIdentity>> const& touched,
                                std::vector<LS_IIdentity const*> const& removed) {
  for (LS_IIdentity const* identity : removed)
    replace(identity, nullptr);
  for (RefPtr<LS_IIdentity> const& identity : touched) {
    if (std::find(removed.begin(), removed.end(), identity.get()) != removed.end())
      continue;
    std::unique_ptr<Trunk> candidate =
        m_clock.measure([&] { return findTrunk(identity.get(), ScriptSession::pathOf(identity.get())); });
    replace(identity.get(), std::move(candidate));
  }
}

void TrunkRegistrations::replace(LS_IIdentity const* identity, std::unique_ptr<Trunk> candidate) {
  auto const existing =
      std::find_if(m_trunks.begin(), m_trunks.end(),
                   [&](std::unique_ptr<Trunk> const& trunk) { return trunk->identity.get() == identity; });
  if (existing != m_trunks.end()) {
    if (candidate && same(**existing, *candidate))
      return;
    unregisterTrunk(**existing);
    m_retired.push_back(std::move(*existing));
    m_trunks.erase(existing);
  }
  if (!candidate)
    return;
  m_trunks.push_back(std::move(candidate));
  registerTrunk(*m_trunks.back());
}

bool TrunkRegistrations::same(Trunk const& a, Trunk const& b) {
  return a.path == b.path && a.registrarUri == b.registrarUri && a.addressOfRecord == b.addressOfRecord &&
         a.route == b.route && a.lifetime == b.lifetime && a.detectAddress == b.detectAddress &&
         a.flows == b.flows && a.checkSource == b.checkSource;
}

void TrunkRegistrations::followAll() {
  std::vector<std::unique_ptr<Trunk>> found = findTrunks();
  std::vector<std::unique_ptr<Trunk>> kept;
  for (std::unique_ptr<Trunk>& trunk : m_trunks) {
    auto const match = std::find_if(found.begin(), found.end(), [&](std::unique_ptr<Trunk> const& candidate) {
      return candidate && same(*trunk, *candidate);
    });
    if (match == found.end()) {
      unregisterTrunk(*trunk);
      m_retired.push_back(std::move(trunk));
      continue;
    }
    match->reset();
    kept.push_back(std::move(trunk));
  }
  for (std::unique_ptr<Trunk>& trunk : found) {
    if (!trunk)
      continue;
    kept.push_back(std::move(trunk));
    registerTrunk(*kept.back());
  }
  m_trunks = std::move(kept);
}

std::vector<std::unique_ptr<TrunkRegistrations::Trunk>> TrunkRegistrations::findTrunks() {
  std::vector<std::unique_ptr<Trunk>> trunks;
  m_clock.measure([&] {
    LS_IMasterLocationService* const master = m_session.locationMaster();
    Vector<String> services;
    master->getLocationServices(services);
    for (String const& serviceName : services) {
      RefPtr<LS_ILocationService> service;
      if (LS_getLocationServiceIf(master, serviceName, service).isFailure())
        continue;
      Vector<String> identities;
      service->getIdentities(identities);
      for (String const& name : identities) {
        RefPtr<LS_IIdentity> identity;
        if (LS_getIdentityIf(service.get(), name, identity).isFailure())
          continue;
        if (std::unique_ptr<Trunk> trunk = findTrunk(identity.get(), serviceName.str() + "/" + name.str()))
          trunks.push_back(std::move(trunk));
      }
    }
  });
  return trunks;
}

std::unique_ptr<TrunkRegistrations::Trunk> TrunkRegistrations::findTrunk(LS_IIdentity* identity,
                                                                         std::string const& path) {
  if (identity->getIdentityType() != LS_IdentityType::IDENTITY)
    return nullptr;
  RefPtr<LS_IRegistrationOutbound> face;
  LS_getFaceIf(identity, LS_IdentityFace::REGISTRATION_OUTBOUND, face);
  CHostPort registrar;
  CHostPort tlsRegistrar;
  if (!face || (face->getRegistrar(registrar, tlsRegistrar).isFailure() &&
                face->getDynamicRegistrar(registrar).isFailure()))
    return nullptr;
  auto trunk = std::make_unique<Trunk>();
  trunk->owner = this;
  trunk->identity = identity;
  trunk->face = face;
  trunk->path = path;
  trunk->user = identity->getName().str();
  addAddress(trunk->carrierAddresses, registrar);
  addAddress(trunk->carrierAddresses, tlsRegistrar);
  bool const secure = face->getUriScheme() == LS_UriScheme::SIPS || !tlsRegistrar.GetHost().isEmpty();
  if (!tlsRegistrar.GetHost().isEmpty())
    registrar = tlsRegistrar;
  // libre's requests take sip: URIs only: TLS is asked for with
  // transport=tls, which libre then uses for the hop.
  char const* const scheme = secure ? "sips:" : "sip:";
  std::string const transport = secure ? ";transport=tls" : "";
  trunk->registrarUri = "sip:" + hostPortText(registrar) + transport;
  trunk->nextHop = registrar.GetHost().c_str();
  trunk->addressOfRecord = scheme + trunk->user + "@" + registrar.GetHost().c_str();
  trunk->lifetime = face->getLifetime();
  RefPtr<LS_IOutbound> outbound;
  face->queryIf(outbound);
  CHostPort proxy;
  CHostPort tlsProxy;
  bool strictRoute = false;
  for (unsigned int index = 0; outbound && index < outbound->getNumberOfProxies(); ++index) {
    if (outbound->getProxy(index, proxy, tlsProxy, strictRoute).isFailure())
      continue;
    addAddress(trunk->carrierAddresses, proxy);
    addAddress(trunk->carrierAddresses, tlsProxy);
  }
  if (outbound && outbound->getNumberOfProxies() != 0 &&
      outbound->getProxy(0, proxy, tlsProxy, strictRoute).isSuccess() && !proxy.GetHost().isEmpty()) {
    if (secure && !tlsProxy.GetHost().isEmpty())
      proxy = tlsProxy;
    trunk->route = "sip:" + hostPortText(proxy) + transport;
    trunk->nextHop = proxy.GetHost().c_str();
  }
  if (secure)
    trunk->tlsHost = trunk->nextHop;
  readTraversal(*trunk, *face, outbound.get());
  tmr_init(&trunk->timer);
  trunk->keepAlive = std::make_unique<TrunkKeepAlive>(m_stack, onKeepAliveFailed, trunk.get());
  return trunk;
}

void TrunkRegistrations::registerTrunk(Trunk& trunk) {
  std::string tlsError;
  int const error = !trunk.tlsHost.empty() && !m_tls.verify(m_stack, trunk.tlsHost, m_caFile, tlsError)
                        ? EPROTO
                        : RegistrationClient::start(trunk.registration, m_stack, clientSettings(trunk),
                                                    onChallenge, onResponse, onKeepAliveFailed, &trunk);
  if (error == 0)
    return;
  unsigned int const seconds = m_clock.measure([&] { return trunk.face->getRetryTimeoutOnSystemError(); });
  reportFailure(trunk,
                "trunk " + trunk.path + " cannot register at " + trunk.registrarUri + ": " +
                    (tlsError.empty() ? failureCause(error, trunk.nextHop) : tlsError),
                seconds);
  trunk.retryMs = uint64_t{seconds} * 1000;
  tmr_start(&trunk.timer, trunk.retryMs, onRetry, &trunk);
}

int TrunkRegistrations::onChallenge(char** user, char** password, char const* realm, void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  TrunkRegistrations& owner = *trunk.owner;
  String error;
  String userName;
  String secret;
  CNameAddr addressOfRecord;
  addressOfRecord.Parse(trunk.addressOfRecord.data(), trunk.addressOfRecord.size());
  XCode const found = owner.m_clock.measure([&] {
    return LS_getOutboundAuthenticationCredentials(error, userName, secret, trunk.identity.get(),
                                                   addressOfRecord, LS_AuthenticationProtocol::HTTP, realm,
                                                   nullptr);
  });
  if (found.isFailure()) {
    owner.report("trunk " + trunk.path + " has no credentials for realm \"" + realm + "\"");
    return EAUTH;
  }
  int result = str_dup(user, userName.c_str());
  if (result == 0)
    result = str_dup(password, secret.c_str());
  return result;
}

void TrunkRegistrations::onResponse(int error, sip_msg const* response, void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  TrunkRegistrations& owner = *trunk.owner;
  LibraryClock& clock = owner.m_clock;
  if (error == 0 && response && response->scode < 300) {
    char address[64];
    re_snprintf(address, sizeof address, "%J", &response->src);
    CHostPort registrar;
    registrar.Parse(address, std::char_traits<char>::length(address));
    clock.measure([&] { trunk.face->setRegistrarAddr(registrar); });
    if (!sameHost(trunk.carrierAddresses, response->src))
      trunk.carrierAddresses.push_back(response->src);
    trunk.registered = true;
    trunk.lastFailure.clear();
    std::string transport = sip_transp_name(response->tp);
    std::transform(transport.begin(), transport.end(), transport.begin(),
                   [](char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); });
    owner.report("trunk " + trunk.path + " registered at " + transport + ":" + address + " for " +
                 std::to_string(trunk.lifetime) + " s");
    if (trunk.registration && trunk.registration->keepsFlowAlive()) {
      trunk.keepAlive->stop();
      return;
    }
    LS_KeepAliveMethod::Type method = LS_KeepAliveMethod::NONE;
    unsigned int interval = 0;
    clock.measure([&] {
      method = trunk.face->getKeepAliveMethod();
      interval = trunk.face->getKeepAliveInterval();
    });
    trunk.keepAlive->start(*response, method, interval, trunk.registrarUri, trunk.addressOfRecord);
    return;
  }
  trunk.registered = false;
  trunk.keepAlive->stop();
  unsigned int seconds;
  std::string cause;
  if (error == EPERM && response) {
    seconds = clock.measure([&] { return trunk.face->getRetryTimeoutOnSystemError(); });
    cause = refusedSource(trunk, *response);
  } else if (error != 0 || !response) {
    seconds = clock.measure([&] { return trunk.face->getRetryTimeoutOnSystemError(); });
    cause = failureCause(error, trunk.nextHop);
  } else if (response->scode >= 500 && response->scode < 600) {
    seconds = clock.measure([&] { return trunk.face->getRetryTimeoutOnServerError(); });
    cause = std::to_string(response->scode);
  } else {
    seconds = clock.measure([&] { return trunk.face->getRetryTimeoutOnClientError(); });
    cause = std::to_string(response->scode);
  }
  owner.reportFailure(trunk, "trunk " + trunk.path + " failed to register (" + cause + ")", seconds);
  trunk.retryMs = uint64_t{seconds} * 1000;
  tmr_start(&trunk.timer, 0, onDropFailed, &trunk);
}

void TrunkRegistrations::onDropFailed(void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  RegistrationClient::release(trunk.registration);
  tmr_start(&trunk.timer, trunk.retryMs, onRetry, &trunk);
}

void TrunkRegistrations::onKeepAliveFailed(int error, void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  TrunkRegistrations& owner = *trunk.owner;
  unsigned int const seconds =
      owner.m_clock.measure([&] { return trunk.face->getRetryTimeoutOnSystemError(); });
  trunk.registered = false;
  owner.reportFailure(trunk, "trunk " + trunk.path + " lost its registrar (" + std::strerror(error) + ")",
                      seconds);
  trunk.retryMs = uint64_t{seconds} * 1000;
  tmr_start(&trunk.timer, 0, onDropFailed, &trunk);
}

void TrunkRegistrations::onRetry(void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  trunk.owner->registerTrunk(trunk);
}

void TrunkRegistrations::unregisterTrunk(Trunk& trunk) {
  tmr_cancel(&trunk.timer);
  trunk.keepAlive->stop();
  if (trunk.registered)
    report("trunk " + trunk.path + " unregistering");
  trunk.registered = false;
  RegistrationClient::release(trunk.registration);
}

void TrunkRegistrations::stop() {
  for (std::unique_ptr<Trunk> const& trunk : m_trunks)
    unregisterTrunk(*trunk);
}

void TrunkRegistrations::readTraversal(Trunk& trunk, LS_IRegistrationOutbound& face, LS_IOutbound* outbound) {
  trunk.detectAddress = face.getNatTraversalMethod() == LS_NatTraversalMethod::ADDRESS_DETECTION;
  trunk.flows = face.getNatTraversalFlows() || (outbound && outbound->getUseFlows());
  trunk.checkSource = face.getDnsSecurityCheck();
}

RegistrationClient::Settings TrunkRegistrations::clientSettings(Trunk& trunk) {
  RegistrationClient::Settings settings;
  settings.registrarUri = trunk.registrarUri;
  settings.addressOfRecord = trunk.addressOfRecord;
  settings.user = trunk.user;
  settings.route = trunk.route;
  settings.lifetime = trunk.lifetime;
  settings.detectAddress = trunk.detectAddress;
  settings.checkSource = trunk.checkSource;
  settings.flowInterval = m_clock.measure([&] { return trunk.face->getKeepAliveInterval(); });
  if (!trunk.flows)
    return settings;
  if (!m_instanceTried) {
    m_instanceTried = true;
    std::string error;
    if (!InstanceId::load(m_instanceFile, m_instance, error))
      report(error + ": trunks register without flows");
  }
  if (m_instance.empty())
    return settings;
  settings.regId = 1;
  settings.instance = m_instance;
  return settings;
}

std::string TrunkRegistrations::refusedSource(Trunk const& trunk, sip_msg const& answer) {
  char address[64];
  re_snprintf(address, sizeof address, "%J", &answer.src);
  return std::string("answer from ") + address + ", not an address of " + trunk.nextHop;
}
