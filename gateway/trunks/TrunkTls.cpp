#include "trunks/TrunkTls.h"

#include <openssl/ssl.h>
#include <openssl/x509.h>
#include <openssl/x509_vfy.h>
#include <openssl/x509v3.h>

#include <algorithm>
#include <iostream>

// libre declares its OpenSSL context accessor only for builds that define
// USE_OPENSSL, which its pkg-config file does not; Debian builds libre on
// OpenSSL, and the function is exported.
extern "C" SSL_CTX* tls_openssl_context(const struct tls* tls);

namespace {

// The index of the SSL_CTX's application data: the TrunkTls it belongs to.
int ownerIndex() {
  static int const index = SSL_CTX_get_ex_new_index(0, nullptr, nullptr, nullptr, nullptr);
  return index;
}

}  // namespace

TrunkTls::~TrunkTls() {
  mem_deref(m_tls);
}

bool TrunkTls::names(X509* certificate) const {
  for (std::string const& host : m_hosts) {
    sa ip;
    bool const matched = sa_set_str(&ip, host.c_str(), 0) == 0
                             ? X509_check_ip_asc(certificate, host.c_str(), 0) == 1
                             : X509_check_host(certificate, host.data(), host.size(), 0, nullptr) == 1;
    if (matched)
      return true;
  }
  return false;
}

// OpenSSL's verdict on one certificate of a chain, and at the carrier's own
// certificate (depth 0) its name. Connections this transport accepts (a
// phone's) are not judged: the carrier is.
int TrunkTls::onVerify(int verified, X509_STORE_CTX* store) {
  SSL* const ssl = static_cast<SSL*>(X509_STORE_CTX_get_ex_data(store, SSL_get_ex_data_X509_STORE_CTX_idx()));
  if (!ssl || SSL_is_server(ssl))
    return 1;
  X509* const certificate = X509_STORE_CTX_get_current_cert(store);
  char const* reason = nullptr;
  if (!verified) {
    reason = X509_verify_cert_error_string(X509_STORE_CTX_get_error(store));
  } else if (X509_STORE_CTX_get_error_depth(store) == 0) {
    auto const* owner = static_cast<TrunkTls const*>(SSL_CTX_get_ex_data(SSL_get_SSL_CTX(ssl), ownerIndex()));
    if (!owner || !certificate || !owner->names(certificate))
      reason = "it names none of the TLS trunks' hosts";
  }
  if (!reason)
    return 1;
  char subject[256] = "?";
  if (certificate)
    X509_NAME_oneline(X509_get_subject_name(certificate), subject, sizeof subject);
  std::cerr << "location-gateway: TLS certificate " << subject << " refused: " << reason << std::endl;
  return 0;
}

bool TrunkTls::verify(sip& stack, std::string const& host, std::string const& caFile, std::string& error) {
  if (std::find(m_hosts.begin(), m_hosts.end(), host) == m_hosts.end())
    m_hosts.push_back(host);
  if (m_tls)
    return true;
  // Connections would go out through a TLS transport made before, which
  // verifies nothing.
  sa local;
  if (sip_transp_laddr(&stack, &local, SIP_TRANSP_TLS, nullptr) == 0) {
    error = "the phones' TLS transport came first; TLS trunks added now register after a restart";
    return false;
  }
  if (sip_transp_laddr(&stack, &local, SIP_TRANSP_UDP, nullptr) != 0 ||
      tls_alloc(&m_tls, TLS_METHOD_SSLV23, nullptr, nullptr) != 0) {
    error = "no TLS context";
    return false;
  }
  SSL_CTX* const context = tls_openssl_context(m_tls);
  bool const trusted = caFile.empty() ? SSL_CTX_set_default_verify_paths(context) == 1
                                      : SSL_CTX_load_verify_locations(context, caFile.c_str(), nullptr) == 1;
  if (!trusted) {
    error = "cannot read the CA certificates " + (caFile.empty() ? std::string("of the system") : caFile);
    m_tls = static_cast<tls*>(mem_deref(m_tls));
    return false;
  }
  SSL_CTX_set_ex_data(context, ownerIndex(), this);
  SSL_CTX_set_verify(context, SSL_VERIFY_PEER, onVerify);
  sa_set_port(&local, 0);
  if (sip_transp_add(&stack, SIP_TRANSP_TLS, &local, m_tls) != 0) {
    error = "cannot add the trunks' TLS transport";
    m_tls = static_cast<tls*>(mem_deref(m_tls));
    return false;
  }
  return true;
}
