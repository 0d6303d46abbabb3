#include "registrar/NonceGenerator.h"

#include <fcntl.h>
#include <openssl/core_names.h>
#include <openssl/evp.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

constexpr size_t kFieldDigits = 16;
constexpr size_t kFields = 3;  // time, issuer, sequence
constexpr size_t kSignatureDigits = 40;

std::string hex(uint8_t const* bytes, size_t length) {
  static char const digits[] = "0123456789abcdef";
  std::string text;
  text.reserve(2 * length);
  for (size_t i = 0; i < length; ++i) {
    text += digits[bytes[i] >> 4];
    text += digits[bytes[i] & 0xf];
  }
  return text;
}

// The value of exactly kFieldDigits lower-case hex digits, else false.
bool parseField(char const* text, uint64_t& value) {
  value = 0;
  for (size_t i = 0; i < kFieldDigits; ++i) {
    char const c = text[i];
    unsigned int digit;
    if (c >= '0' && c <= '9')
      digit = static_cast<unsigned int>(c - '0');
    else if (c >= 'a' && c <= 'f')
      digit = static_cast<unsigned int>(c - 'a' + 10);
    else
      return false;
    value = (value << 4) | digit;
  }
  return true;
}

uint64_t randomIssuer() {
  uint64_t issuer = 0;
  rand_bytes(reinterpret_cast<uint8_t*>(&issuer), sizeof issuer);
  return issuer;
}

// Makes path with a fresh key unless it exists; false with error when it
// can be neither made nor found.
bool createKeyFile(std::string const& path, std::string& error) {
  int const fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL, S_IRUSR | S_IWUSR);
  if (fd < 0) {
    if (errno == EEXIST)
      return true;
    error = "cannot create the nonce key file " + path + ": " + std::strerror(errno);
    return false;
  }
  uint8_t random[32];
  rand_bytes(random, sizeof random);
  std::string const text = hex(random, sizeof random) + "\n";
  bool const written = ::write(fd, text.data(), text.size()) == static_cast<ssize_t>(text.size());
  bool const closed = ::close(fd) == 0;
  if (written && closed)
    return true;
  ::unlink(path.c_str());
  error = "cannot write the nonce key file " + path;
  return false;
}

}  // namespace

NonceGenerator::NonceGenerator() : m_issuer(randomIssuer()) {
  std::vector<uint8_t> key(20);
  rand_bytes(key.data(), key.size());
  useKey(key);
}

NonceGenerator::NonceGenerator(std::vector<uint8_t> const& key, uint64_t issuer) : m_issuer(issuer) {
  useKey(key);
}

NonceGenerator::~NonceGenerator() {
  EVP_MAC_CTX_free(m_mac);
}

void NonceGenerator::useKey(std::vector<uint8_t> const& key) {
  EVP_MAC_CTX_free(m_mac);
  EVP_MAC* const hmac = EVP_MAC_fetch(nullptr, "HMAC", nullptr);
  m_mac = hmac ? EVP_MAC_CTX_new(hmac) : nullptr;
  EVP_MAC_free(hmac);
  char digest[] = "SHA1";
  OSSL_PARAM const parameters[] = {OSSL_PARAM_construct_utf8_string(OSSL_MAC_PARAM_DIGEST, digest, 0),
                                   OSSL_PARAM_construct_end()};
  // Without its MAC the gateway could neither make nor check a nonce.
  if (!m_mac || !EVP_MAC_init(m_mac, key.data(), key.size(), parameters))
    std::abort();
}

bool NonceGenerator::loadKeyFile(std::string const& path, std::vector<uint8_t>& key, std::string& error) {
  if (!createKeyFile(path, error))
    return false;
  std::FILE* const file = std::fopen(path.c_str(), "rb");
  if (!file) {
    error = "cannot read the nonce key file " + path + ": " + std::strerror(errno);
    return false;
  }
  key.assign(kMaximumKeyBytes + 1, 0);
  size_t const length = std::fread(key.data(), 1, key.size(), file);
  std::fclose(file);
  key.resize(length);
  if (length < kMinimumKeyBytes || length > kMaximumKeyBytes) {
    error = "the nonce key file " + path + " must hold " + std::to_string(kMinimumKeyBytes) + " to " +
            std::to_string(kMaximumKeyBytes) + " bytes";
    return false;
  }
  return true;
}

std::string NonceGenerator::signature(std::string const& fields,
                                      pl const& realm,
                                      pl const& callId,
                                      std::string const& source) const {
  // Each text's length goes first: they may hold any character, and
  // "a:b" + "c" must not sign the same as "a" + "b:c".
  std::string data(fields);
  data += ':' + std::to_string(realm.l) + ':';
  data.append(realm.p, realm.l);
  data += ':' + std::to_string(callId.l) + ':';
  data.append(callId.p, callId.l);
  data += source;
  uint8_t mac[20];
  size_t length = 0;
  if (!EVP_MAC_init(m_mac, nullptr, 0, nullptr) ||
      !EVP_MAC_update(m_mac, reinterpret_cast<uint8_t const*>(data.data()), data.size()) ||
      !EVP_MAC_final(m_mac, mac, &length, sizeof mac) || length != sizeof mac)
    std::abort();
  return fields + hex(mac, sizeof mac);
}

std::string NonceGenerator::make(pl const& realm,
                                 pl const& callId,
                                 std::string const& source,
                                 uint64_t nowMs) const {
  char fields[kFields * kFieldDigits + 1];
  std::snprintf(fields, sizeof fields, "%016llx%016llx%016llx", static_cast<unsigned long long>(nowMs),
                static_cast<unsigned long long>(m_issuer), static_cast<unsigned long long>(++m_sequence));
  return signature(fields, realm, callId, source);
}

NonceGenerator::Check NonceGenerator::check(pl const& nonce,
                                            pl const& realm,
                                            pl const& callId,
                                            std::string const& source,
                                            uint64_t nowMs) const {
  uint64_t madeMs = 0;
  uint64_t issuer = 0;
  uint64_t sequence = 0;
  if (nonce.l != kFields * kFieldDigits + kSignatureDigits || !parseField(nonce.p, madeMs) ||
      !parseField(nonce.p + kFieldDigits, issuer) || !parseField(nonce.p + 2 * kFieldDigits, sequence))
    return Check::UNKNOWN;
  std::string const expected = signature(std::string(nonce.p, kFields * kFieldDigits), realm, callId, source);
  // Compared in full whatever differs first, so the time taken tells
  // nothing about how much of a forged signature was right.
  unsigned char difference = 0;
  for (size_t i = 0; i < expected.size(); ++i)
    difference |= static_cast<unsigned char>(expected[i] ^ nonce.p[i]);
  if (difference != 0)
    return Check::UNKNOWN;
  if (issuer != m_issuer)
    return Check::FOREIGN;
  if (madeMs > nowMs + kSkewMs || (madeMs < nowMs && nowMs - madeMs > kLifetimeMs))
    return Check::STALE;
  return Check::VALID;
}

uint64_t NonceGenerator::madeAt(pl const& nonce) {
  uint64_t sequence = 0;
  if (nonce.l >= kFields * kFieldDigits)
    parseField(nonce.p + 2 * kFieldDigits, sequence);
  return sequence;
}
