// SipFrontEnd: the SIP side of the gateway on libre: the stack with its
// transports, the listener that hands each request to the part that answers
// it (Admission first, for what the gateway answers itself; then Registrar
// for REGISTER, Redirector for requests to a user, 405 with Allow for the
// rest), and the trunk registrations. Malformed messages never reach it: libre drops what it
// cannot parse, and every length read here is bounded by the parts.
//
// Built after the scripts have run; every address listened on joins the
// stack settings' local host-ports, and the stack resolves names through
// its DnsClient. Owned by main; shutDown() unregisters the
// trunks and closes the stack within a bounded time, after which the object
// may die.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "ScriptSession.h"
#include "control/ModelChanges.h"
#include "metrics/GatewayStatistics.h"
#include "redirect/Redirector.h"
#include "registrar/ExpiryRange.h"
#include "registrar/Registrar.h"
#include "sip/Admission.h"
#include "sip/DnsClient.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/Listeners.h"
#include "sip/RequestLog.h"
#include "sip/SecureTransports.h"
#include "sip/SourceRateLimit.h"
#include "trunks/TrunkRegistrations.h"

class SipFrontEnd {
 public:
  SipFrontEnd(ScriptSession& session, LibraryClock& clock)
      : m_session(session),
        m_clock(clock),
        m_registrar(clock),
        m_admission(m_listeners, m_redirector.sources()) {}
  ~SipFrontEnd();
  SipFrontEnd(SipFrontEnd const&) = delete;
  SipFrontEnd& operator=(SipFrontEnd const&) = delete;

  struct Settings {
    // "ADDR:PORT" each, UDP and TCP on each (see Listeners).
    std::vector<std::string> listen;
    // "ADDR:PORT" each; empty for the system's (see DnsClient).
    std::vector<std::string> dnsServers;
    // The registrar's lifetimes for faces that give none.
    ExpiryRange expiry;
    // OPTIONS to NATed UDP bindings every so many seconds (NatPinger); 0
    // for none.
    uint32_t natPingSeconds = 0;
  };

  // False with an error text when a DNS server, a listen address or the
  // stack is refused.
  bool start(Settings const& settings, std::string& error);
  // What start() opened: "udp:ADDR:PORT tcp:ADDR:PORT ...".
  std::string listening() const { return m_listeners.describe(); }
  std::vector<std::string> const& dnsServers() const { return m_dns.servers(); }
  // After start(): TLS, WebSocket and secure WebSocket as options ask, each
  // bound one as "tls:ADDR:PORT" (and so on) in bound, else an error text.
  bool startSecure(SecureTransportOptions const& options,
                   std::vector<std::string>& bound,
                   std::string& error) {
    return m_secure.add(*m_stack, options, bound, error);
  }
  // Unregisters the trunks and lets the stack finish, at most kShutDownMs.
  void shutDown();

  unsigned long requests() const { return m_log.requests(); }
  Registrar& registrar() { return m_registrar; }
  Redirector& redirector() { return m_redirector; }
  // --ca-file: what a TLS trunk's carrier is verified against; before start().
  void trustForTrunks(std::string const& caFile) { m_caFile = caFile; }
  // --source-rate: more than perSecond requests a second from one address
  // are refused (SourceRateLimit); off unless called.
  void limitSourceRate(uint32_t perSecond) { m_rateLimit = std::make_unique<SourceRateLimit>(perSecond); }

  // Makes the gateway ready for changes while it serves (--control): from
  // then on it observes every identity, which a gateway never changed
  // need not pay for. Around each change (a control line), beginChange()
  // and endChange(): the registrar drops the bindings of identities it
  // removed, the trunks follow.
  void followChanges();
  void beginChange();
  void endChange();
  GatewayStatistics statistics() const;
  Registrar const& registrar() const { return m_registrar; }

  static constexpr uint64_t kShutDownMs = 2000;

  // Answers a request by the part it is for (see above), once onRequest has
  // let it through (not an ACK, within the rate limit). Given the parts
  // rather than a front-end, so that the request path can be driven
  // without transports, as the message fuzzer drives it.
  static void route(Exchange& exchange,
                    Admission const& admission,
                    Registrar& registrar,
                    Redirector& redirector);

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
  Registrar m_registrar;
  Redirector m_redirector;
  DnsClient m_dns;
  Listeners m_listeners;
  Admission m_admission;
  SecureTransports m_secure;
  sip* m_stack = nullptr;
  sip_lsnr* m_listener = nullptr;
  std::unique_ptr<TrunkRegistrations> m_trunks;
  std::unique_ptr<ModelChanges> m_changes;
  std::vector<void*> m_enlarged;  // the UDP sockets enlarge() has seen
  std::unique_ptr<SourceRateLimit> m_rateLimit;
  std::string m_caFile;
};
