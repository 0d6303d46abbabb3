// NonceGenerator: the nonces of the digest challenges, made so that the
// gateway can verify and expire them without storing any. A nonce is a
// stamp, the time it was made (milliseconds of the stack's monotonic clock)
// shifted left by kSerialBits and a serial number of this process in those
// bits (16 hex digits in all), followed by an HMAC-SHA1 over that time, the
// realm, the Call-ID of the request it answers and its source (40 hex
// digits) under a key drawn at random for each process: only this process
// can make one, and a nonce serves only the realm, the registration
// (Call-ID) and the source it was made for, so that a captured response
// cannot be carried over to another phone's registration, and a nonce
// obtained at one address cannot be answered from another. The source is
// the caller's text: the address alone over UDP (a phone's port may move
// between challenge and answer behind a NAT, its address rarely), the
// connection over the others. A nonce
// from before a restart is refused as unknown rather than stale. The serial
// keeps two challenges of one registration within a millisecond apart:
// NonceTable lets a nonce serve once per nonce-count, and a phone answers
// each challenge with count 1.
//
// Lifetime: kLifetimeMs (five minutes), long enough for a phone to answer a
// challenge, short enough that a captured response stops working. An
// authentic nonce past its lifetime is stale, and the phone is challenged
// again with stale=true so that it retries without asking its user.
// Replays within the lifetime are NonceTable's to detect: this part keeps
// no state, so that a challenge costs no memory.
//
// The MAC is computed with one OpenSSL context keyed once and reset for
// each nonce: a one-shot HMAC looks its algorithm up and sets the key anew
// every time, which was a tenth of the gateway's CPU under a registration
// storm. Not thread-safe, as nothing on the event loop needs to be.
#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "sip/Libre.h"

typedef struct evp_mac_ctx_st EVP_MAC_CTX;

class NonceGenerator {
 public:
  static constexpr uint64_t kLifetimeMs = 300 * 1000;

  enum class Check { VALID, STALE, UNKNOWN };

  NonceGenerator();
  // For tests: a fixed key.
  explicit NonceGenerator(std::array<uint8_t, 20> const& key);
  ~NonceGenerator();
  NonceGenerator(NonceGenerator const&) = delete;
  NonceGenerator& operator=(NonceGenerator const&) = delete;

  std::string make(pl const& realm, pl const& callId, std::string const& source, uint64_t nowMs) const;
  Check check(pl const& nonce,
              pl const& realm,
              pl const& callId,
              std::string const& source,
              uint64_t nowMs) const;
  // When an authentic nonce was made, on the clock given to make().
  static uint64_t madeAt(pl const& nonce);

 private:
  std::string signature(uint64_t stamp, pl const& realm, pl const& callId, std::string const& source) const;

  void useKey(std::array<uint8_t, 20> const& key);

  static constexpr unsigned int kSerialBits = 16;

  // Keyed once; EVP_MAC_init without a key resets it for the next MAC.
  mutable EVP_MAC_CTX* m_mac = nullptr;
  mutable uint32_t m_serial = 0;
};
