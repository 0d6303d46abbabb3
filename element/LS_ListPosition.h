// Position rules shared by the configured lists of the model (proxies,
// filter rules, authentication entries): an insert past the end appends, and
// a move stops at the first and the last place.
#pragma once

#include <algorithm>
#include <cstdint>
#include <utility>

#include "Vector.h"

// Inserts entry at min(index, size).
template <class T>
void LS_insertClamped(Vector<T>& list, unsigned int index, T const& entry) {
  list.insert(std::min<size_t>(index, list.size()), entry);
}

// Moves the entry at index by delta places (towards the end when positive),
// stopping at the first and the last place; the entries in between close
// up. False, and nothing moves, when index is not below the size.
template <class T>
bool LS_moveClamped(Vector<T>& list, unsigned int index, int delta) {
  if (index >= list.size())
    return false;
  int64_t const last = static_cast<int64_t>(list.size()) - 1;
  size_t const target =
      static_cast<size_t>(std::clamp<int64_t>(static_cast<int64_t>(index) + delta, 0, last));
  T entry = list[index];
  list.remove(index);
  list.insert(target, entry);
  return true;
}
