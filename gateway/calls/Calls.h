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
// - The request log gets the INVITE's line when its final answer leaves,
//   with that answer's code, whatever part of the call decided it.
// - In-dialog requests that libre's session layer takes (ACK, BYE, INFO,
//   re-INVITE) are left to it: takesInDialog() tells the front-end which.
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
#include "calls/PenaltyBox.h"
#include "registrar/Registrar.h"
#include "sip/Libre.h"
#include "sip/Listeners.h"
#include "sip/RequestLog.h"
#include "trunks/TrunkRegistrations.h"

class Exchange;

class Calls {
 public:
  // How long a branch may take to answer finally, when no face says.
  static constexpr uint32_t kDefaultInviteTimeoutMs = 32 * 1000;
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

  // An INVITE without a To tag.
  void handle(Exchange& exchange);
  // A CANCEL: true when it was for a call here, and answered.
  bool cancelled(sip_msg const& cancel);
  // Whether an in-dialog request is the session layer's.
  static bool takesInDialog(sip_msg const& request);

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
  // Lets go of a session on the next turn of the loop: libre may still be
  // inside one of its calls.
  void release(sipsess* session);
  // The call ended; it is destroyed on the next turn of the loop.
  void finish(Call& call);

 private:
  Call* find(sip_msg const& request) const;
  // Whether a location service answers for the Request-URI's host; the
  // lookup's message in why when none does.
  static bool served(Exchange& exchange, std::string& why);
  void callOut(Exchange& exchange, std::string const& why);
  // STAND-IN until callers authenticate: the identity the From address
  // resolves to, taken on trust. To be replaced by the identity the caller
  // authenticated as.
  RefPtr<LS_IIdentity> callerOf(Exchange& exchange) const;
  std::vector<Registrar::CallTarget> targetsOf(LS_IIdentity* identity) const;
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
  std::vector<Call*> m_finished;
  std::vector<sipsess*> m_released;
  tmr m_reap;
  Statistics m_statistics;
  TrunkRegistrations* m_trunks = nullptr;
  PenaltyBox m_penaltyBox;
};
