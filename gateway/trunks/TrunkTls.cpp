#include "trunks/TrunkTls.h"

#include <openssl/ssl.h>
#include <openssl/x509.h>
#include <openssl/x509_vfy.h>

#include <iostream>

// libre declares its OpenSSL context accessor only for builds that define
// USE_OPENSSL, which its pkg-config file does not; Debian builds libre on
// OpenSSL, and the function is exported.
extern "C" SSL_CTX* tls_openssl_context(const struct tls* tls);

namespace {

// OpenSSL's verdict on one certificate of a chain. Connections this
// transport accepts (a phone's) are not judged: the carrier is.
int onVerify(int verified, X509_STORE_CTX* store) {
  SSL* const ssl = static_cast<SSL*>(X509_STORE_CTX_get_ex_data(store, SSL_get_ex_data_X509_STORE_CTX_idx()));
  if (ssl && SSL_is_server(ssl))
    return 1;
  if (verified)
    return 1;
  char subject[256] = "?";
  if (X509* const certificate = X509_STORE_CTX_get_current_cert(store))
    X509_NAME_oneline(X509_get_subject_name(certificate), subject, sizeof subject);
  std::cerr << "location-gateway: TLS certificate " << subject
            << " refused: " << X509_verify_cert_error_string(X509_STORE_CTX_get_error(store)) << std::endl;
  return 0;
}

}  // namespace

TrunkTls::~TrunkTls() {
  mem_deref(m_tls);
}

bool TrunkTls::add(sip& stack,
                   sa const& address,
                   std::string const& caFile,
                   std::vector<std::string> const& hosts,
                   std::string& error) {
  if (tls_alloc(&m_tls, TLS_METHOD_SSLV23, nullptr, nullptr) != 0) {
    error = "no TLS context";
    return false;
  }
  SSL_CTX* const context = tls_openssl_context(m_tls);
  bool const trusted = caFile.empty() ? SSL_CTX_set_default_verify_paths(context) == 1
                                      : SSL_CTX_load_verify_locations(context, caFile.c_str(), nullptr) == 1;
  if (!trusted) {
    error = "cannot read the CA certificates " + (caFile.empty() ? std::string("of the system") : caFile);
    return false;
  }
  X509_VERIFY_PARAM* const parameters = SSL_CTX_get0_param(context);
  for (std::string const& host : hosts) {
    sa ip;
    bool const added = sa_set_str(&ip, host.c_str(), 0) == 0
                           ? X509_VERIFY_PARAM_set1_ip_asc(parameters, host.c_str()) == 1
                           : X509_VERIFY_PARAM_add1_host(parameters, host.c_str(), host.size()) == 1;
    if (!added) {
      error = "cannot verify TLS against " + host;
      return false;
    }
  }
  SSL_CTX_set_verify(context, SSL_VERIFY_PEER, onVerify);
  sa local = address;
  sa_set_port(&local, 0);
  int const result = sip_transp_add(&stack, SIP_TRANSP_TLS, &local, m_tls);
  if (result != 0) {
    error = "cannot add the trunks' TLS transport";
    return false;
  }
  return true;
}
