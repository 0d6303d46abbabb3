// NonceTable: which authentic nonces have been used, and up to which
// nonce-count, so that a captured Authorization cannot be sent again. A
// digest response is bound to the method and the URI, not to the Contact:
// without this table whoever saw one REGISTER could register their own
// Contact with its Authorization for as long as the nonce lives.
//
// Decisions, with their reasons:
// - Only a response whose password matched is entered: a challenge stays
//   stateless (NonceGenerator), so unauthenticated traffic, however much,
//   neither grows nor churns the table.
// - Fixed size, set at construction: buckets of kWays entries chosen by a
//   hash of the nonce. A nonce missing from a full bucket takes the place of
//   the entry made earliest, and the bucket remembers when that entry was
//   made as its floor: a nonce made at or before the floor that the bucket does not
//   hold may have been used already, so it is answered as forgotten
//   (stale=true, the phone retries with a fresh nonce), never accepted.
// - With qop the nonce-count must increase; without qop (count 0) a nonce
//   serves once. The one exception is the same count on the same request
//   again (same fingerprint: the caller's digest of what the request would
//   change, To, CSeq, Contacts, Expires, and of where it came from) within
//   kRetransmissionMs of its first use: a retransmission, which the
//   registrar answers as such and never applies again. A replay that
//   changes any of them, a Contact or the source above all, or that comes
//   later than a client transaction retransmits (64*T1, RFC 3261 section
//   17.1.2.2), is REPLAYED.
//
// Not thread-safe; everything runs on libre's thread.
#pragma once

#include <cstdint>
#include <vector>

#include "sip/Libre.h"

class NonceTable {
 public:
  static constexpr size_t kWays = 4;
  static constexpr uint64_t kRetransmissionMs = 64 * 500;

  enum class Use { FIRST_OR_NEWER, REPEATED, REPLAYED, FORGOTTEN };

  // capacity: entries, rounded up to whole buckets.
  explicit NonceTable(size_t capacity);

  // Records the use of nonce, made as the made-th (NonceGenerator::madeAt(),
  // greater for a later nonce), with count (0 without qop) by
  // the request of fingerprint, at nowMs (a monotonic clock's). Only
  // FIRST_OR_NEWER changes the table.
  Use use(pl const& nonce, uint64_t made, uint32_t count, uint64_t fingerprint, uint64_t nowMs);

 private:
  struct Entry {
    uint64_t key = 0;
    uint64_t made = 0;
    uint64_t fingerprint = 0;
    uint64_t usedMs = 0;  // when count was first used
    uint32_t count = 0;
    bool occupied = false;
  };
  struct Bucket {
    Entry entries[kWays];
    uint64_t floor = 0;  // see the header comment; 0 while nothing was evicted
    bool evicted = false;
  };

  std::vector<Bucket> m_buckets;
};
