// Calls: the gateway as a signalling back-to-back user agent (--calls relay,
// the default): an INVITE to a subscriber is answered by the gateway, which
// calls every binding in effect itself (Call) and relays between the two
// dialogs. The media never pass through the gateway: the SDP goes from one
// phone to the other unchanged, and the RTP with it.
//
// Decisions, with their reasons:
// - Where a branch goes is the registrar's to say (Registrar::callTargets):
//   a binding over TCP, TLS or WebSocket is reached over its own
//   connection, a NATed UDP one at the address its REGISTER came from.
// - A call whose target is the gateway itself (a static contact naming one
//   of its listeners) would come back as a new call without end, since
//   libre sends every INVITE with a fresh Max-Forwards: such a target is
//   skipped, as 482 Loop Detected.
// - --max-calls N: beyond N calls in progress, 503 with Retry-After, as a
//   proxy that is full says so (RFC 3261 section 21.5.4); 0 is no limit.
// - A caller whose From names a subscriber authenticates first (407), with
//   the Authenticator and the nonces, failure counts and hold the
//   Registrar has: Authenticator::admitCaller says who and why. The call
//   keeps the identity it authenticated as. A 407 leaves statelessly, and
//   its ACK goes to libre's session layer as every ACK does, which drops
//   one that matches no session without answering it.
// - The request log gets the INVITE's line when its final answer leaves,
//   with that answer's code, whatever part of the call decided it. Its
//   result names the called identity, then the profiles its inbound call
//   face names, as " inbound-profiles voip=V tone-set=T sip=S" (those set
//   only, nothing when none is), and those of the caller's outbound call
//   face as " outbound-profiles ..." when the caller is a subscriber: the
//   profiles are the call handling's business beyond this gateway, and the
//   line is where an operator sees which applied.
// - In-dialog requests that libre's session layer takes (ACK, BYE, INFO,
//   REFER) are left to it; re-INVITE and UPDATE of a call are relayed here.
// - A call whose Request-URI is in no served domain (no location service
//   answers for its host) leaves the gateway through the caller identity's
//   call-outbound face (OutboundRoute). Without a caller identity it gets
//   403: the gateway is no open relay.
// - A request from a carrier (TrunkRegistrations::trunkAt) is its trunk's
//   and is not challenged; it goes to the subscriber its Request-URI names,
//   and never back out: a Request-URI outside gets 404, as a number the
//   gateway does not serve, so that two carriers cannot bounce a call
//   through it.
//
// Owns every call; destroying it ends them without a word to the phones
// (the stack goes down with it). Everything runs on libre's thread.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "calls/Call.h"
#include "registrar/Registrar.h"
#include "sip/DialogHandler.h"
#include "sip/Libre.h"
#include "sip/Listeners.h"
#include "sip/RequestHandler.h"
#include "sip/RequestLog.h"
#include "trunks/TrunkRegistrations.h"

class Exchange;

class Calls final : public RequestHandler, public DialogHandler {
 public:
  // How long a branch may take to answer finally: the caller's outbound
  // call face's INVITE transaction timeout, in seconds (the call is the
  // caller's, each branch an attempt of it), up to a day; 32 s for a
  // caller from outside, or when the face says 0.
  static constexpr uint32_t kDefaultInviteTimeoutMs = 32 * 1000;
  static constexpr unsigned int kMaximumInviteTimeoutSeconds = 24 * 60 * 60;
  static constexpr uint32_t kRetryAfterSeconds = 5;

  Calls(Registrar& registrar, Listeners const& listeners, RequestLog& log);
  ~Calls();
  Calls(Calls const&) = delete;
  Calls& operator=(Calls const&) = delete;

  // Starts libre's session layer on the stack, after the front-end's own
  // listener, so that the front-end sees every request first.
  bool start(sip& stack, std::string& error);
  // Where outbound calls find trunks, and requests from carriers their
  // trunk; before the first call. Borrowed: the trunks outlive the calls.
  void useTrunks(TrunkRegistrations& trunks) { m_trunks = &trunks; }
  void limit(uint32_t maxCalls) { m_maxCalls = maxCalls; }
  // At shut-down: every call ends, its legs told (BYE, CANCEL or a final
  // answer) while the stack finishes.
  void endAll();

  // An INVITE without a To tag, or a CANCEL.
  void handle(Exchange& exchange) override;
  Verdict inDialog(sip_msg const& request) override;

  struct Statistics {
    uint64_t active = 0;
    uint64_t setUp = 0;
    std::map<uint16_t, uint64_t> failed;  // by the final code the caller got
    // Set-up time (INVITE to 2xx) in milliseconds, as bucket counts.
    std::vector<uint64_t> setUpBuckets;
    double setUpSecondsSum = 0;
  };
  static std::vector<uint64_t> const& setUpBoundsMs();
  Statistics const& statistics() const { return m_statistics; }
  // One line per call in progress.
  std::vector<std::string> describe() const;

  // For the calls:
  sip& stack() { return *m_stack; }
  sipsess_sock& sessions() { return *m_sessions; }
  // The caller got its final answer.
  void answered(Call& call, std::string const& result, uint16_t code);
  // The callee answered and the caller got it.
  void established(Call& call);
  // A branch's Call-ID, under which its dialog's requests find the call.
  void index(std::string const& callId, Call& call);
  // Lets go of a session on the next turn of the loop: libre may still be
  // inside one of its calls.
  void release(sipsess* session);
  // The call ended; it is destroyed on the next turn of the loop.
  void finish(Call& call);

 private:
  Call* find(sip_msg const& request) const;
  void invite(Exchange& exchange);
  // A CANCEL: true when it was for a call here, and answered.
  bool cancelled(sip_msg const& cancel);
  // A request in a dialog: true when it was a re-INVITE or UPDATE of a
  // call here, and relayed (Call::relayInDialog).
  bool relayedInDialog(sip_msg const& request);
  // Whether a location service answers for the Request-URI's host; the
  // lookup's message in why when none does.
  static bool served(Exchange& exchange, std::string& why);
  void callOut(Exchange& exchange, std::string const& why, RefPtr<LS_IIdentity> caller);
  std::vector<Registrar::CallTarget> targetsOf(LS_IIdentity* identity) const;
  static uint32_t inviteTimeoutMs(LS_IIdentity const* caller);
  bool isGateway(Registrar::CallTarget const& target) const;
  static void onReap(void* calls);
  void reapSoon();

  Registrar& m_registrar;
  Listeners const& m_listeners;
  RequestLog& m_log;
  sip* m_stack = nullptr;
  sipsess_sock* m_sessions = nullptr;
  uint32_t m_maxCalls = 0;
  // By Call-ID; a few calls share one at most (a forked caller's).
  std::multimap<std::string, std::unique_ptr<Call>> m_calls;
  // The Call-IDs of the branches, each a dialog of the gateway's own.
  std::map<std::string, Call*> m_branchCalls;
  std::vector<Call*> m_finished;
  std::vector<sipsess*> m_released;
  tmr m_reap;
  Statistics m_statistics;
  TrunkRegistrations* m_trunks = nullptr;
};
