#include "sip/SourceThrottle.h"

SourceThrottle::SourceThrottle(uint32_t limit, uint64_t windowMs, uint64_t holdMs, size_t capacity)
    : m_limit(limit),
      m_windowMs(windowMs),
      m_holdMs(holdMs),
      m_buckets(capacity / kWays + (capacity % kWays != 0 ? 1 : 0)) {
  if (m_buckets.empty())
    m_buckets.resize(1);
}

SourceThrottle::Bucket& SourceThrottle::bucketOf(sa const& source) {
  return m_buckets[sa_hash(&source, SA_ADDR) % m_buckets.size()];
}

SourceThrottle::Bucket const& SourceThrottle::bucketOf(sa const& source) const {
  return m_buckets[sa_hash(&source, SA_ADDR) % m_buckets.size()];
}

SourceThrottle::Entry* SourceThrottle::find(Bucket& bucket, sa const& source) {
  for (Entry& entry : bucket.entries)
    if (entry.occupied && sa_cmp(&entry.address, &source, SA_ADDR))
      return &entry;
  return nullptr;
}

bool SourceThrottle::held(sa const& source, uint64_t nowMs) const {
  Entry const* const entry = find(const_cast<Bucket&>(bucketOf(source)), source);
  return entry && nowMs < entry->heldUntilMs;
}

SourceThrottle::Verdict SourceThrottle::count(sa const& source, uint64_t nowMs) {
  Bucket& bucket = bucketOf(source);
  Entry* entry = find(bucket, source);
  if (!entry) {
    // A free entry, else the one not held seen longest ago, else the held
    // one whose hold ends first.
    entry = &bucket.entries[0];
    auto rank = [nowMs](Entry const& candidate) {
      if (!candidate.occupied)
        return uint64_t{0};
      if (nowMs >= candidate.heldUntilMs)
        return 1 + candidate.windowStartMs / 2;
      return UINT64_MAX / 2 + candidate.heldUntilMs / 2;
    };
    for (Entry& candidate : bucket.entries)
      if (rank(candidate) < rank(*entry))
        entry = &candidate;
    *entry = Entry{};
    entry->address = source;
    entry->occupied = true;
    entry->windowStartMs = nowMs;
  }
  if (nowMs < entry->heldUntilMs)
    return Verdict::HELD;
  if (nowMs - entry->windowStartMs >= m_windowMs) {
    entry->windowStartMs = nowMs;
    entry->events = 0;
  }
  if (++entry->events <= m_limit)
    return Verdict::PASSED;
  entry->heldUntilMs = nowMs + m_holdMs;
  entry->events = 0;
  entry->windowStartMs = entry->heldUntilMs;
  return Verdict::HELD_NOW;
}
