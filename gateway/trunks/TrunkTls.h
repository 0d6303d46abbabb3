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
// - Made when the first TLS trunk registers, at start or when the control
//   socket adds one later; the CA certificates are read then. When --tls
//   made the phones' transport first, a TLS trunk the control socket adds
//   later does not register (until a restart) rather than go out through a
//   transport that verifies nothing.
// - One context serves every trunk, so the name is checked in the verify
//   callback against the hosts of all TLS trunks: with several carriers,
//   each one's name is accepted for all of them (each chain still has to
//   verify). libre offers no hook per connection.
//
// Owned by TrunkRegistrations; the stack keeps its own reference to the
// context. Everything runs on libre's thread.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"

typedef struct x509_st X509;
typedef struct x509_store_ctx_st X509_STORE_CTX;

class TrunkTls {
 public:
  TrunkTls() = default;
  ~TrunkTls();
  TrunkTls(TrunkTls const&) = delete;
  TrunkTls& operator=(TrunkTls const&) = delete;

  // Makes sure the stack has the verifying transport (on the address of its
  // UDP transport) and that a certificate for host is accepted; caFile
  // empty: the system's store. False with the reason in error.
  bool verify(sip& stack, std::string const& host, std::string const& caFile, std::string& error);

 private:
  static int onVerify(int verified, X509_STORE_CTX* store);
  bool names(X509* certificate) const;

  tls* m_tls = nullptr;
  std::vector<std::string> m_hosts;
};
