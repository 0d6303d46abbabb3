#include "calls/Calls.h"

#include <algorithm>

#include "LS_ICall.h"
#include "LS_IOutbound.h"
#include "LS_IdentityResolution.h"
#include "registrar/InboundFilter.h"
#include "sip/Exchange.h"
#include "sip/MonotonicClock.h"
#include "trunks/OutboundRoute.h"

namespace {

// Calls by Call-ID in libre's session layer: its table of sessions.
constexpr int kSessionBuckets = 1024;

// " NAME voip=V tone-set=T sip=S" for the profiles a call face of identity
// names (the empty ones left out); nothing when it names none.
std::string profilesOf(LS_IIdentity const& identity, LS_IdentityFace::Type kind, char const* name) {
  RefPtr<LS_ICall> face;
  LS_getFaceIf(&identity, kind, face);
  if (!face)
    return "";
  std::string text;
  for (auto const& profile : {std::make_pair("voip=", face->getVoipProfile()),
                              std::make_pair("tone-set=", face->getToneSetProfile()),
                              std::make_pair("sip=", face->getSipProfile())})
    if (!profile.second.isEmpty())
      text += std::string(" ") + profile.first + profile.second.str();
  return text.empty() ? text : " " + std::string(name) + text;
}

}  // namespace

Calls::Calls(Registrar& registrar, Listeners const& listeners, RequestLog& log)
    : m_registrar(registrar), m_listeners(listeners), m_log(log) {
  tmr_init(&m_reap);
  m_statistics.setUpBuckets.assign(setUpBoundsMs().size() + 1, 0);
}

Calls::~Calls() {
  tmr_cancel(&m_reap);
  m_calls.clear();
  for (sipsess* session : m_released)
    mem_deref(session);
  mem_deref(m_sessions);
}

bool Calls::start(sip& stack, std::string& error) {
  m_stack = &stack;
  // No handler of new sessions: the front-end hands every new INVITE to
  // handle(), before the session layer's listener sees it.
  if (sipsess_listen(&m_sessions, &stack, kSessionBuckets, nullptr, nullptr) != 0) {
    error = "the SIP stack cannot take calls";
    return false;
  }
  return true;
}

DialogHandler::Verdict Calls::inDialog(sip_msg const& request) {
  if (relayedInDialog(request))
    return Verdict::ANSWERED;
  for (char const* method : {"ACK", "BYE", "INFO", "INVITE", "REFER"})
    if (pl_strcmp(&request.met, method) == 0)
      return Verdict::PASSED;
  return Verdict::UNKNOWN;
}

Call* Calls::find(sip_msg const& request) const {
  auto const range = m_calls.equal_range(textOf(request.callid));
  for (auto each = range.first; each != range.second; ++each)
    if (each->second->isInvite(request))
      return each->second.get();
  return nullptr;
}

void Calls::index(std::string const& callId, Call& call) {
  m_branchCalls[callId] = &call;
}

bool Calls::relayedInDialog(sip_msg const& request) {
  if (pl_strcmp(&request.met, "INVITE") != 0 && pl_strcmp(&request.met, "UPDATE") != 0)
    return false;
  std::string const callId = textOf(request.callid);
  auto const branch = m_branchCalls.find(callId);
  if (branch != m_branchCalls.end())
    return branch->second->relayInDialog(request);
  auto const range = m_calls.equal_range(callId);
  for (auto each = range.first; each != range.second; ++each)
    if (each->second->relayInDialog(request))
      return true;
  return false;
}

bool Calls::cancelled(sip_msg const& cancel) {
  Call* const call = find(cancel);
  if (!call || call->state() == Call::State::ENDED)
    return false;
  call->cancel(cancel);
  return true;
}

void Calls::handle(Exchange& exchange) {
  if (pl_strcmp(&exchange.request().met, "CANCEL") != 0)
    return invite(exchange);
  if (cancelled(exchange.request()))
    return exchange.handOver();
  exchange.answer(481, "Call/Transaction Does Not Exist");
}

void Calls::invite(Exchange& exchange) {
  sip_msg const& invite = exchange.request();
  if (Call* const call = find(invite))
    return call->retransmitted();
  if (m_maxCalls != 0 && m_statistics.active >= m_maxCalls)
    return exchange.answer(503, "Service Unavailable",
                           "Retry-After: " + std::to_string(kRetryAfterSeconds) + "\r\n");
  bool const fromCarrier = m_trunks && m_trunks->trunkAt(invite.src);
  RefPtr<LS_IIdentity> caller;
  if (!fromCarrier && !m_registrar.authenticator().admitCaller(exchange, caller))
    return;
  std::string outside;
  if (!fromCarrier && !served(exchange, outside))
    return callOut(exchange, outside, std::move(caller));
  CNameAddr target;
  RefPtr<LS_IIdentity> const identity = exchange.resolveOrAnswer(invite.ruri, target);
  if (!identity || InboundFilter::refuses(exchange, *identity, LS_IdentityFace::CALL_INBOUND))
    return;
  std::vector<Registrar::CallTarget> targets = targetsOf(identity.get());
  if (targets.empty())
    return exchange.answer(480, "Temporarily Unavailable");
  auto const loops = std::remove_if(targets.begin(), targets.end(),
                                    [this](Registrar::CallTarget const& each) { return isGateway(each); });
  if (loops == targets.begin())
    return exchange.answer(482, "Loop Detected");
  targets.erase(loops, targets.end());
  if (mbuf_get_left(invite.mb) == 0)
    return exchange.answer(488, "Not Acceptable Here");
  std::string const result = exchange.result() + exchange.clock().measure([&] {
    return profilesOf(*identity, LS_IdentityFace::CALL_INBOUND, "inbound-profiles") +
           (caller ? profilesOf(*caller, LS_IdentityFace::CALL_OUTBOUND, "outbound-profiles")
                   : std::string());
  });
  uint32_t const timeoutMs = exchange.clock().measure([&] { return inviteTimeoutMs(caller.get()); });
  auto call = std::make_unique<Call>(*this, invite, result, std::move(caller), std::move(targets), timeoutMs);
  Call& started = *call;
  m_calls.emplace(textOf(invite.callid), std::move(call));
  ++m_statistics.active;
  exchange.handOver();
  started.start();
}

uint32_t Calls::inviteTimeoutMs(LS_IIdentity const* caller) {
  RefPtr<LS_IOutbound> face;
  if (caller)
    LS_getFaceIf(caller, LS_IdentityFace::CALL_OUTBOUND, face);
  unsigned int const seconds = face ? face->getInviteTransactionTimeout() : 0;
  if (seconds == 0)
    return kDefaultInviteTimeoutMs;
  return std::min(seconds, kMaximumInviteTimeoutSeconds) * 1000;
}

bool Calls::served(Exchange& exchange, std::string& why) {
  sip_msg const& invite = exchange.request();
  CNameAddr nameAddr;
  // What does not parse is left to the lookup of the callee, which says so.
  if (!nameAddr.Parse(invite.ruri.p, invite.ruri.l))
    return true;
  return exchange.clock().measure([&] {
    String error;
    String user;
    CHostPort host;
    if (LS_splitNameAddr(error, user, host, nameAddr).isFailure())
      return true;
    bool const found = exchange.session().serviceFor(error, host) != nullptr;
    why = error.str();
    return found;
  });
}

void Calls::callOut(Exchange& exchange, std::string const& why, RefPtr<LS_IIdentity> caller) {
  sip_msg const& invite = exchange.request();
  if (!caller) {
    exchange.setResult("\"" + why + "\"");
    return exchange.answer(403, "Forbidden");
  }
  exchange.setResult(exchange.clock().measure([&] { return ScriptSession::pathOf(caller.get()); }));
  if (!m_trunks)
    return exchange.answer(503, "Service Unavailable");
  if (mbuf_get_left(invite.mb) == 0)
    return exchange.answer(488, "Not Acceptable Here");
  CNameAddr from;
  from.Parse(invite.from.auri.p, invite.from.auri.l);
  auto route = std::make_unique<OutboundRoute>(caller.get(), from, *m_trunks, m_trunks->penaltyBox(),
                                               exchange.clock(), [this](std::string const& hop) {
                                                 return isGateway(Registrar::CallTarget{hop, hop, "", 0});
                                               });
  if (!route->available())
    return exchange.answer(503, "Service Unavailable");
  std::vector<Registrar::CallTarget> targets{
      Registrar::CallTarget{textOf(invite.ruri), route->route(), "", 1000}};
  uint32_t const timeoutMs = exchange.clock().measure([&] { return inviteTimeoutMs(caller.get()); });
  std::string const result = exchange.result() + exchange.clock().measure([&] {
    return profilesOf(*caller, LS_IdentityFace::CALL_OUTBOUND, "outbound-profiles");
  });
  auto call = std::make_unique<Call>(*this, invite, result, std::move(caller), std::move(targets), timeoutMs,
                                     std::move(route));
  Call& started = *call;
  m_calls.emplace(textOf(invite.callid), std::move(call));
  ++m_statistics.active;
  exchange.handOver();
  started.start();
}

std::vector<Registrar::CallTarget> Calls::targetsOf(LS_IIdentity* identity) const {
  std::vector<Registrar::CallTarget> targets = m_registrar.callTargets(identity);
  // Highest q first; equal q ring together (RFC 3261 section 16.6).
  std::stable_sort(targets.begin(), targets.end(),
                   [](Registrar::CallTarget const& a, Registrar::CallTarget const& b) { return a.q > b.q; });
  return targets;
}

bool Calls::isGateway(Registrar::CallTarget const& target) const {
  std::string const& text = target.route.empty() ? target.uri : target.route;
  pl value;
  pl_set_str(&value, text.c_str());
  uri parsed;
  return uri_decode(&parsed, &value) == 0 && m_listeners.names(parsed);
}

void Calls::answered(Call& call, std::string const& result, uint16_t code) {
  m_log.write(call.invite(), result, code);
  if (code >= 300)
    ++m_statistics.failed[code];
}

std::vector<uint64_t> const& Calls::setUpBoundsMs() {
  static std::vector<uint64_t> const bounds{100, 250, 500, 1000, 2500, 5000, 10000, 30000};
  return bounds;
}

void Calls::established(Call& call) {
  ++m_statistics.setUp;
  uint64_t const elapsed = MonotonicClock::nowMs() - call.startedMs();
  std::vector<uint64_t> const& bounds = setUpBoundsMs();
  size_t const bucket = std::lower_bound(bounds.begin(), bounds.end(), elapsed) - bounds.begin();
  ++m_statistics.setUpBuckets[bucket];
  m_statistics.setUpSecondsSum += static_cast<double>(elapsed) / 1000.0;
}

void Calls::release(sipsess* session) {
  if (!session)
    return;
  m_released.push_back(session);
  reapSoon();
}

void Calls::finish(Call& call) {
  m_finished.push_back(&call);
  --m_statistics.active;
  reapSoon();
}

void Calls::reapSoon() {
  if (!tmr_isrunning(&m_reap))
    tmr_start(&m_reap, 0, onReap, this);
}

void Calls::onReap(void* argument) {
  Calls& calls = *static_cast<Calls*>(argument);
  std::vector<sipsess*> released;
  released.swap(calls.m_released);
  for (sipsess* session : released)
    mem_deref(session);
  std::vector<Call*> finished;
  finished.swap(calls.m_finished);
  for (Call* call : finished) {
    for (std::string const& callId : call->branchCallIds())
      calls.m_branchCalls.erase(callId);
    auto const range = calls.m_calls.equal_range(textOf(call->invite().callid));
    for (auto each = range.first; each != range.second; ++each) {
      if (each->second.get() == call) {
        calls.m_calls.erase(each);
        break;
      }
    }
  }
}

void Calls::endAll() {
  for (auto& entry : m_calls)
    entry.second->hangUp();
  onReap(this);
}

std::vector<std::string> Calls::describe() const {
  std::vector<std::string> lines;
  for (auto const& entry : m_calls)
    if (entry.second->state() != Call::State::ENDED)
      lines.push_back(entry.second->describe());
  return lines;
}
