// NonceGenerator: the nonces of the digest challenges, made so that the
// gateway can verify and expire them without storing any. A nonce is the
// time it was made (milliseconds of the stack's monotonic clock, 16 hex
// digits) followed by an HMAC-SHA1 over that time and the realm (40 hex
// digits) under a key drawn at random for each process: only this process
// can make one, one realm's nonce does not pass for another's, and a nonce
// from before a restart is refused as unknown rather than stale.
//
// Lifetime: kLifetimeMs (five minutes), long enough for a phone to answer a
// challenge, short enough that a captured response stops working. An
// authentic nonce past its lifetime is stale, and the phone is challenged
// again with stale=true so that it retries without asking its user.
// Replays within the lifetime are not detected: that would need state.
#pragma once

#include <array>
#include <cstdint>
#include <string>

#include "sip/Libre.h"

class NonceGenerator {
 public:
  static constexpr uint64_t kLifetimeMs = 300 * 1000;

  enum class Check { VALID, STALE, UNKNOWN };

  NonceGenerator();
  // For tests: a fixed key.
  explicit NonceGenerator(std::array<uint8_t, 20> const& key) : m_key(key) {}

  std::string make(pl const& realm, uint64_t nowMs) const;
  Check check(pl const& nonce, pl const& realm, uint64_t nowMs) const;

 private:
  std::string signature(uint64_t madeMs, pl const& realm) const;

  std::array<uint8_t, 20> m_key;
};
