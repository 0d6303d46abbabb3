// SourceThrottle: counts events per source address (the address only, not
// the port, so that changing ports does not escape it) and holds a source
// that passed its limit within one window for a while. The gateway uses one
// for failed authentications (a held source is refused without asking the
// library) and one for the request rate of --source-rate, as Kamailio's
// pike module does.
//
// Decisions, with their reasons:
// - Fixed size, set at construction: buckets of kWays sources chosen by a
//   hash of the address, so that a flood from many addresses cannot grow
//   it. A new source takes the place of a source not held, the one seen
//   longest ago; only when every source of its bucket is held does it take
//   a held one's place. So a flood of forged addresses can at worst free a
//   held source early; it can never hold a source that sent little.
// - Fixed windows rather than a sliding count: one counter and one time per
//   source, and a source at the limit is held at the latest one window late.
// - count() says HELD_NOW once per hold, so that the caller logs one line
//   per source and period, never one per packet.
//
// Not thread-safe; everything runs on libre's thread.
#pragma once

#include <cstdint>
#include <vector>

#include "sip/Libre.h"

class SourceThrottle {
 public:
  static constexpr size_t kWays = 4;

  enum class Verdict { PASSED, HELD_NOW, HELD };

  // limit events per windowMs pass; the next one holds the source for holdMs.
  SourceThrottle(uint32_t limit, uint64_t windowMs, uint64_t holdMs, size_t capacity);

  // Counts one event; a held source's events are not counted.
  Verdict count(sa const& source, uint64_t nowMs);
  // Whether source is held, without counting.
  bool held(sa const& source, uint64_t nowMs) const;

  uint64_t holdMs() const { return m_holdMs; }

 private:
  struct Entry {
    sa address;
    uint64_t windowStartMs = 0;
    uint64_t heldUntilMs = 0;
    uint32_t events = 0;
    bool occupied = false;
  };
  struct Bucket {
    Entry entries[kWays];
  };

  Bucket& bucketOf(sa const& source);
  Bucket const& bucketOf(sa const& source) const;
  static Entry* find(Bucket& bucket, sa const& source);

  uint32_t const m_limit;
  uint64_t const m_windowMs;
  uint64_t const m_holdMs;
  std::vector<Bucket> m_buckets;
};
