// TrunkTls: the TLS the gateway's own registrations use towards a carrier
// whose registrar is a sips: URI or a TLS registrar of the face. libre (up
// to at least 1.1.0) accepts any certificate on the connections it opens,
// so this part gives those connections a TLS context of their own that
// verifies the carrier: its chain against the system's CA store, or against
// --ca-file when one is given, and its name (DNS name or IP address)
// against the host the trunk connects to. A certificate that does not
// verify fails the handshake, and so the registration; the reason goes to
// standard error, one line per refused certificate.
//
// Decisions, with their reasons:
// - libre takes the first TLS transport of the stack for the connections it
//   opens, so this one is added before the one that serves phones (--tls),
//   which keeps its own context and asks phones for no certificate. It
//   listens on the gateway's address at a free port; a phone that finds it
//   is asked for a certificate and served whatever it sends.
// - One context serves every trunk: with several TLS carriers each of
//   their names is accepted for all of them (each chain still has to
//   verify). libre offers no hook per connection.
//
// Owned by TrunkRegistrations; the stack keeps its own reference to the
// context. Everything runs on libre's thread.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"

class TrunkTls {
 public:
  TrunkTls() = default;
  ~TrunkTls();
  TrunkTls(TrunkTls const&) = delete;
  TrunkTls& operator=(TrunkTls const&) = delete;

  // Adds the transport on address's host; hosts: the names a carrier's
  // certificate may carry. caFile empty: the system's store.
  bool add(sip& stack,
           sa const& address,
           std::string const& caFile,
           std::vector<std::string> const& hosts,
           std::string& error);

 private:
  tls* m_tls = nullptr;
};
