// DigestAuthentication: the HTTP digest arithmetic of the registrar (RFC 7616
// as RFC 8760 brings it to SIP): the WWW-Authenticate value of one
// challenge, the Authorization value read with the algorithm it names, and
// whether a response was computed with a given password. The hash functions
// are OpenSSL's, fetched once; the parameters are read by libre. Which
// realms to challenge, which passwords to try and whether a nonce may still
// be used are decided elsewhere (Registrar, NonceGenerator, NonceTable).
//
// Decisions, with their reasons:
// - SHA-256 and MD5 only: the algorithms RFC 8760 names for SIP that phones
//   implement. SHA-512-256 and the "-sess" variants are answered as no
//   credentials (a fresh challenge), never as a wrong password.
// - Without an algorithm parameter a response is MD5, as RFC 7616 says.
// - qop "auth" or none: "auth-int" would need the body, which no REGISTER
//   has a use for. A response without qop is accepted because older phones
//   send one; the nonce table lets its nonce serve only once.
// - The response is compared in full whatever differs first, so that the
//   time taken tells nothing about how much of a guess was right.
//
// Not thread-safe: one context is reused for every hash, on libre's thread.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"

typedef struct evp_md_st EVP_MD;
typedef struct evp_md_ctx_st EVP_MD_CTX;

enum class DigestAlgorithm { SHA256, MD5 };

// An Authorization value as libre reads it, with the algorithm it names.
struct DigestResponse {
  httpauth_digest_resp fields{};
  DigestAlgorithm algorithm = DigestAlgorithm::MD5;
};

// False for a value that is no digest response or names an algorithm other
// than the two above.
bool decodeDigestResponse(pl const& value, DigestResponse& response);

// A comma-separated list of "SHA-256" and "MD5" (any case), as an option
// gives it; false for anything else or an empty list.
bool parseDigestAlgorithms(std::string const& text, std::vector<DigestAlgorithm>& algorithms);

// The value of one WWW-Authenticate header.
std::string digestChallenge(pl const& realm, std::string const& nonce, DigestAlgorithm algorithm, bool stale);

class DigestAuthentication {
 public:
  DigestAuthentication();
  ~DigestAuthentication();
  DigestAuthentication(DigestAuthentication const&) = delete;
  DigestAuthentication& operator=(DigestAuthentication const&) = delete;

  // Whether response, from a request of method, was computed with password.
  // Checks the arithmetic only: that its uri is the request's and its nonce
  // fresh is the caller's to check.
  bool matches(DigestResponse const& response, pl const& method, char const* password) const;

 private:
  // The lower-case hex digest of the pieces joined by ':'.
  std::string hash(DigestAlgorithm algorithm, std::initializer_list<pl> pieces) const;

  EVP_MD* m_md5 = nullptr;
  EVP_MD* m_sha256 = nullptr;
  EVP_MD_CTX* m_context = nullptr;
};
