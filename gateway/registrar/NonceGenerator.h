// NonceGenerator: the nonces of the digest challenges, made so that the
// gateway can verify and expire them without storing any. A nonce is three
// fields of 16 hex digits, the time it was made (milliseconds of the wall
// clock), its issuer (a number drawn at random for each process) and a
// sequence number of that process, followed by an HMAC-SHA1 over them, the
// realm, the Call-ID of the request it answers and its source (40 hex
// digits). The key is drawn at random for each process, or read from a
// file that the gateways of a cluster share (loadKeyFile()): only a holder
// of the key can make one, and a nonce serves only the realm, the
// registration (Call-ID) and the source it was made for, so that a captured
// response cannot be carried over to another phone's registration, and a
// nonce obtained at one address cannot be answered from another. The
// source is the caller's text: the address alone over UDP (a phone's port
// may move between challenge and answer behind a NAT, its address rarely),
// the connection over the others.
//
// Decisions, with their reasons:
// - A nonce authentic under the key but from another issuer (the other
//   gateway of a cluster a phone failed over to, or this gateway before a
//   restart) is FOREIGN, which the Authenticator answers with stale=true,
//   never with acceptance: only its issuer's table of used nonces can vouch
//   that it was not used already, and that table is not shared. A phone
//   told stale=true retries with the fresh nonce at once; one told nothing
//   (a plain 401) takes its credentials for wrong, as libre-based clients
//   do. A nonce that is not authentic at all is UNKNOWN, a plain challenge.
// - The time is the wall clock's, passed in by the caller, so that it
//   means the same on every gateway and across a restart. A nonce's own
//   gateway allows kSkewMs for its clock stepping back; beyond that, or
//   past kLifetimeMs, an authentic nonce is STALE. The table's order
//   (madeAt()) is the sequence, not the time, so that a clock step cannot
//   make a fresh nonce look older than one the table forgot.
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

#include <cstdint>
#include <string>
#include <vector>

#include "sip/Libre.h"

typedef struct evp_mac_ctx_st EVP_MAC_CTX;

class NonceGenerator {
 public:
  static constexpr uint64_t kLifetimeMs = 300 * 1000;
  static constexpr uint64_t kSkewMs = 5 * 1000;
  // A key file's size: 128 bits written in hex at least.
  static constexpr size_t kMinimumKeyBytes = 32;
  static constexpr size_t kMaximumKeyBytes = 1024;

  enum class Check { VALID, STALE, FOREIGN, UNKNOWN };

  // A key and an issuer drawn at random.
  NonceGenerator();
  // For tests: a fixed key and issuer.
  NonceGenerator(std::vector<uint8_t> const& key, uint64_t issuer);
  ~NonceGenerator();
  NonceGenerator(NonceGenerator const&) = delete;
  NonceGenerator& operator=(NonceGenerator const&) = delete;

  // Replaces the key; nonces made before no longer check. The issuer stays.
  void useKey(std::vector<uint8_t> const& key);
  // The key in path, every byte of it (kMinimumKeyBytes to kMaximumKeyBytes).
  // A missing file is created first, readable by its owner only, with 64
  // random hex digits, so that the first gateway of a cluster to start
  // makes the key the others read. False, with error, otherwise.
  static bool loadKeyFile(std::string const& path, std::vector<uint8_t>& key, std::string& error);

  // nowMs: the wall clock, in milliseconds since 1970.
  std::string make(pl const& realm, pl const& callId, std::string const& source, uint64_t nowMs) const;
  Check check(pl const& nonce,
              pl const& realm,
              pl const& callId,
              std::string const& source,
              uint64_t nowMs) const;
  // Where an authentic nonce of this issuer stands among those it made:
  // later ones are greater.
  static uint64_t madeAt(pl const& nonce);

 private:
  std::string signature(std::string const& fields,
                        pl const& realm,
                        pl const& callId,
                        std::string const& source) const;

  uint64_t m_issuer = 0;
  // Keyed once; EVP_MAC_init without a key resets it for the next MAC.
  mutable EVP_MAC_CTX* m_mac = nullptr;
  mutable uint64_t m_sequence = 0;
};
