// SecureTransports: the transports beside UDP and TCP: SIP over TLS
// (--tls), and SIP over WebSocket (--ws) and secure WebSocket (--wss) with
// the "sip" subprotocol of RFC 7118, for browser phones. The TLS is libre's,
// on OpenSSL; the WebSocket is libre's too. One server certificate and key
// (--certificate, --key, PEM) serve both TLS and WSS.
//
// Decisions, with their reasons:
// - libre's secure WebSocket server reads its certificate and key from one
//   PEM file. With a separate key file the two are joined into a file of
//   mode 0600 in a directory of its own that lives only while the stack
//   reads it.
// - WebSocket is refused on a libre older than 4.8.1 unless the operator
//   insists (allowVulnerableWebSocket, --allow-vulnerable-websocket): before
//   it, libre's WebSocket frame decoder overflows the heap on a frame whose
//   64-bit length wraps (CVE-2026-50161), which any peer can send before it
//   authenticates; Debian 12's libre 1.1.0 crashes on it. Those versions
//   also leave the "sip" subprotocol out of their 101, which browsers
//   require, so only non-browser WebSocket clients work with them anyway.
// - A request whose Request-URI or To is a sips: URI over a transport that
//   is not secure (UDP, TCP, WS) is refused with 416, as RFC 3261 section
//   26.2.2 asks of a server that cannot forward it securely: the phone asked
//   for TLS on every hop, and this hop has none.
//
// Owned by the SipFrontEnd; the stack holds its own references to what it
// was given, so that this object may die before the stack.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"

struct SecureTransportOptions {
  std::string tls;  // ADDR:PORT, or empty for none; the same for ws and wss
  std::string ws;
  std::string wss;
  std::string certificate;  // PEM files
  std::string key;          // may be empty when certificate holds the key too
  bool allowVulnerableWebSocket = false;
};

class SecureTransports {
 public:
  SecureTransports() = default;
  ~SecureTransports();
  SecureTransports(SecureTransports const&) = delete;
  SecureTransports& operator=(SecureTransports const&) = delete;

  // Adds what options ask for to stack; "tls:ADDR:PORT" and so on for each
  // bound one in bound, else an error text.
  bool add(sip& stack,
           SecureTransportOptions const& options,
           std::vector<std::string>& bound,
           std::string& error);

  // Whether this process's libre has the WebSocket decoder fixed.
  static bool webSocketFixed();

  // Whether the request's Request-URI or To is a sips: URI and it came over
  // a transport that is not secure; such a request gets 416.
  static bool sipsOverPlainTransport(sip_msg const& request);

 private:
  tls* m_tls = nullptr;
};
