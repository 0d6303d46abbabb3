// TrunkKeepAlive: keeps a registered trunk's path to its registrar open
// between registrations, at the outbound-registration face's keep-alive
// interval, and tells the trunk when the registrar can no longer be reached.
//
// Decisions, with their reasons:
// - The face's keep-alive method "none" (what an unconfigured face says)
//   sends nothing: a trunk on an open network needs no keep-alive, and the
//   carrier may count unexpected requests against it. Any other method
//   keeps the path open the one way the transport allows: over a
//   connection (TCP, TLS) a CRLF ping answered by a CRLF pong (RFC 5626
//   section 4.4.1, libre's sip_keepalive), which costs the carrier no
//   transaction; over UDP an OPTIONS request, since a bare datagram is
//   never answered and so could not tell a dead registrar from a live one,
//   and libre's own UDP keep-alive (STUN) is answered by few carriers.
// - The OPTIONS goes to the address the registration's 2xx came from, not
//   to the name resolved anew, since the NAT mapping to keep open is the
//   one to that address. Any answer, even an error, proves the path; only
//   a transaction that times out (32 s on UDP) or a transport error fails
//   it. A ping still pending when the next is due is not doubled.
// - A failure is reported once through the handler, and the keep-alive
//   stops; the trunk registers anew, and a new 2xx starts it again.
//
// Owned by one trunk; start() after each 2xx restarts it for the address
// and connection of that answer. Destroying it or stop() cancels the timer,
// the pending ping and the connection's keep-alive. Everything runs on
// libre's thread; the handler may destroy this object.
#pragma once

#include <string>

#include "LS_KeepAliveMethod.h"
#include "sip/Libre.h"

class TrunkKeepAlive {
 public:
  using FailureHandler = void (*)(int error, void* argument);

  TrunkKeepAlive(sip& stack, FailureHandler onFailure, void* argument)
      : m_stack(stack), m_onFailure(onFailure), m_argument(argument) {
    tmr_init(&m_timer);
  }
  ~TrunkKeepAlive();
  TrunkKeepAlive(TrunkKeepAlive const&) = delete;
  TrunkKeepAlive& operator=(TrunkKeepAlive const&) = delete;

  // response: the registration's 2xx. requestUri and addressOfRecord name
  // the registrar and the trunk in the OPTIONS.
  void start(sip_msg const& response,
             LS_KeepAliveMethod::Type method,
             unsigned int intervalSeconds,
             std::string const& requestUri,
             std::string const& addressOfRecord);
  void stop();

 private:
  void ping();
  void fail(int error);
  static void onTimer(void* keepAlive);
  static void onAnswer(int error, sip_msg const* answer, void* keepAlive);
  static void onConnectionLost(int error, void* keepAlive);

  sip& m_stack;
  FailureHandler m_onFailure;
  void* m_argument;
  tmr m_timer;
  uint64_t m_intervalMs = 0;
  sip_keepalive* m_connection = nullptr;
  struct sip_request* m_pending = nullptr;
  // The registrar's address as a route, "sip:ADDR:PORT;transport=udp", and
  // its parsed form, whose parts point into it.
  std::string m_routeText;
  uri m_route;
  std::string m_requestUri;
  std::string m_addressOfRecord;
  uint32_t m_sequence = 0;
};
