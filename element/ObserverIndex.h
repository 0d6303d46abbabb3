// ObserverIndex<O>: the registrations of a long observer list by observer,
// so that ObserverContainer finds them without walking the list.
//
// An open-addressing table of entry positions with linear probing and
// backward-shift deletion. A group's value may carry a hundred thousand
// observers; a lookup here touches one slot run, and growing moves one flat
// array, where a node-based hash table would chase a scattered node per entry
// on every insertion, lookup and rehash. A slot holds only a position in the
// container's entry array: the observer filed there is read from the entry
// itself (through the keyOf function every operation is given), which keeps
// a slot at four bytes. An observer may be present several times (one slot
// per registration); a null observer is never indexed.
//
// Threading: none; it belongs to one ObserverContainer.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

template <class O>
class ObserverIndex {
 public:
  explicit ObserverIndex(size_t expected) {
    size_t capacity = kInitialCapacity;
    while (!roomy(expected, capacity))
      capacity *= 2;
    resize(capacity);
  }

  // keyOf(position) yields the observer of the entry at position; it must
  // answer for every position filed, this one included.
  template <class KeyOf>
  void add(O* observer, std::uint32_t position, KeyOf const& keyOf) {
    if (!roomy(m_count + 1, m_slots.size()))
      regrow(m_slots.size() * 2, keyOf);
    size_t slot = home(observer);
    while (m_slots[slot] != kEmpty)
      slot = next(slot);
    m_slots[slot] = position + 1;
    ++m_count;
  }

  // Removes the slot of this observer and position, if there is one.
  template <class KeyOf>
  void remove(O* observer, std::uint32_t position, KeyOf const& keyOf) {
    for (size_t slot = home(observer); m_slots[slot] != kEmpty; slot = next(slot)) {
      if (m_slots[slot] == position + 1) {
        erase(slot, keyOf);
        return;
      }
    }
  }

  // Follows an insertion into the entry array at position: every entry
  // filed at that position or later has moved up by one. Keys are unchanged,
  // so nothing is rehashed.
  void shiftFrom(std::uint32_t position) {
    for (std::uint32_t& slot : m_slots) {
      if (slot != kEmpty && slot - 1 >= position)
        ++slot;
    }
  }

  // Calls visit(position) for every registration of observer, in no
  // particular order.
  template <class KeyOf, class Visit>
  void forEach(O* observer, KeyOf const& keyOf, Visit const& visit) const {
    for (size_t slot = home(observer); m_slots[slot] != kEmpty; slot = next(slot)) {
      std::uint32_t const position = m_slots[slot] - 1;
      if (keyOf(position) == observer)
        visit(position);
    }
  }

 private:
  static constexpr std::uint32_t kEmpty = 0;  // slots hold position + 1
  static constexpr size_t kInitialCapacity = 32;  // a power of two

  // At most three quarters full, so that probe runs stay short.
  static bool roomy(size_t count, size_t capacity) { return count * 4 <= capacity * 3; }

  // Fibonacci hashing: the top bits of the address times 2^64 / phi. Objects
  // of one size allocated one after another have evenly spaced addresses,
  // which this spreads evenly; the low bits of such addresses say little.
  size_t home(O* observer) const {
    std::uint64_t const address = reinterpret_cast<std::uintptr_t>(observer);
    return static_cast<size_t>((address * 0x9E3779B97F4A7C15ull) >> m_shift);
  }
  size_t next(size_t slot) const { return (slot + 1) & (m_slots.size() - 1); }

  // Empties slot and moves later members of its probe run back, so that no
  // run is ever broken by a hole.
  template <class KeyOf>
  void erase(size_t slot, KeyOf const& keyOf) {
    size_t hole = slot;
    for (size_t later = next(hole); m_slots[later] != kEmpty; later = next(later)) {
      size_t const wanted = home(keyOf(m_slots[later] - 1));
      // Movable when its home does not lie in the circular range (hole, later].
      bool const homeAfterHole = hole <= later ? (hole < wanted && wanted <= later) : (hole < wanted || wanted <= later);
      if (homeAfterHole)
        continue;
      m_slots[hole] = m_slots[later];
      hole = later;
    }
    m_slots[hole] = kEmpty;
    --m_count;
  }

  void resize(size_t capacity) {
    m_slots.assign(capacity, kEmpty);
    m_shift = 64;
    for (size_t slots = capacity; slots > 1; slots /= 2)
      --m_shift;
  }

  template <class KeyOf>
  void regrow(size_t capacity, KeyOf const& keyOf) {
    std::vector<std::uint32_t> old;
    old.swap(m_slots);
    resize(capacity);
    m_count = 0;
    for (std::uint32_t const slot : old) {
      if (slot != kEmpty)
        add(keyOf(slot - 1), slot - 1, keyOf);
    }
  }

  std::vector<std::uint32_t> m_slots;  // a power of two of them
  unsigned int m_shift = 64;  // 64 - log2(capacity): keeps the hash's top bits
  size_t m_count = 0;
};
