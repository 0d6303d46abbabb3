#include "registrar/DigestAuthentication.h"

#include <openssl/evp.h>

#include <cstdlib>

namespace {

constexpr size_t kMaximumHashSize = 32;

// The value of the algorithm parameter, read as libre reads the others
// (quotes taken off); unset when there is none.
pl algorithmOf(pl const& value) {
  pl rest = value;
  pl name;
  pl parameter;
  while (re_regex(rest.p, rest.l, "[ \t\r\n,]+[a-z]+[ \t\r\n]*=[ \t\r\n]*[~ \t\r\n,]*", nullptr, &name,
                  nullptr, nullptr, &parameter) == 0) {
    pl_advance(&rest, static_cast<ssize_t>(parameter.p + parameter.l - rest.p));
    if (pl_strcasecmp(&name, "algorithm") == 0)
      return parameter;
  }
  return pl{};
}

}  // namespace

bool decodeDigestResponse(pl const& value, DigestResponse& response) {
  response = DigestResponse{};
  if (httpauth_digest_response_decode(&response.fields, &value) != 0)
    return false;
  pl const algorithm = algorithmOf(value);
  if (!pl_isset(&algorithm) || pl_strcasecmp(&algorithm, "MD5") == 0)
    response.algorithm = DigestAlgorithm::MD5;
  else if (pl_strcasecmp(&algorithm, "SHA-256") == 0)
    response.algorithm = DigestAlgorithm::SHA256;
  else
    return false;
  return true;
}

bool parseDigestAlgorithms(std::string const& text, std::vector<DigestAlgorithm>& algorithms) {
  algorithms.clear();
  size_t start = 0;
  while (start <= text.size()) {
    size_t end = text.find(',', start);
    if (end == std::string::npos)
      end = text.size();
    pl const name = {text.c_str() + start, end - start};
    if (pl_strcasecmp(&name, "SHA-256") == 0)
      algorithms.push_back(DigestAlgorithm::SHA256);
    else if (pl_strcasecmp(&name, "MD5") == 0)
      algorithms.push_back(DigestAlgorithm::MD5);
    else
      return false;
    start = end + 1;
  }
  return !algorithms.empty();
}

std::string digestChallenge(pl const& realm,
                            std::string const& nonce,
                            DigestAlgorithm algorithm,
                            bool stale) {
  std::string value = "Digest realm=\"";
  value.append(realm.p, realm.l);
  value += "\", nonce=\"" + nonce + "\", algorithm=";
  value += algorithm == DigestAlgorithm::SHA256 ? "SHA-256" : "MD5";
  value += ", qop=\"auth\"";
  if (stale)
    value += ", stale=true";
  return value;
}

DigestAuthentication::DigestAuthentication()
    : m_md5(EVP_MD_fetch(nullptr, "MD5", nullptr)),
      m_sha256(EVP_MD_fetch(nullptr, "SHA2-256", nullptr)),
      m_context(EVP_MD_CTX_new()) {
  // Without its hashes the registrar could authenticate nobody.
  if (!m_md5 || !m_sha256 || !m_context)
    std::abort();
}

DigestAuthentication::~DigestAuthentication() {
  EVP_MD_CTX_free(m_context);
  EVP_MD_free(m_sha256);
  EVP_MD_free(m_md5);
}

std::string DigestAuthentication::hash(DigestAlgorithm algorithm, std::initializer_list<pl> pieces) const {
  uint8_t digest[kMaximumHashSize];
  unsigned int length = 0;
  bool ok = EVP_DigestInit_ex(m_context, algorithm == DigestAlgorithm::SHA256 ? m_sha256 : m_md5, nullptr);
  bool first = true;
  for (pl const& piece : pieces) {
    if (!first)
      ok = ok && EVP_DigestUpdate(m_context, ":", 1);
    first = false;
    ok = ok && EVP_DigestUpdate(m_context, piece.p, piece.l);
  }
  ok = ok && EVP_DigestFinal_ex(m_context, digest, &length);
  if (!ok || length > sizeof digest)
    std::abort();
  static char const digits[] = "0123456789abcdef";
  std::string text(2 * length, '0');
  for (unsigned int i = 0; i < length; ++i) {
    text[2 * i] = digits[digest[i] >> 4];
    text[2 * i + 1] = digits[digest[i] & 0xf];
  }
  return text;
}

bool DigestAuthentication::matches(DigestResponse const& response,
                                   pl const& method,
                                   char const* password) const {
  httpauth_digest_resp const& fields = response.fields;
  bool const withQop = pl_isset(&fields.qop);
  if (withQop && pl_strcasecmp(&fields.qop, "auth") != 0)
    return false;
  pl secret;
  pl_set_str(&secret, password);
  std::string const ha1 = hash(response.algorithm, {fields.username, fields.realm, secret});
  std::string const ha2 = hash(response.algorithm, {method, fields.uri});
  pl ha1Text;
  pl ha2Text;
  pl_set_str(&ha1Text, ha1.c_str());
  pl_set_str(&ha2Text, ha2.c_str());
  std::string const expected =
      withQop
          ? hash(response.algorithm, {ha1Text, fields.nonce, fields.nc, fields.cnonce, fields.qop, ha2Text})
          : hash(response.algorithm, {ha1Text, fields.nonce, ha2Text});
  if (fields.response.l != expected.size())
    return false;
  unsigned char difference = 0;
  for (size_t i = 0; i < expected.size(); ++i)
    difference |= static_cast<unsigned char>(expected[i] ^ (fields.response.p[i] | 0x20));
  return difference == 0;
}
