#include "trunks/TrunkRegistrations.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <iostream>

#include "LS_CredentialLookup.h"
#include "LS_ILocationService.h"
#include "LS_IOutbound.h"
#include "sip/MonotonicClock.h"
#include "trunks/InstanceId.h"
#include "trunks/TrunkSelection.h"

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

// The host of a URI "sip:HOST[:PORT];...", bracketed when IPv6.
std::string hostOf(std::string const& text) {
  pl value;
  pl_set_str(&value, text.c_str());
  uri parsed;
  if (uri_decode(&parsed, &value) != 0)
    return std::string();
  std::string host(parsed.host.p, parsed.host.l);
  return parsed.af == AF_INET6 ? "[" + host + "]" : host;
}

// "HOST[:PORT]" of the first value of header in message; empty when there
// is none or it does not parse. strictRoute: its URI has no lr parameter.
std::string firstAddress(sip_msg const& message, enum sip_hdrid header, bool& strictRoute) {
  sip_hdr const* const found = sip_msg_hdr(&message, header);
  sip_addr address;
  if (!found || sip_addr_decode(&address, &found->val) != 0 || !pl_isset(&address.uri.host))
    return std::string();
  pl end;
  strictRoute = msg_param_exists(&address.uri.params, "lr", &end) != 0;
  std::string text(address.uri.host.p, address.uri.host.l);
  if (address.uri.af == AF_INET6)
    text = "[" + text + "]";
  if (address.uri.port != 0)
    text += ":" + std::to_string(address.uri.port);
  return text;
}

CHostPort parsedHostPort(std::string const& text) {
  CHostPort hostPort;
  hostPort.Parse(text.data(), text.size());
  return hostPort;
}

}  // namespace

RefPtr<LS_IIdentity> TrunkRegistrations::trunkAt(sa const& source) const {
  for (std::unique_ptr<Trunk> const& trunk : m_trunks)
    if (sameHost(trunk->carrierAddresses, source))
      return trunk->identity;
  return nullptr;
}

std::string TrunkRegistrations::registrarOf(LS_IIdentity const* identity) const {
  Trunk const* const trunk = trunkOf(identity);
  if (!trunk)
    return std::string();
  if (!trunk->learntRegistrar.empty())
    return "sip:" + trunk->learntRegistrar + trunk->configured.transport;
  return trunk->registrarUri;
}

TrunkRegistrations::Trunk* TrunkRegistrations::trunkOf(LS_IIdentity const* identity) const {
  auto const found = m_byIdentity.find(identity);
  return found == m_byIdentity.end() ? nullptr : found->second;
}

std::vector<std::string> TrunkRegistrations::describe() const {
  std::vector<std::string> lines;
  for (std::unique_ptr<Trunk> const& trunk : m_trunks) {
    char const* state = trunk->registered                                                   ? "registered"
                        : trunk->failed                                                     ? "retrying"
                        : trunk->active                                                     ? "registering"
                        : trunk->mode == LS_RegistrationMode::BACK_TO_BACK && !trunk->bound ? "idle"
                                                                                            : "standby";
    std::string line = trunk->path + " " + state + " at " + registrarOf(trunk->identity.get());
    if (!trunk->learntRegistrar.empty())
      line += " (learnt)";
    if (trunk->active && !trunk->attempt.hop.empty())
      line += " via " + trunk->attempt.hop;
    lines.push_back(line);
  }
  return lines;
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
  if (m_registrar)
    m_registrar->removeListener(this);
}

void TrunkRegistrations::followBindings(Registrar& registrar) {
  m_registrar = &registrar;
  registrar.addListener(this);
}

bool TrunkRegistrations::hasPhones(LS_IIdentity* identity) const {
  return m_registrar && !m_registrar->bindings(identity).empty();
}

void TrunkRegistrations::start() {
  m_trunks = findTrunks();
  for (std::unique_ptr<Trunk> const& trunk : m_trunks)
    index(*trunk);
  reselectAll();
}

void TrunkRegistrations::index(Trunk& trunk) {
  m_byIdentity[trunk.identity.get()] = &trunk;
  m_byAccount.emplace(trunk.user, &trunk);
}

void TrunkRegistrations::unindex(Trunk& trunk) {
  auto const byIdentity = m_byIdentity.find(trunk.identity.get());
  if (byIdentity != m_byIdentity.end() && byIdentity->second == &trunk)
    m_byIdentity.erase(byIdentity);
  auto const range = m_byAccount.equal_range(trunk.user);
  for (auto each = range.first; each != range.second; ++each) {
    if (each->second == &trunk) {
      m_byAccount.erase(each);
      return;
    }
  }
}

void TrunkRegistrations::reselect(std::string const& account) {
  if (m_stopped)
    return;
  std::vector<Trunk*> trunks;
  std::vector<TrunkSelection::Candidate> candidates;
  auto const range = m_byAccount.equal_range(account);
  for (auto each = range.first; each != range.second; ++each) {
    Trunk& trunk = *each->second;
    trunks.push_back(&trunk);
    bool const wanted = trunk.mode != LS_RegistrationMode::BACK_TO_BACK || trunk.bound;
    candidates.push_back(TrunkSelection::Candidate{account, trunk.priority, wanted, trunk.failed});
  }
  std::vector<bool> const chosen = TrunkSelection::select(candidates);
  for (size_t index = 0; index < trunks.size(); ++index) {
    Trunk& trunk = *trunks[index];
    if (chosen[index] && !trunk.active)
      registerTrunk(trunk);
    else if (!chosen[index] && trunk.active)
      unregisterTrunk(trunk);
  }
}

void TrunkRegistrations::reselectAll() {
  for (auto each = m_byAccount.begin(); each != m_byAccount.end();) {
    std::string const account = each->first;
    reselect(account);
    each = m_byAccount.equal_range(account).second;
  }
}

void TrunkRegistrations::onBound(LS_IIdentity* identity, bool) {
  Trunk* const trunk = trunkOf(identity);
  if (!trunk || trunk->bound)
    return;
  trunk->bound = true;
  reselect(trunk->user);
}

void TrunkRegistrations::onUnbound(LS_IIdentity* identity) {
  Trunk* const trunk = trunkOf(identity);
  if (!trunk || !trunk->bound)
    return;
  trunk->bound = false;
  reselect(trunk->user);
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
  std::vector<std::string> accounts;
  if (existing != m_trunks.end()) {
    if (candidate && same(**existing, *candidate))
      return;
    accounts.push_back((*existing)->user);
    unregisterTrunk(**existing);
    unindex(**existing);
    m_retired.push_back(std::move(*existing));
    m_trunks.erase(existing);
  }
  if (candidate) {
    m_trunks.push_back(std::move(candidate));
    index(*m_trunks.back());
    accounts.push_back(m_trunks.back()->user);
  }
  for (std::string const& account : accounts)
    reselect(account);
}

bool TrunkRegistrations::same(Trunk const& a, Trunk const& b) {
  return a.path == b.path && a.registrarUri == b.registrarUri && a.addressOfRecord == b.addressOfRecord &&
         a.configured == b.configured && a.lifetime == b.lifetime && a.mode == b.mode &&
         a.priority == b.priority && a.answerTimeoutS == b.answerTimeoutS &&
         a.detectAddress == b.detectAddress && a.flows == b.flows && a.checkSource == b.checkSource;
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
  for (std::unique_ptr<Trunk>& trunk : found)
    if (trunk)
      kept.push_back(std::move(trunk));
  m_trunks = std::move(kept);
  m_byIdentity.clear();
  m_byAccount.clear();
  for (std::unique_ptr<Trunk> const& trunk : m_trunks)
    index(*trunk);
  reselectAll();
}

std::vector<std::unique_ptr<TrunkRegistrations::Trunk>> TrunkRegistrations::findTrunks() {
  std::vector<std::unique_ptr<Trunk>> trunks;
  m_clock.measure([&] {
    m_session.forEachIdentity([&](LS_IIdentity* identity, std::string const& path) {
      if (std::unique_ptr<Trunk> trunk = findTrunk(identity, path))
        trunks.push_back(std::move(trunk));
    });
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
  trunk->addressOfRecord = scheme + trunk->user + "@" + registrar.GetHost().c_str();
  trunk->lifetime = face->getLifetime();
  trunk->mode = face->getRegistrationMode();
  trunk->priority = face->getPriority();
  trunk->secure = secure;
  trunk->configured = RegistrationRoute::read(identity, *face, secure);
  RefPtr<LS_IOutbound> outbound;
  face->queryIf(outbound);
  if (outbound)
    trunk->answerTimeoutS = outbound->getNonInviteTransactionTimeout();
  CHostPort proxy;
  CHostPort tlsProxy;
  bool strictRoute = false;
  for (unsigned int index = 0; outbound && index < outbound->getNumberOfProxies(); ++index) {
    if (outbound->getProxy(index, proxy, tlsProxy, strictRoute).isFailure())
      continue;
    addAddress(trunk->carrierAddresses, proxy);
    addAddress(trunk->carrierAddresses, tlsProxy);
  }
  LS_ForcedDestination forced;
  if (outbound && outbound->getForcedDestination(forced).isSuccess() &&
      forced.type == LS_ForcedDestination::MANUAL) {
    addAddress(trunk->carrierAddresses, forced.udpTcpAddress);
    addAddress(trunk->carrierAddresses, forced.tlsDestination);
  }
  if (trunk->mode == LS_RegistrationMode::BACK_TO_BACK)
    trunk->bound = hasPhones(identity);
  readTraversal(*trunk, *face, outbound.get());
  tmr_init(&trunk->timer);
  tmr_init(&trunk->answerTimer);
  trunk->keepAlive = std::make_unique<TrunkKeepAlive>(m_stack, onKeepAliveFailed, trunk.get());
  return trunk;
}

void TrunkRegistrations::registerTrunk(Trunk& trunk) {
  trunk.active = true;
  std::string registrarAddress;
  if (trunk.configured.toRegistrarAddress) {
    CHostPort address;
    if (m_clock.measure([&] { return trunk.face->getRegistrarAddr(address); }).isSuccess())
      registrarAddress = hostPortText(address);
  }
  trunk.attempt = RegistrationRoute::choose(trunk.configured, trunk.registrarUri, trunk.learntRegistrar,
                                            registrarAddress, m_box, MonotonicClock::nowMs());
  trunk.nextHop =
      hostOf(trunk.attempt.routes.empty() ? trunk.attempt.requestUri : trunk.attempt.routes.front());
  trunk.tlsHost = trunk.secure ? trunk.nextHop : std::string();
  std::string tlsError;
  int const error = !trunk.tlsHost.empty() && !m_tls.verify(m_stack, trunk.tlsHost, m_caFile, tlsError)
                        ? EPROTO
                        : RegistrationClient::start(trunk.registration, m_stack, clientSettings(trunk),
                                                    onChallenge, onResponse, onKeepAliveFailed, &trunk);
  if (error == 0) {
    if (trunk.answerTimeoutS != 0)
      tmr_start(&trunk.answerTimer, uint64_t{trunk.answerTimeoutS} * 1000, onAnswerTimeout, &trunk);
    return;
  }
  fail(trunk, error, nullptr,
       "cannot register at " + trunk.attempt.requestUri + ": " +
           (tlsError.empty() ? failureCause(error, trunk.nextHop) : tlsError));
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
  tmr_cancel(&trunk.answerTimer);
  if (error == 0 && response && response->scode < 300) {
    char address[64];
    re_snprintf(address, sizeof address, "%J", &response->src);
    CHostPort registrar;
    registrar.Parse(address, std::char_traits<char>::length(address));
    clock.measure([&] { trunk.face->setRegistrarAddr(registrar); });
    owner.learnServiceRoute(trunk, *response);
    if (!sameHost(trunk.carrierAddresses, response->src))
      trunk.carrierAddresses.push_back(response->src);
    bool const recovered = trunk.failed;
    trunk.registered = true;
    trunk.failed = false;
    trunk.redirects = 0;
    trunk.lastFailure.clear();
    if (!trunk.attempt.hop.empty())
      owner.m_box.answered(trunk.attempt.hop);
    std::string transport = sip_transp_name(response->tp);
    std::transform(transport.begin(), transport.end(), transport.begin(),
                   [](char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); });
    owner.report("trunk " + trunk.path + " registered at " + transport + ":" + address + " for " +
                 std::to_string(trunk.lifetime) + " s");
    // libre's keep-alive of the flow, or the face's own: never both.
    if (trunk.registration && trunk.registration->keepsFlowAlive()) {
      trunk.keepAlive->stop();
    } else {
      LS_KeepAliveMethod::Type method = LS_KeepAliveMethod::NONE;
      unsigned int interval = 0;
      clock.measure([&] {
        method = trunk.face->getKeepAliveMethod();
        interval = trunk.face->getKeepAliveInterval();
      });
      trunk.keepAlive->start(*response, method, interval, trunk.registrarUri, trunk.addressOfRecord);
    }
    // The worse trunks standing in for this one step back.
    if (recovered)
      owner.reselect(trunk.user);
    return;
  }
  trunk.registered = false;
  trunk.keepAlive->stop();
  if (error == 0 && response && response->scode < 400 && owner.learnRedirect(trunk, *response)) {
    trunk.retryMs = 0;
    tmr_start(&trunk.timer, 0, onDropFailed, &trunk);
    return;
  }
  std::string const cause = error == EPERM && response ? owner.refusedSource(trunk, *response)
                            : error != 0 || !response  ? failureCause(error, trunk.nextHop)
                                                       : std::to_string(response->scode);
  owner.fail(trunk, error, response, "failed to register (" + cause + ")");
}

void TrunkRegistrations::fail(Trunk& trunk, int error, sip_msg const* response, std::string const& cause) {
  unsigned int seconds;
  if (error != 0 || !response)
    seconds = m_clock.measure([&] { return trunk.face->getRetryTimeoutOnSystemError(); });
  else if (response->scode >= 500 && response->scode < 600)
    seconds = m_clock.measure([&] { return trunk.face->getRetryTimeoutOnServerError(); });
  else
    seconds = m_clock.measure([&] { return trunk.face->getRetryTimeoutOnClientError(); });
  bool const unanswered = error != 0 || !response || response->scode == 503;
  if (trunk.configured.penaltyBox && unanswered && !trunk.attempt.hop.empty())
    m_box.failed(trunk.attempt.hop, MonotonicClock::nowMs());
  trunk.registered = false;
  trunk.failed = true;
  forgetLearnt(trunk);
  reportFailure(trunk, "trunk " + trunk.path + " " + cause, seconds);
  trunk.retryMs = uint64_t{seconds} * 1000;
  tmr_start(&trunk.timer, 0, onDropFailed, &trunk);
}

bool TrunkRegistrations::learnRedirect(Trunk& trunk, sip_msg const& response) {
  bool strictRoute = false;
  std::string const target = firstAddress(response, SIP_HDR_CONTACT, strictRoute);
  if (target.empty() || trunk.redirects >= kMaximumRedirects)
    return false;
  ++trunk.redirects;
  trunk.learntRegistrar = target;
  m_clock.measure([&] { trunk.face->setDynamicRegistrar(parsedHostPort(target)); });
  report("trunk " + trunk.path + " redirected to sip:" + target + trunk.configured.transport);
  return true;
}

void TrunkRegistrations::learnServiceRoute(Trunk& trunk, sip_msg const& response) {
  bool strictRoute = false;
  std::string const route = firstAddress(response, SIP_HDR_SERVICE_ROUTE, strictRoute);
  if (route == trunk.learntProxy)
    return;
  m_clock.measure([&] {
    RefPtr<LS_IOutbound> outbound;
    if (trunk.face->queryIf(outbound).isFailure())
      return;
    if (route.empty())
      outbound->removeDynamicProxy();
    else
      outbound->setDynamicProxy(parsedHostPort(route), strictRoute);
  });
  trunk.learntProxy = route;
}

void TrunkRegistrations::forgetLearnt(Trunk& trunk) {
  m_clock.measure([&] {
    if (!trunk.learntRegistrar.empty())
      trunk.face->removeDynamicRegistrar();
    RefPtr<LS_IOutbound> outbound;
    if (!trunk.learntProxy.empty() && trunk.face->queryIf(outbound).isSuccess())
      outbound->removeDynamicProxy();
  });
  trunk.learntRegistrar.clear();
  trunk.learntProxy.clear();
  trunk.redirects = 0;
}

void TrunkRegistrations::onDropFailed(void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  RegistrationClient::release(trunk.registration);
  tmr_start(&trunk.timer, trunk.retryMs, onRetry, &trunk);
  // A worse trunk of the account may now stand in; this one may have to
  // stand by, which cancels its retry.
  if (trunk.failed)
    trunk.owner->reselect(trunk.user);
}

void TrunkRegistrations::onKeepAliveFailed(int error, void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  trunk.owner->fail(trunk, error, nullptr, std::string("lost its registrar (") + std::strerror(error) + ")");
}

void TrunkRegistrations::onAnswerTimeout(void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  trunk.keepAlive->stop();
  trunk.owner->fail(trunk, ETIMEDOUT, nullptr,
                    "failed to register (" + failureCause(ETIMEDOUT, trunk.nextHop) + ")");
}

void TrunkRegistrations::onRetry(void* argument) {
  Trunk& trunk = *static_cast<Trunk*>(argument);
  trunk.owner->registerTrunk(trunk);
}

void TrunkRegistrations::unregisterTrunk(Trunk& trunk) {
  tmr_cancel(&trunk.timer);
  tmr_cancel(&trunk.answerTimer);
  trunk.keepAlive->stop();
  if (trunk.registered)
    report("trunk " + trunk.path + " unregistering");
  trunk.registered = false;
  trunk.active = false;
  trunk.failed = false;
  trunk.lastFailure.clear();
  RegistrationClient::release(trunk.registration);
  forgetLearnt(trunk);
}

void TrunkRegistrations::stop() {
  m_stopped = true;
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
  settings.registrarUri = trunk.attempt.requestUri;
  settings.addressOfRecord = trunk.addressOfRecord;
  settings.user = trunk.user;
  settings.routes = trunk.attempt.routes;
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
