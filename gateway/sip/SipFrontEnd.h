// SipFrontEnd: the SIP stack of the gateway on libre, with its transports
// (listeners, TLS and WebSocket, the DNS client), and the listener that
// hands each request on: the rate limit and Admission first, then the
// handler a MethodTable names for the request's method (see route()).
// Malformed messages never reach it: libre drops what it cannot parse, and
// every length read here is bounded by the parts.
//
// It knows no part above the stack: what answers REGISTER, INVITE and the
// rest is registered in methods() by whoever composes the gateway, and
// parts that run on the stack themselves (the registrar's NAT pings, the
// trunks) are started on stack() once start() has opened it.
//
// Built after the scripts have run; every UDP address listened on joins the
// stack settings' local host-ports. Owned by the Gateway. shutDown() lets
// the stack finish within a bounded time; close() ends every transaction at
// once, after which the parts holding client transactions (the trunks) may
// die before the object itself.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "ScriptSession.h"
#include "sip/Admission.h"
#include "sip/AnswerCounters.h"
#include "sip/DialogHandler.h"
#include "sip/DnsClient.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/Listeners.h"
#include "sip/MethodTable.h"
#include "sip/RequestLog.h"
#include "sip/SecureTransports.h"
#include "sip/SourceFilter.h"
#include "sip/SourceRateLimit.h"

class SipFrontEnd {
 public:
  // redirectSources: the sources the redirect server answers, which
  // Admission needs too (see there); they outlive the front-end.
  SipFrontEnd(ScriptSession& session, LibraryClock& clock, SourceFilter const& redirectSources)
      : m_session(session), m_clock(clock), m_admission(m_listeners, redirectSources) {}
  ~SipFrontEnd();
  SipFrontEnd(SipFrontEnd const&) = delete;
  SipFrontEnd& operator=(SipFrontEnd const&) = delete;

  struct Settings {
    // "ADDR:PORT" each, UDP and TCP on each (see Listeners).
    std::vector<std::string> listen;
    // "ADDR:PORT" each; empty for the system's (see DnsClient).
    std::vector<std::string> dnsServers;
  };

  // Opens the stack, its listeners and its listener. False with an error
  // text when a DNS server, a listen address or the stack is refused.
  bool start(Settings const& settings, std::string& error);
  // After start().
  sip& stack() { return *m_stack; }
  // What start() opened: "udp:ADDR:PORT tcp:ADDR:PORT ...".
  std::string listening() const { return m_listeners.describe(); }
  std::vector<std::string> const& dnsServers() const { return m_dns.servers(); }
  // The stack's DNS client, for parts that resolve a name themselves.
  dnsc* dns() const { return m_dns.client(); }
  // After start(): TLS, WebSocket and secure WebSocket as options ask, each
  // bound one as "tls:ADDR:PORT" (and so on) in bound, else an error text.
  bool startSecure(SecureTransportOptions const& options,
                   std::vector<std::string>& bound,
                   std::string& error) {
    return m_secure.add(*m_stack, options, bound, error);
  }
  // Stops taking requests and lets the stack finish what it sends (the
  // trunks' unregistrations), at most kShutDownMs.
  void shutDown();
  // Stops taking requests and ends every transaction at once. Forced: a
  // registrar that never answered an unregistration must not keep a
  // registration alive that points at a trunk about to die. Idempotent;
  // the destructor calls it too.
  void close();

  // Filled before start(); see RequestHandler for the handlers' lifetime.
  MethodTable& methods() { return m_methods; }
  // The part that keeps dialogs (see DialogHandler); before start(). Its
  // session layer listens on the stack after start(), behind the
  // front-end's listener.
  void keepDialogs(DialogHandler& dialogs) { m_dialogs = &dialogs; }
  // A second such part, for the dialogs of subscriptions (NOTIFY and
  // SUBSCRIBE with a To tag), asked after the one above; before start().
  void keepSubscriptions(DialogHandler& subscriptions) { m_subscriptions = &subscriptions; }
  // Whether a URI names the gateway itself (see Listeners::names).
  Listeners const& listeners() const { return m_listeners; }
  RequestLog& log() { return m_log; }
  // --source-rate: more than perSecond requests a second from one address
  // are refused (SourceRateLimit); off unless called.
  void limitSourceRate(uint32_t perSecond) { m_rateLimit = std::make_unique<SourceRateLimit>(perSecond); }

  unsigned long requests() const { return m_log.requests(); }
  AnswerCounters const& answers() const { return m_log.answers(); }

  static constexpr uint64_t kShutDownMs = 2000;

  // Answers a request once onRequest has let it through (not an ACK,
  // within the rate limit), in this order: 416 for a sips URI over a plain
  // transport, Admission's answers, then the handler methods has for the
  // method, else 481 for CANCEL (nothing was pending to cancel) and 405
  // with Allow for the rest. Given the parts rather than a front-end, so that the request
  // path can be driven without transports, as the message fuzzer drives it.
  static void route(Exchange& exchange, Admission const& admission, MethodTable const& methods);

 private:
  static bool onRequest(sip_msg const* request, void* frontEnd);
  static void onClosed(void* frontEnd);
  // Gives a UDP socket of the stack its larger buffers (kUdpBufferBytes)
  // the first time a request arrives on it: the stack makes its sockets
  // itself and hands them out only with what they received (sip_msg's
  // sock, a udp_sock for UDP).
  void enlarge(void* udpSocket);

  ScriptSession& m_session;
  LibraryClock& m_clock;
  RequestLog m_log;
  DnsClient m_dns;
  Listeners m_listeners;
  Admission m_admission;
  MethodTable m_methods;
  SecureTransports m_secure;
  sip* m_stack = nullptr;
  sip_lsnr* m_listener = nullptr;
  bool m_closed = false;
  std::vector<void*> m_enlarged;  // the UDP sockets enlarge() has seen
  std::unique_ptr<SourceRateLimit> m_rateLimit;
  DialogHandler* m_dialogs = nullptr;
  DialogHandler* m_subscriptions = nullptr;
};
