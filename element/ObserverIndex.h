// ObserverIndex<O, Position>: the registrations of a long observer list by
// observer, so that ObserverContainer finds them without walking the list.
//
// An open-addressing table of (observer, position) slots with linear probing
// and backward-shift deletion. A group's value may carry a hundred thousand
// observers; a lookup here touches one slot run, and growing moves one flat
// array, where a node-based hash table would chase a scattered node per entry
// on every insertion, lookup and rehash. An observer may be present several
// times (one slot per registration). A null observer marks an empty slot and
// is never indexed.
//
// Threading: none; it belongs to one ObserverContainer.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

template <class O, class Position>
class ObserverIndex {
 public:
  explicit ObserverIndex(size_t expected) {
    size_t capacity = kInitialCapacity;
    while (!roomy(expected, capacity))
      capacity *= 2;
    resize(capacity);
  }

  void add(O* observer, Position position) {
    if (!roomy(m_count + 1, m_slots.size()))
      regrow(m_slots.size() * 2);
    size_t slot = home(observer);
    while (m_slots[slot].observer)
      slot = next(slot);
    m_slots[slot] = Slot{observer, position};
    ++m_count;
  }

  // Removes the slot of this observer and position, if there is one.
  void remove(O* observer, Position position) {
    for (size_t slot = home(observer); m_slots[slot].observer; slot = next(slot)) {
      if (m_slots[slot].observer == observer && m_slots[slot].position == position) {
        erase(slot);
        return;
      }
    }
  }

  // Calls visit(position) for every registration of observer, in no
  // particular order.
  template <class Visit>
  void forEach(O* observer, Visit const& visit) const {
    for (size_t slot = home(observer); m_slots[slot].observer; slot = next(slot)) {
      if (m_slots[slot].observer == observer)
        visit(m_slots[slot].position);
    }
  }

 private:
  struct Slot {
    O* observer = nullptr;  // null: empty
    Position position{};
  };

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
  void erase(size_t slot) {
    size_t hole = slot;
    for (size_t later = next(hole); m_slots[later].observer; later = next(later)) {
      size_t const wanted = home(m_slots[later].observer);
      // Movable when its home does not lie in the circular range (hole, later].
      bool const homeAfterHole = hole <= later ? (hole < wanted && wanted <= later) : (hole < wanted || wanted <= later);
      if (homeAfterHole)
        continue;
      m_slots[hole] = m_slots[later];
      hole = later;
    }
    m_slots[hole] = Slot{};
    --m_count;
  }

  void resize(size_t capacity) {
    m_slots.assign(capacity, Slot{});
    m_shift = 64;
    for (size_t slots = capacity; slots > 1; slots /= 2)
      --m_shift;
  }

  void regrow(size_t capacity) {
    std::vector<Slot> old;
    old.swap(m_slots);
    resize(capacity);
    m_count = 0;
    for (Slot const& slot : old) {
      if (slot.observer)
        add(slot.observer, slot.position);
    }
  }

  std::vector<Slot> m_slots;  // a power of two of them
  unsigned int m_shift = 64;  // 64 - log2(capacity): keeps the hash's top bits
  size_t m_count = 0;
};
