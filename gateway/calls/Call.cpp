#include "calls/Call.h"

#include <algorithm>

#include "ScriptSession.h"
#include "calls/Calls.h"
#include "registrar/NatTraversal.h"
#include "sip/MonotonicClock.h"

namespace {

// The class of a final answer for RFC 3261 section 16.7: a lower class is
// better, 6xx ends the search.
unsigned int classOf(uint16_t code) {
  return code / 100;
}

// A request that a leg relays to the other, waiting for the other's answer.
struct PendingInfo {
  sip* stack;
  sip_msg const* request;
};

void destroyPendingInfo(void* data) {
  mem_deref(const_cast<sip_msg*>(static_cast<PendingInfo*>(data)->request));
}

}  // namespace

Call::Call(Calls& calls,
           sip_msg const& invite,
           std::string result,
           RefPtr<LS_IIdentity> caller,
           std::vector<Registrar::CallTarget> targets,
           uint32_t inviteTimeoutMs,
           std::unique_ptr<OutboundRoute> route)
    : m_calls(calls),
      m_invite(static_cast<sip_msg const*>(mem_ref(const_cast<sip_msg*>(&invite)))),
      m_result(std::move(result)),
      m_callerIdentity(std::move(caller)),
      m_targets(std::move(targets)),
      m_inviteTimeoutMs(inviteTimeoutMs),
      m_startedMs(MonotonicClock::nowMs()),
      m_route(std::move(route)) {}

Call::~Call() {
  // A relay still waiting: libre forgets its handler, and the phone that
  // asked learns the dialog is gone.
  mem_deref(m_relay);
  if (m_relayedTransaction)
    sip_treply(&m_relayedTransaction, &m_calls.stack(), m_relayed, 481, "Call/Transaction Does Not Exist");
  mem_deref(const_cast<sip_msg*>(m_relayed));
  for (auto& branch : m_branches) {
    tmr_cancel(&branch->timeout);
    mem_deref(branch->session);
  }
  mem_deref(m_caller);
  mem_deref(const_cast<sip_msg*>(m_invite));
}

void Call::start() {
  sip_reply(&m_calls.stack(), m_invite, 100, "Trying");
  startGroup();
}

bool Call::isInvite(sip_msg const& request) const {
  return pl_cmp(&request.callid, &m_invite->callid) == 0 &&
         pl_cmp(&request.from.tag, &m_invite->from.tag) == 0 && request.cseq.num == m_invite->cseq.num;
}

void Call::retransmitted() const {
  if (m_state == State::TRYING)
    sip_reply(&m_calls.stack(), m_invite, 100, "Trying");
}

void Call::cancel(sip_msg const& cancel) {
  sip_reply(&m_calls.stack(), &cancel, 200, "OK");
  if (m_state != State::TRYING)
    return;
  sip_treply(nullptr, &m_calls.stack(), m_invite, 487, "Request Terminated");
  m_calls.answered(*this, m_result, 487);
  end();
}

void Call::hangUp() {
  if (m_state == State::ENDED)
    return;
  if (m_state == State::TRYING || m_state == State::EARLY) {
    m_bestCode = 503;
    m_bestReason = "Service Unavailable";
    return answerFailure();
  }
  end();
}

void Call::startGroup() {
  while (m_next < m_targets.size()) {
    unsigned int const q = m_targets[m_next].q;
    size_t sent = 0;
    for (; m_next < m_targets.size() && m_targets[m_next].q == q; ++m_next) {
      if (launch(m_targets[m_next]))
        ++sent;
      else
        noteFailure(503, "Service Unavailable");
    }
    if (sent > 0)
      return;
  }
  answerFailure();
}

bool Call::launch(Registrar::CallTarget const& target) {
  auto branch = std::make_unique<Branch>();
  branch->call = this;
  branch->target = target;
  tmr_init(&branch->timeout);
  if (!send(*branch))
    return false;
  tmr_start(&branch->timeout, m_inviteTimeoutMs, onBranchTimeout, branch.get());
  m_branches.push_back(std::move(branch));
  return true;
}

void Call::heard(Branch& branch) {
  if (!branch.heard && m_route)
    m_route->answered();
  branch.heard = true;
}

bool Call::failOver(Branch const& failed, uint16_t code) {
  bool heard = failed.heard;
  while (m_route->failOver(code, heard, MonotonicClock::nowMs())) {
    Registrar::CallTarget target = failed.target;
    target.route = m_route->route();
    if (launch(target))
      return true;
    code = 503;
    heard = false;
  }
  return false;
}

void Call::noteFailure(uint16_t code, std::string const& reason) {
  uint16_t const counted = code == 503 ? 500 : code;
  if (m_bestCode == 0 || classOf(counted) < classOf(m_bestCode) || classOf(counted) == 6) {
    if (classOf(m_bestCode) == 6)
      return;
    m_bestCode = counted;
    m_bestReason = code == 503 ? "Server Internal Error" : reason;
  }
}

void Call::failed(Branch& branch, uint16_t code, std::string const& reason) {
  tmr_cancel(&branch.timeout);
  m_calls.release(branch.session);
  branch.session = nullptr;
  if (m_state != State::TRYING && m_state != State::EARLY)
    return noteFailure(code, reason);
  if (m_route && failOver(branch, code))
    return;
  noteFailure(code, reason);
  if (classOf(code) == 6)
    return answerFailure();
  bool const ringing =
      std::any_of(m_branches.begin(), m_branches.end(),
                  [](std::unique_ptr<Branch> const& each) { return each->session != nullptr; });
  if (!ringing)
    startGroup();
}

void Call::dropBranchesBut(Branch const* keep) {
  for (auto& branch : m_branches) {
    if (branch.get() == keep || !branch->session)
      continue;
    tmr_cancel(&branch->timeout);
    // libre cancels a branch still ringing and sends BYE to one that
    // answered meanwhile.
    m_calls.release(branch->session);
    branch->session = nullptr;
  }
}

void Call::answerFailure() {
  dropBranchesBut(nullptr);
  uint16_t const code = m_bestCode ? m_bestCode : 480;
  std::string const reason = m_bestCode ? m_bestReason : "Temporarily Unavailable";
  if (m_caller)
    sipsess_reject(m_caller, code, reason.c_str(), nullptr);
  else
    sip_treply(nullptr, &m_calls.stack(), m_invite, code, reason.c_str());
  m_calls.answered(*this, m_result, code);
  end();
}

void Call::end() {
  if (m_state == State::ENDED)
    return;
  m_state = State::ENDED;
  dropBranchesBut(nullptr);
  m_calls.release(m_caller);
  m_caller = nullptr;
  m_calls.finish(*this);
}

mbuf* Call::bodyOf(sip_msg const& message) {
  size_t const length = mbuf_get_left(message.mb);
  if (length == 0)
    return nullptr;
  mbuf* const body = mbuf_alloc(length);
  if (!body)
    return nullptr;
  mbuf_write_mem(body, mbuf_buf(message.mb), length);
  body->pos = 0;
  return body;
}

// The user part the gateway's Contact shows a leg: the caller sees the
// user it called, the callee the caller's user.
std::string Call::contactUser(pl const& user) {
  std::string text = textOf(user);
  return text.empty() ? std::string("gateway") : text;
}

std::string Call::contentType(sip_msg const& message) {
  sip_hdr const* const type = sip_msg_hdr(&message, SIP_HDR_CONTENT_TYPE);
  return type ? textOf(type->val) : std::string("application/sdp");
}

bool Call::send(Branch& branch) {
  sip_msg const& invite = *m_invite;
  std::string const fromUri = textOf(invite.from.auri);
  std::string const fromName = textOf(invite.from.dname);
  std::string const user = contactUser(invite.from.uri.user);
  char const* route = branch.target.route.c_str();
  mbuf* const offer = bodyOf(invite);
  int const error =
      sipsess_connect(&branch.session, &m_calls.sessions(), branch.target.uri.c_str(),
                      fromName.empty() ? nullptr : fromName.c_str(), fromUri.c_str(), user.c_str(),
                      branch.target.route.empty() ? nullptr : &route, branch.target.route.empty() ? 0 : 1,
                      contentType(invite).c_str(), offer, m_route ? OutboundRoute::onChallenge : nullptr,
                      m_route.get(), false, nullptr, onBranchAnswer, onBranchProgress, onBranchEstablished,
                      onBranchInfo, nullptr, onBranchClosed, &branch, nullptr);
  mem_deref(offer);
  if (error != 0) {
    branch.session = nullptr;
    return false;
  }
  m_branchCallIds.push_back(sip_dialog_callid(sipsess_dialog(branch.session)));
  m_calls.index(m_branchCallIds.back(), *this);
  return true;
}

bool Call::acceptCaller(uint16_t code, pl const& reason, mbuf* description) {
  std::string const text = textOf(reason);
  std::string const user = contactUser(m_invite->uri.user);
  bool const accepted =
      sipsess_accept(&m_caller, &m_calls.sessions(), m_invite, code, text.c_str(), user.c_str(),
                     contentType(*m_invite).c_str(), description, nullptr, nullptr, false, nullptr, nullptr,
                     onCallerEstablished, onCallerInfo, nullptr, onCallerClosed, this, nullptr) == 0;
  if (accepted)
    followCallerFlow();
  return accepted;
}

void Call::onBranchProgress(sip_msg const* message, void* argument) {
  Branch& branch = *static_cast<Branch*>(argument);
  Call& call = *branch.call;
  call.heard(branch);
  if (message->scode <= 100 || (call.m_state != State::TRYING && call.m_state != State::EARLY))
    return;
  mbuf* description = nullptr;
  if (!call.m_earlyMedia && mbuf_get_left(message->mb) > 0) {
    description = bodyOf(*message);
    call.m_earlyMedia = description != nullptr;
  }
  if (!call.m_caller) {
    if (call.acceptCaller(message->scode, message->reason, description))
      call.m_state = State::EARLY;
  } else {
    std::string const reason = textOf(message->reason);
    sipsess_progress(call.m_caller, message->scode, reason.c_str(), description, nullptr);
  }
  mem_deref(description);
}

int Call::onBranchAnswer(sip_msg const* message, void* argument) {
  Branch& branch = *static_cast<Branch*>(argument);
  // libre has just made the dialog, its target the 2xx's Contact, and
  // sends the ACK on return: the flow must be the target before.
  branch.call->followFlow(branch.session, branch.target.flow);
  if (!branch.call->m_winner)
    branch.call->m_answer.assign(reinterpret_cast<char const*>(mbuf_buf(message->mb)),
                                 mbuf_get_left(message->mb));
  return 0;
}

void Call::onBranchEstablished(sip_msg const* message, void* argument) {
  Branch& branch = *static_cast<Branch*>(argument);
  Call& call = *branch.call;
  tmr_cancel(&branch.timeout);
  call.heard(branch);
  if (call.m_state != State::TRYING && call.m_state != State::EARLY) {
    // Another branch won first, or the caller left: libre says BYE.
    call.m_calls.release(branch.session);
    branch.session = nullptr;
    return;
  }
  call.m_winner = &branch;
  call.dropBranchesBut(&branch);
  mbuf* const description = mbuf_alloc(call.m_answer.size() + 1);
  mbuf_write_mem(description, reinterpret_cast<uint8_t const*>(call.m_answer.data()), call.m_answer.size());
  description->pos = 0;
  bool answered = false;
  if (call.m_caller) {
    std::string const reason = textOf(message->reason);
    answered = sipsess_answer(call.m_caller, message->scode, reason.c_str(), description, nullptr) == 0;
  } else {
    answered = call.acceptCaller(message->scode, message->reason, description);
  }
  mem_deref(description);
  call.m_calls.answered(call, call.m_result, message->scode);
  if (!answered)
    return call.end();
  call.m_state = State::ANSWERED;
  call.m_calls.established(call);
}

void Call::onBranchClosed(int error, sip_msg const* message, void* argument) {
  Branch& branch = *static_cast<Branch*>(argument);
  Call& call = *branch.call;
  if (&branch == call.m_winner || call.m_state == State::ENDED) {
    // The callee hung up (or failed) after answering: the caller goes too.
    call.m_calls.release(branch.session);
    branch.session = nullptr;
    return call.end();
  }
  if (message)
    call.heard(branch);
  if (message && call.m_route && (message->scode == 401 || message->scode == 407))
    return call.failed(branch, 403, "Forbidden");
  if (message && message->scode >= 300)
    return call.failed(branch, message->scode, textOf(message->reason));
  call.failed(branch, error == ETIMEDOUT ? 408 : 503,
              error == ETIMEDOUT ? "Request Timeout" : "Service Unavailable");
}

void Call::onBranchTimeout(void* argument) {
  Branch& branch = *static_cast<Branch*>(argument);
  branch.call->failed(branch, 408, "Request Timeout");
}

void Call::onCallerEstablished(sip_msg const*, void* argument) {
  Call& call = *static_cast<Call*>(argument);
  if (call.m_state == State::ANSWERED)
    call.m_state = State::ESTABLISHED;
}

void Call::onCallerClosed(int, sip_msg const*, void* argument) {
  Call& call = *static_cast<Call*>(argument);
  // A CANCEL while ringing: libre has answered it and the INVITE (487).
  if (call.m_state == State::TRYING || call.m_state == State::EARLY)
    call.m_calls.answered(call, call.m_result, 487);
  call.end();
}

void Call::relayInfo(sipsess* to, sip_msg const& message) {
  PendingInfo* const pending = static_cast<PendingInfo*>(mem_zalloc(sizeof(PendingInfo), destroyPendingInfo));
  if (!pending)
    return;
  pending->stack = &m_calls.stack();
  pending->request = static_cast<sip_msg const*>(mem_ref(const_cast<sip_msg*>(&message)));
  sip_hdr const* const type = sip_msg_hdr(&message, SIP_HDR_CONTENT_TYPE);
  std::string const contentType = type ? textOf(type->val) : std::string("application/octet-stream");
  mbuf* const body = bodyOf(message);
  if (!to || sipsess_info(to, contentType.c_str(), body, onInfoAnswered, pending) != 0) {
    sip_reply(pending->stack, &message, 481, "Call/Transaction Does Not Exist");
    mem_deref(pending);
  }
  mem_deref(body);
}

void Call::onCallerInfo(sip*, sip_msg const* message, void* argument) {
  Call& call = *static_cast<Call*>(argument);
  call.relayInfo(call.m_winner ? call.m_winner->session : nullptr, *message);
}

void Call::onBranchInfo(sip*, sip_msg const* message, void* argument) {
  Branch& branch = *static_cast<Branch*>(argument);
  branch.call->relayInfo(&branch == branch.call->m_winner ? branch.call->m_caller : nullptr, *message);
}

void Call::onInfoAnswered(int error, sip_msg const* message, void* argument) {
  PendingInfo* const pending = static_cast<PendingInfo*>(argument);
  if (message) {
    std::string const reason = textOf(message->reason);
    sip_reply(pending->stack, pending->request, message->scode, reason.c_str());
  } else {
    sip_reply(pending->stack, pending->request, error == ETIMEDOUT ? 408 : 503,
              error == ETIMEDOUT ? "Request Timeout" : "Service Unavailable");
  }
  // libre calls a request's handler once, with its final answer.
  mem_deref(pending);
}

std::string Call::describe() const {
  static char const* const kStates[] = {"trying", "early", "answered", "established", "ended"};
  std::string text = textOf(m_invite->from.auri);
  if (m_callerIdentity)
    text += " (" + ScriptSession::pathOf(m_callerIdentity.get()) + ")";
  text += " -> " + textOf(m_invite->ruri) + " " + kStates[static_cast<int>(m_state)];
  if (m_winner)
    text += " at " + m_winner->target.uri;
  return text;
}

void Call::followFlow(sipsess* session, std::string const& flowUri) {
  if (!session || flowUri.empty())
    return;
  // libre takes a dialog's remote target from a message's Contact only: a
  // message that says nothing else hands it the flow's.
  mbuf* const text = mbuf_alloc(flowUri.size() + 64);
  if (!text)
    return;
  mbuf_printf(text, "SIP/2.0 200 OK\r\nContact: <%s>\r\n\r\n", flowUri.c_str());
  text->pos = 0;
  sip_msg* message = nullptr;
  if (sip_msg_decode(&message, text) == 0)
    sip_dialog_update(sipsess_dialog(session), message);
  mem_deref(message);
  mem_deref(text);
}

void Call::followCallerFlow() {
  sip_msg const& invite = *m_invite;
  sip_hdr const* const contact = sip_msg_hdr(&invite, SIP_HDR_CONTACT);
  sip_addr address;
  if (!contact || sip_addr_decode(&address, &contact->val) != 0)
    return;
  std::string flow;
  if (invite.tp != SIP_TRANSP_UDP)
    flow = NatTraversal::flowTarget(address.auri, invite.src, invite.tp);
  else if (!NatTraversal::natedTarget(address.auri, invite.src, invite.tp, flow))
    return;
  followFlow(m_caller, flow);
}

sipsess* Call::otherLeg(sip_msg const& request) const {
  if (m_caller && sip_dialog_cmp(sipsess_dialog(m_caller), &request))
    return m_winner ? m_winner->session : nullptr;
  if (m_winner && m_winner->session && sip_dialog_cmp(sipsess_dialog(m_winner->session), &request))
    return m_caller;
  return nullptr;
}

bool Call::relayInDialog(sip_msg const& request) {
  if (m_state != State::ANSWERED && m_state != State::ESTABLISHED)
    return false;
  sipsess* const to = otherLeg(request);
  if (!to)
    return false;
  sip* const stack = &m_calls.stack();
  sipsess* const from = to == m_caller ? m_winner->session : m_caller;
  if (!sip_dialog_rseq_valid(sipsess_dialog(from), &request)) {
    sip_reply(stack, &request, 500, "Server Internal Error");
    return true;
  }
  if (m_relayed) {
    sip_treplyf(nullptr, nullptr, stack, &request, false, 491, "Request Pending",
                "Retry-After: 1\r\nContent-Length: 0\r\n\r\n");
    return true;
  }
  if (sip_strans_alloc(&m_relayedTransaction, stack, &request, nullptr, nullptr) != 0)
    return true;
  std::string const method = textOf(request.met);
  std::string const type = contentType(request);
  bool const hasBody = mbuf_get_left(request.mb) > 0;
  int const error =
      sip_drequestf(&m_relay, stack, true, method.c_str(), sipsess_dialog(to), 0, nullptr, onRelaySent,
                    onRelayAnswered, this, "%s%s%sContent-Length: %zu\r\n\r\n%b",
                    hasBody ? "Content-Type: " : "", hasBody ? type.c_str() : "", hasBody ? "\r\n" : "",
                    mbuf_get_left(request.mb), mbuf_buf(request.mb), mbuf_get_left(request.mb));
  if (error != 0) {
    sip_treply(&m_relayedTransaction, stack, &request, 500, "Server Internal Error");
    m_relayedTransaction = nullptr;
    return true;
  }
  m_relayed = static_cast<sip_msg const*>(mem_ref(const_cast<sip_msg*>(&request)));
  m_relayTo = to;
  return true;
}

int Call::onRelaySent(sip_transp transport, sa const* source, sa const*, mbuf* message, void* argument) {
  Call& call = *static_cast<Call*>(argument);
  // The Contact the other leg knows the gateway by.
  std::string const user =
      contactUser(call.m_relayTo == call.m_caller ? call.m_invite->uri.user : call.m_invite->from.uri.user);
  sip_contact contact;
  sip_contact_set(&contact, user.c_str(), source, transport);
  return mbuf_printf(message, "%H", sip_contact_print, &contact);
}

void Call::onRelayAnswered(int error, sip_msg const* message, void* argument) {
  Call& call = *static_cast<Call*>(argument);
  if (message && message->scode < 200)
    return;
  sip* const stack = &call.m_calls.stack();
  sip_msg const* const request = call.m_relayed;
  call.m_relay = nullptr;
  call.m_relayed = nullptr;
  if (!message) {
    sip_treply(&call.m_relayedTransaction, stack, request, error == ETIMEDOUT ? 408 : 503,
               error == ETIMEDOUT ? "Request Timeout" : "Service Unavailable");
  } else {
    bool const invite = pl_strcmp(&message->cseq.met, "INVITE") == 0;
    if (invite && message->scode < 300)
      sip_drequestf(nullptr, stack, false, "ACK", sipsess_dialog(call.m_relayTo), message->cseq.num, nullptr,
                    nullptr, nullptr, nullptr, "Content-Length: 0\r\n\r\n");
    std::string const reason = textOf(message->reason);
    std::string const user =
        contactUser(call.m_relayTo == call.m_caller ? call.m_invite->from.uri.user : call.m_invite->uri.user);
    sip_contact contact;
    sip_contact_set(&contact, user.c_str(), &request->dst, request->tp);
    std::string const type = contentType(*message);
    bool const hasBody = mbuf_get_left(message->mb) > 0;
    sip_treplyf(&call.m_relayedTransaction, nullptr, stack, request, false, message->scode, reason.c_str(),
                "%H%s%s%sContent-Length: %zu\r\n\r\n%b", sip_contact_print, &contact,
                hasBody ? "Content-Type: " : "", hasBody ? type.c_str() : "", hasBody ? "\r\n" : "",
                mbuf_get_left(message->mb), mbuf_buf(message->mb), mbuf_get_left(message->mb));
  }
  call.m_relayedTransaction = nullptr;
  call.m_relayTo = nullptr;
  mem_deref(const_cast<sip_msg*>(request));
}
