#include "registrar/NonceGenerator.h"

#include <openssl/core_names.h>
#include <openssl/evp.h>

#include <cstdio>
#include <cstdlib>

namespace {

constexpr size_t kTimeDigits = 16;
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

// The value of exactly kTimeDigits lower-case hex digits, else false.
bool parseTime(char const* text, uint64_t& value) {
  value = 0;
  for (size_t i = 0; i < kTimeDigits; ++i) {
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

}  // namespace

NonceGenerator::NonceGenerator() {
  std::array<uint8_t, 20> key;
  rand_bytes(key.data(), key.size());
  useKey(key);
}

NonceGenerator::NonceGenerator(std::array<uint8_t, 20> const& key) {
  useKey(key);
}

NonceGenerator::~NonceGenerator() {
  EVP_MAC_CTX_free(m_mac);
}

void NonceGenerator::useKey(std::array<uint8_t, 20> const& key) {
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

std::string NonceGenerator::signature(uint64_t stamp,
                                      pl const& realm,
                                      pl const& callId,
                                      std::string const& source) const {
  char time[kTimeDigits + 1];
  std::snprintf(time, sizeof time, "%016llx", static_cast<unsigned long long>(stamp));
  // Each text's length goes first: they may hold any character, and
  // "a:b" + "c" must not sign the same as "a" + "b:c".
  std::string data(time);
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
  return time + hex(mac, sizeof mac);
}

std::string NonceGenerator::make(pl const& realm,
                                 pl const& callId,
                                 std::string const& source,
                                 uint64_t nowMs) const {
  ++m_serial;
  return signature((nowMs << kSerialBits) | (m_serial & ((1u << kSerialBits) - 1)), realm, callId, source);
}

NonceGenerator::Check NonceGenerator::check(pl const& nonce,
                                            pl const& realm,
                                            pl const& callId,
                                            std::string const& source,
                                            uint64_t nowMs) const {
  uint64_t stamp = 0;
  if (nonce.l != kTimeDigits + kSignatureDigits || !parseTime(nonce.p, stamp))
    return Check::UNKNOWN;
  uint64_t const madeMs = stamp >> kSerialBits;
  std::string const expected = signature(stamp, realm, callId, source);
  // Compared in full whatever differs first, so the time taken tells
  // nothing about how much of a forged signature was right.
  unsigned char difference = 0;
  for (size_t i = 0; i < expected.size(); ++i)
    difference |= static_cast<unsigned char>(expected[i] ^ nonce.p[i]);
  if (difference != 0 || madeMs > nowMs)
    return Check::UNKNOWN;
  return nowMs - madeMs > kLifetimeMs ? Check::STALE : Check::VALID;
}

uint64_t NonceGenerator::madeAt(pl const& nonce) {
  uint64_t stamp = 0;
  if (nonce.l >= kTimeDigits)
    parseTime(nonce.p, stamp);
  return stamp >> kSerialBits;
}
