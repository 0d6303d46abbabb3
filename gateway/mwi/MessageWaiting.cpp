#include "mwi/MessageWaiting.h"

#include <algorithm>
#include <cstring>
#include <iostream>
#include <unordered_set>

#include "LS_ILocationService.h"
#include "LS_IOutbound.h"
#include "LS_IdentityFace.h"
#include "LS_MwiSubscriptionMode.h"
#include "sip/Exchange.h"
#include "sip/MonotonicClock.h"

namespace {

// Hash table sizes of sipevent: notifiers (the gateway is none) and
// subscriptions.
constexpr uint32_t kNotifierBuckets = 1;
constexpr uint32_t kSubscriptionBuckets = 256;

char const kEvent[] = "message-summary";
char const kContentType[] = "application/simple-message-summary";

std::string hostPortText(CHostPort const& hostPort) {
  std::string text = hostPort.GetHost().c_str();
  if (hostPort.GetPort() != 0)
    text += ":" + std::to_string(hostPort.GetPort());
  return text;
}

// The host without IPv6 brackets; empty when it is no address.
bool numericAddress(CHostPort const& hostPort, sa& address) {
  std::string host = hostPort.GetHost().c_str();
  if (host.size() > 2 && host.front() == '[' && host.back() == ']')
    host = host.substr(1, host.size() - 2);
  return !host.empty() && sa_set_str(&address, host.c_str(), 0) == 0;
}

// The transport parameter of a route for the face's preferred transport,
// as OutboundRoute reads it; empty when libre is to choose.
std::string transportOf(LS_IOutbound& face) {
  LS_ProtocolConfig::Type protocol = LS_ProtocolConfig::PREFERRED_NONE;
  if (face.getPreferredProtocol(protocol).isFailure())
    return std::string();
  switch (protocol) {
    case LS_ProtocolConfig::PREFERRED_UDP_TCP_TLS:
    case LS_ProtocolConfig::PREFERRED_UDP_TLS_TCP:
    case LS_ProtocolConfig::FORCED_UDP:
      return ";transport=udp";
    case LS_ProtocolConfig::PREFERRED_TCP_UDP_TLS:
    case LS_ProtocolConfig::PREFERRED_TCP_TLS_UDP:
    case LS_ProtocolConfig::FORCED_TCP:
      return ";transport=tcp";
    case LS_ProtocolConfig::PREFERRED_TLS_UDP_TCP:
    case LS_ProtocolConfig::PREFERRED_TLS_TCP_UDP:
    case LS_ProtocolConfig::FORCED_TLS:
      return ";transport=tls";
    default:
      return std::string();
  }
}

// What the face's hops depend on, as one text: its effective proxies and
// its forced destination.
std::string hopsOf(LS_IOutbound& face) {
  std::string hops;
  for (unsigned int index = 0; index < face.getNumberOfProxies(); ++index) {
    CHostPort address;
    CHostPort tlsAddress;
    bool strictRoute = false;
    if (face.getProxy(index, address, tlsAddress, strictRoute).isSuccess())
      hops += hostPortText(address) + " " + hostPortText(tlsAddress) + ",";
  }
  LS_ForcedDestination forced;
  if (face.getForcedDestination(forced).isSuccess())
    hops += " forced " + std::to_string(static_cast<unsigned int>(forced.type)) + " " +
            hostPortText(forced.udpTcpAddress) + " " + hostPortText(forced.tlsDestination);
  return hops;
}

// The value of one "Name: value" line of a message-summary body (RFC 3842
// section 5.2), the name matched without regard to case; empty when absent.
std::string summaryValue(std::string const& body, char const* name) {
  size_t const length = std::strlen(name);
  size_t start = 0;
  while (start < body.size()) {
    size_t end = body.find('\n', start);
    if (end == std::string::npos)
      end = body.size();
    std::string line = body.substr(start, end - start);
    start = end + 1;
    if (!line.empty() && line.back() == '\r')
      line.pop_back();
    if (line.size() <= length || line[length] != ':' || strncasecmp(line.c_str(), name, length) != 0)
      continue;
    size_t const value = line.find_first_not_of(" \t", length + 1);
    return value == std::string::npos ? std::string() : line.substr(value);
  }
  return std::string();
}

std::string lowered(std::string text) {
  std::transform(text.begin(), text.end(), text.begin(),
                 [](char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); });
  return text;
}

}  // namespace

MessageWaiting::~MessageWaiting() {
  stop();
  for (std::unique_ptr<Subscriber> const& subscriber : m_retired)
    tmr_cancel(&subscriber->timer);
  mem_deref(m_events);
}

char const* MessageWaiting::nameOf(State state) {
  switch (state) {
    case State::SUBSCRIBING:
      return "subscribing";
    case State::SUBSCRIBED:
      return "subscribed";
    case State::PENDING:
      return "pending";
    case State::FAILED:
      return "failed";
    case State::IMPLICIT:
      return "implicit";
  }
  return "unknown";
}

void MessageWaiting::report(std::string const& line) {
  m_session.flushDebugLines();
  std::cerr << "location-gateway: " << line << std::endl;
}

bool MessageWaiting::start(sip& stack, dnsc* dns, TrunkRegistrations& trunks, std::string& error) {
  m_stack = &stack;
  m_dns = dns;
  m_trunks = &trunks;
  if (sipevent_listen(&m_events, &stack, kNotifierBuckets, kSubscriptionBuckets, nullptr, nullptr) != 0) {
    error = "the SIP stack cannot take subscriptions";
    return false;
  }
  m_subscribers = findAll();
  for (std::unique_ptr<Subscriber> const& subscriber : m_subscribers) {
    m_byIdentity[subscriber->identity.get()] = subscriber.get();
    begin(*subscriber);
  }
  return true;
}

std::vector<std::unique_ptr<MessageWaiting::Subscriber>> MessageWaiting::findAll() {
  std::vector<std::unique_ptr<Subscriber>> found;
  m_clock.measure([&] {
    m_session.forEachIdentity([&](LS_IIdentity* identity, std::string const& path) {
      if (std::unique_ptr<Subscriber> subscriber = find(identity, path))
        found.push_back(std::move(subscriber));
    });
  });
  return found;
}

std::unique_ptr<MessageWaiting::Subscriber> MessageWaiting::find(LS_IIdentity* identity,
                                                                 std::string const& path) {
  if (identity->getIdentityType() != LS_IdentityType::IDENTITY)
    return nullptr;
  RefPtr<LS_IMwiSubscription> face;
  LS_getFaceIf(identity, LS_IdentityFace::MESSAGE_SUBSCRIPTION, face);
  if (!face)
    return nullptr;
  LS_MwiSubscriptionMode::Type const mode = face->getMwiSubscriptionMode();
  if (mode != LS_MwiSubscriptionMode::EXPLICIT && mode != LS_MwiSubscriptionMode::IMPLICIT)
    return nullptr;
  CHostPort notifier;
  CHostPort tlsNotifier;
  // A learnt notifier stands in for a configured one only when there is
  // none, as the trunks' learnt registrar does.
  if (face->getMwiNotifier(notifier, tlsNotifier).isFailure() &&
      face->getDynamicMwiNotifier(notifier).isFailure())
    return nullptr;
  if (notifier.GetHost().isEmpty())
    return nullptr;
  auto subscriber = std::make_unique<Subscriber>();
  subscriber->owner = this;
  subscriber->identity = identity;
  subscriber->face = face;
  subscriber->path = path;
  subscriber->user = identity->getName().str();
  subscriber->mode = mode;
  subscriber->lifetime = face->getLifetime();
  RefPtr<LS_IOutbound> outbound;
  face->queryIf(outbound);
  subscriber->transport = outbound ? transportOf(*outbound) : std::string();
  subscriber->hops = outbound ? hopsOf(*outbound) : std::string();
  subscriber->tls = subscriber->transport == ";transport=tls";
  subscriber->notifier = subscriber->tls && !tlsNotifier.GetHost().isEmpty() ? tlsNotifier : notifier;
  subscriber->current = subscriber->notifier;
  sa address;
  for (CHostPort const* each : {&notifier, &tlsNotifier})
    if (numericAddress(*each, address))
      subscriber->addresses.push_back(address);
  CHostPort learnt;
  if (face->getDynamicMwiNotifier(learnt).isSuccess() && numericAddress(learnt, address))
    subscriber->addresses.push_back(address);
  subscriber->state = mode == LS_MwiSubscriptionMode::IMPLICIT ? State::IMPLICIT : State::SUBSCRIBING;
  tmr_init(&subscriber->timer);
  return subscriber;
}

MessageWaiting::Subscriber* MessageWaiting::subscriberOf(LS_IIdentity const* identity) const {
  auto const found = m_byIdentity.find(identity);
  return found == m_byIdentity.end() ? nullptr : found->second;
}

bool MessageWaiting::same(Subscriber const& a, Subscriber const& b) {
  return a.path == b.path && a.mode == b.mode && a.notifier == b.notifier && a.transport == b.transport &&
         a.hops == b.hops && a.lifetime == b.lifetime;
}

void MessageWaiting::follow(std::vector<RefPtr<LS_IIdentity>> const& touched,
                            std::vector<LS_IIdentity const*> const& removed) {
  for (LS_IIdentity const* identity : removed)
    replace(identity, nullptr);
  for (RefPtr<LS_IIdentity> const& identity : touched) {
    if (std::find(removed.begin(), removed.end(), identity.get()) != removed.end())
      continue;
    std::unique_ptr<Subscriber> candidate =
        m_clock.measure([&] { return find(identity.get(), ScriptSession::pathOf(identity.get())); });
    replace(identity.get(), std::move(candidate));
  }
}

void MessageWaiting::followAll() {
  std::vector<std::unique_ptr<Subscriber>> found = findAll();
  std::unordered_set<LS_IIdentity const*> kept;
  for (std::unique_ptr<Subscriber> const& candidate : found)
    kept.insert(candidate->identity.get());
  std::vector<LS_IIdentity const*> gone;
  for (std::unique_ptr<Subscriber> const& subscriber : m_subscribers)
    if (kept.count(subscriber->identity.get()) == 0)
      gone.push_back(subscriber->identity.get());
  for (LS_IIdentity const* identity : gone)
    replace(identity, nullptr);
  for (std::unique_ptr<Subscriber>& candidate : found) {
    LS_IIdentity const* const identity = candidate->identity.get();
    replace(identity, std::move(candidate));
  }
}

void MessageWaiting::replace(LS_IIdentity const* identity, std::unique_ptr<Subscriber> candidate) {
  if (Subscriber* const current = subscriberOf(identity)) {
    if (candidate && same(*current, *candidate))
      return;
    end(*current);
    m_byIdentity.erase(identity);
    auto const existing = std::find_if(
        m_subscribers.begin(), m_subscribers.end(),
        [&](std::unique_ptr<Subscriber> const& subscriber) { return subscriber.get() == current; });
    m_retired.push_back(std::move(*existing));
    m_subscribers.erase(existing);
  }
  if (!candidate)
    return;
  m_subscribers.push_back(std::move(candidate));
  m_byIdentity[identity] = m_subscribers.back().get();
  begin(*m_subscribers.back());
}

void MessageWaiting::begin(Subscriber& subscriber) {
  if (subscriber.mode == LS_MwiSubscriptionMode::IMPLICIT)
    return resolve(subscriber);
  subscribe(subscriber);
}

void MessageWaiting::resolve(Subscriber& subscriber) {
  sa numeric;
  if (!m_dns || numericAddress(subscriber.notifier, numeric))
    return;
  std::string const host = subscriber.notifier.GetHost().c_str();
  subscriber.lookup = static_cast<dns_query*>(mem_deref(subscriber.lookup));
  if (dnsc_query(&subscriber.lookup, m_dns, host.c_str(), DNS_TYPE_A, DNS_CLASS_IN, true, onResolved,
                 &subscriber) != 0)
    report("message server " + host + " of " + subscriber.path + " cannot be looked up");
}

void MessageWaiting::onResolved(int error, dnshdr const*, list* answers, list*, list*, void* argument) {
  // libre has let go of the query and cleared the handle already.
  Subscriber& subscriber = *static_cast<Subscriber*>(argument);
  std::string const host = subscriber.notifier.GetHost().c_str();
  for (le* each = answers ? answers->head : nullptr; error == 0 && each; each = each->next) {
    dnsrr const* const record = static_cast<dnsrr const*>(each->data);
    if (record->type != DNS_TYPE_A)
      continue;
    sa address;
    sa_set_in(&address, record->rdata.a.addr, 0);
    subscriber.addresses.push_back(address);
  }
  if (subscriber.addresses.empty())
    subscriber.owner->report("message server " + host + " of " + subscriber.path + " does not resolve");
}

void MessageWaiting::subscribe(Subscriber& subscriber) {
  std::string const host = hostPortText(subscriber.current);
  std::string const uri = "sip:" + subscriber.user + "@" + host + (subscriber.tls ? ";transport=tls" : "");
  std::string const from = "sip:" + subscriber.user + "@" + host;
  if (!subscriber.route) {
    CNameAddr fromAddress;
    fromAddress.Parse(from.data(), from.size());
    subscriber.route = std::make_unique<OutboundRoute>(
        subscriber.identity.get(), fromAddress, *m_trunks, m_trunks->penaltyBox(), m_clock,
        [](std::string const&) { return false; }, LS_IdentityFace::MESSAGE_SUBSCRIPTION);
  }
  // OutboundRoute verifies the TLS hops it names; without one the
  // notifier itself is the hop.
  std::string tlsError;
  if (!subscriber.route->available())
    tlsError = "no hop can be reached";
  else if (subscriber.tls && subscriber.route->route().empty())
    m_trunks->verifyTls(subscriber.current.GetHost().c_str(), tlsError);
  std::string const route = subscriber.route->available() ? subscriber.route->route() : std::string();
  char const* routes[] = {route.c_str()};
  subscriber.state = State::SUBSCRIBING;
  int const error =
      !tlsError.empty()
          ? EPROTO
          : sipevent_subscribe(&subscriber.subscription, m_events, uri.c_str(), nullptr, from.c_str(), kEvent,
                               nullptr, subscriber.lifetime, subscriber.user.c_str(),
                               route.empty() ? nullptr : routes, route.empty() ? 0 : 1,
                               OutboundRoute::onChallenge, subscriber.route.get(), false, nullptr, onNotify,
                               onClose, &subscriber, "Accept: %s\r\n", kContentType);
  if (error == 0)
    return;
  unsigned int const seconds =
      m_clock.measure([&] { return subscriber.face->getRetryTimeoutOnSystemError(); });
  retryLater(subscriber, seconds,
             "message-waiting subscription of " + subscriber.path + " cannot be sent to " + uri + ": " +
                 (tlsError.empty() ? std::strerror(error) : tlsError));
}

void MessageWaiting::retryLater(Subscriber& subscriber, unsigned int seconds, std::string const& failure) {
  subscriber.state = State::FAILED;
  subscriber.route.reset();
  if (failure != subscriber.lastFailure)
    report(failure + ", retrying in " + std::to_string(seconds) + " s");
  subscriber.lastFailure = failure;
  subscriber.retryMs = uint64_t{seconds} * 1000;
  tmr_start(&subscriber.timer, 0, onDrop, &subscriber);
}

void MessageWaiting::forgetLearnt(Subscriber& subscriber) {
  if (!subscriber.learnt)
    return;
  subscriber.learnt = false;
  subscriber.current = subscriber.notifier;
  m_clock.measure([&] { subscriber.face->removeDynamicMwiNotifier(); });
}

void MessageWaiting::onDrop(void* argument) {
  Subscriber& subscriber = *static_cast<Subscriber*>(argument);
  subscriber.subscription = static_cast<sipsub*>(mem_deref(subscriber.subscription));
  tmr_start(&subscriber.timer, subscriber.retryMs, onRetry, &subscriber);
}

void MessageWaiting::onRetry(void* argument) {
  Subscriber& subscriber = *static_cast<Subscriber*>(argument);
  subscriber.owner->subscribe(subscriber);
}

void MessageWaiting::onClose(int error,
                             sip_msg const* answer,
                             sipevent_substate const* state,
                             void* argument) {
  Subscriber& subscriber = *static_cast<Subscriber*>(argument);
  MessageWaiting& owner = *subscriber.owner;
  LibraryClock& clock = owner.m_clock;
  LS_IMwiSubscription& face = *subscriber.face;
  std::string const where = hostPortText(subscriber.current);
  // One move is followed: a 3xx from a notifier a 3xx named is a failure,
  // so that two servers naming each other cannot keep the gateway busy.
  if (!state && error == 0 && answer && answer->scode >= 300 && answer->scode < 400 && !subscriber.learnt) {
    sip_hdr const* const contact = sip_msg_hdr(answer, SIP_HDR_CONTACT);
    sip_addr address;
    CHostPort target;
    if (contact && sip_addr_decode(&address, &contact->val) == 0) {
      std::string text = textOf(address.uri.host);
      if (address.uri.af == AF_INET6)
        text = "[" + text + "]";
      if (address.uri.port != 0)
        text += ":" + std::to_string(address.uri.port);
      target.Parse(text.data(), text.size());
    }
    if (!target.GetHost().isEmpty()) {
      owner.report("message-waiting subscription of " + subscriber.path + " moved (" +
                   std::to_string(answer->scode) + ") from " + where + " to " + hostPortText(target));
      clock.measure([&] { face.setDynamicMwiNotifier(target); });
      subscriber.learnt = true;
      subscriber.current = target;
      subscriber.lastFailure.clear();
      subscriber.route.reset();
      subscriber.retryMs = 0;
      subscriber.state = State::SUBSCRIBING;
      tmr_start(&subscriber.timer, 0, onDrop, &subscriber);
      return;
    }
  }
  // A system error moves on to the face's next hop, if it has one.
  bool const system = !state && (error != 0 || !answer);
  if (system && subscriber.route && subscriber.route->failOver(408, false, MonotonicClock::nowMs())) {
    subscriber.retryMs = 0;
    subscriber.state = State::SUBSCRIBING;
    tmr_start(&subscriber.timer, 0, onDrop, &subscriber);
    return;
  }
  owner.forgetLearnt(subscriber);
  unsigned int seconds;
  std::string cause;
  if (state) {
    seconds = clock.measure([&] { return face.getRetryTimeoutOnClientError(); });
    cause = std::string("terminated, ") + sipevent_reason_name(state->reason);
  } else if (system) {
    seconds = clock.measure([&] { return face.getRetryTimeoutOnSystemError(); });
    cause = std::strerror(error != 0 ? error : ETIMEDOUT);
  } else if (answer->scode >= 500 && answer->scode < 600) {
    seconds = clock.measure([&] { return face.getRetryTimeoutOnServerError(); });
    cause = std::to_string(answer->scode);
  } else {
    seconds = clock.measure([&] { return face.getRetryTimeoutOnClientError(); });
    cause = std::to_string(answer->scode);
  }
  owner.retryLater(
      subscriber, seconds,
      "message-waiting subscription of " + subscriber.path + " at " + where + " failed (" + cause + ")");
}

void MessageWaiting::onNotify(sip* stack, sip_msg const* notify, void* argument) {
  Subscriber& subscriber = *static_cast<Subscriber*>(argument);
  (void)sip_treply(nullptr, stack, notify, 200, "OK");
  sip_hdr const* const header = sip_msg_hdr(notify, SIP_HDR_SUBSCRIPTION_STATE);
  sipevent_substate state;
  if (header && sipevent_substate_decode(&state, &header->val) == 0 && state.state != SIPEVENT_TERMINATED) {
    subscriber.state = state.state == SIPEVENT_PENDING ? State::PENDING : State::SUBSCRIBED;
    if (subscriber.state == State::SUBSCRIBED && !subscriber.lastFailure.empty()) {
      subscriber.lastFailure.clear();
      subscriber.owner->report("message-waiting subscription of " + subscriber.path + " active at " +
                               hostPortText(subscriber.current));
    }
    if (subscriber.route)
      subscriber.route->answered();
  }
  subscriber.owner->take(subscriber, *notify);
}

void MessageWaiting::take(Subscriber& subscriber, sip_msg const& notify) {
  size_t const length = mbuf_get_left(notify.mb);
  // A NOTIFY without a body (pending, or terminated) says nothing about
  // the messages.
  if (length == 0)
    return;
  Summary& summary = subscriber.summary;
  summary.known = true;
  summary.body.assign(reinterpret_cast<char const*>(mbuf_buf(notify.mb)), length);
  summary.contentType = pl_isset(&notify.ctyp.type)
                            ? textOf(notify.ctyp.type) + "/" + textOf(notify.ctyp.subtype)
                            : std::string(kContentType);
  summary.waiting = lowered(summaryValue(summary.body, "Messages-Waiting"));
  summary.voice = summaryValue(summary.body, "Voice-Message");
  relay(subscriber);
}

void MessageWaiting::relay(Subscriber& subscriber) {
  if (!subscriber.summary.known || !m_stack)
    return;
  std::vector<Registrar::CallTarget> const targets = m_registrar.callTargets(subscriber.identity.get());
  std::string const from = "sip:" + subscriber.user + "@" + hostPortText(subscriber.current);
  Summary const& summary = subscriber.summary;
  for (Registrar::CallTarget const& target : targets) {
    uri route;
    pl routeText;
    pl_set_str(&routeText, target.route.c_str());
    bool const routed = !target.route.empty() && uri_decode(&route, &routeText) == 0;
    int const error = sip_requestf(
        nullptr, m_stack, true, "NOTIFY", target.uri.c_str(), routed ? &route : nullptr, nullptr, nullptr,
        nullptr, nullptr,
        "From: <%s>;tag=%016llx\r\n"
        "To: <%s>\r\n"
        "Call-ID: %016llx\r\n"
        "CSeq: %u NOTIFY\r\n"
        "Max-Forwards: 70\r\n"
        "Event: %s\r\n"
        "Subscription-State: active\r\n"
        "Content-Type: %s\r\n"
        "Content-Length: %zu\r\n"
        "\r\n"
        "%b",
        from.c_str(), static_cast<unsigned long long>(rand_u64()), target.uri.c_str(),
        static_cast<unsigned long long>(rand_u64()), static_cast<unsigned int>(++m_sequence), kEvent,
        summary.contentType.c_str(), summary.body.size(), summary.body.data(), summary.body.size());
    if (error == 0)
      ++m_relayed;
  }
}

bool MessageWaiting::fromNotifier(Subscriber const& subscriber, sa const& source) const {
  return std::any_of(subscriber.addresses.begin(), subscriber.addresses.end(),
                     [&](sa const& address) { return sa_cmp(&address, &source, SA_ADDR); });
}

DialogHandler::Verdict MessageWaiting::inDialog(sip_msg const& request) {
  if (m_events && pl_strcmp(&request.met, "NOTIFY") == 0)
    return Verdict::PASSED;
  return Verdict::UNKNOWN;
}

void MessageWaiting::handle(Exchange& exchange) {
  sip_msg const& notify = exchange.request();
  sip_hdr const* const event = sip_msg_hdr(&notify, SIP_HDR_EVENT);
  sipevent_event decoded;
  if (!event || sipevent_event_decode(&decoded, &event->val) != 0 ||
      pl_strcasecmp(&decoded.event, kEvent) != 0)
    return exchange.answer(489, "Bad Event");
  CNameAddr nameAddr;
  RefPtr<LS_IIdentity> identity = exchange.resolveOrAnswer(notify.ruri, nameAddr, false);
  if (!identity && !exchange.answered())
    identity = exchange.resolveOrAnswer(notify.to.auri, nameAddr);
  if (!identity)
    return;
  Subscriber* const subscriber = subscriberOf(identity.get());
  if (!subscriber || subscriber->mode != LS_MwiSubscriptionMode::IMPLICIT ||
      !fromNotifier(*subscriber, notify.src)) {
    char source[64];
    re_snprintf(source, sizeof source, "%J", &notify.src);
    report("NOTIFY for " + exchange.result() + " from " + source + " refused: not its message server");
    return exchange.answer(403, "Forbidden");
  }
  exchange.answer(200, "OK");
  take(*subscriber, notify);
}

void MessageWaiting::onBound(LS_IIdentity* identity, bool) {
  if (Subscriber* const subscriber = subscriberOf(identity))
    relay(*subscriber);
}

void MessageWaiting::end(Subscriber& subscriber) {
  tmr_cancel(&subscriber.timer);
  subscriber.lookup = static_cast<dns_query*>(mem_deref(subscriber.lookup));
  if (subscriber.subscription && subscriber.state != State::FAILED)
    report("message-waiting subscription of " + subscriber.path + " ending");
  // sipevent sends the SUBSCRIBE with Expires: 0 when the subscription
  // was made, and lives on until it is answered.
  subscriber.subscription = static_cast<sipsub*>(mem_deref(subscriber.subscription));
  forgetLearnt(subscriber);
}

void MessageWaiting::stop() {
  for (std::unique_ptr<Subscriber> const& subscriber : m_subscribers)
    end(*subscriber);
}

std::vector<std::string> MessageWaiting::describe() const {
  std::vector<std::string> lines;
  for (std::unique_ptr<Subscriber> const& subscriber : m_subscribers) {
    Summary const& summary = subscriber->summary;
    std::string line = subscriber->path + " " + LS_MwiSubscriptionMode::NAME(subscriber->mode) + " " +
                       nameOf(subscriber->state) + " notifier " + hostPortText(subscriber->current) +
                       (subscriber->learnt ? " learnt" : "") + " messages " +
                       (!summary.known            ? "unknown"
                        : summary.waiting.empty() ? "-"
                                                  : summary.waiting);
    if (!summary.voice.empty())
      line += " voice " + summary.voice;
    lines.push_back(line);
  }
  return lines;
}

std::map<std::string, uint64_t> MessageWaiting::countByState() const {
  std::map<std::string, uint64_t> counts;
  for (State state : {State::SUBSCRIBING, State::SUBSCRIBED, State::PENDING, State::FAILED, State::IMPLICIT})
    counts[nameOf(state)] = 0;
  for (std::unique_ptr<Subscriber> const& subscriber : m_subscribers)
    ++counts[nameOf(subscriber->state)];
  return counts;
}
