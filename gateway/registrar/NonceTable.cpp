#include "registrar/NonceTable.h"

namespace {

// FNV-1a, 64 bits on every platform: two nonces sharing a key would make
// the second look like a replay of the first.
uint64_t keyOf(pl const& nonce) {
  uint64_t hash = 14695981039346656037ull;
  for (size_t i = 0; i < nonce.l; ++i) {
    hash ^= static_cast<unsigned char>(nonce.p[i]);
    hash *= 1099511628211ull;
  }
  return hash;
}

}  // namespace

NonceTable::NonceTable(size_t capacity) : m_buckets(capacity / kWays + (capacity % kWays != 0 ? 1 : 0)) {
  if (m_buckets.empty())
    m_buckets.resize(1);
}

NonceTable::Use NonceTable::use(pl const& nonce,
                                uint64_t made,
                                uint32_t count,
                                uint64_t fingerprint,
                                uint64_t nowMs) {
  uint64_t const key = keyOf(nonce);
  Bucket& bucket = m_buckets[static_cast<size_t>(key % m_buckets.size())];
  // A free entry, else the one made earliest.
  Entry* victim = &bucket.entries[0];
  for (Entry& entry : bucket.entries) {
    if (entry.occupied && entry.key == key) {
      if (count == entry.count && fingerprint == entry.fingerprint &&
          nowMs - entry.usedMs <= kRetransmissionMs)
        return Use::REPEATED;
      if (count <= entry.count)
        return Use::REPLAYED;
      entry.count = count;
      entry.fingerprint = fingerprint;
      entry.usedMs = nowMs;
      return Use::FIRST_OR_NEWER;
    }
    if (victim->occupied && (!entry.occupied || entry.made < victim->made))
      victim = &entry;
  }
  if (bucket.evicted && made <= bucket.floor)
    return Use::FORGOTTEN;
  if (victim->occupied) {
    bucket.floor = bucket.evicted && bucket.floor > victim->made ? bucket.floor : victim->made;
    bucket.evicted = true;
  }
  victim->key = key;
  victim->made = made;
  victim->count = count;
  victim->fingerprint = fingerprint;
  victim->usedMs = nowMs;
  victim->occupied = true;
  return Use::FIRST_OR_NEWER;
}
