// StringHashTable<T>: a table keyed by exact String (bytes, case-sensitive)
// that lists its entries in insertion order.
//
// add() never replaces: a key that is present keeps its entry. Lookups are
// hashed; the bucket count given at construction is a sizing hint only.
#pragma once

#include <cstddef>
#include <iterator>
#include <list>
#include <string_view>
#include <unordered_map>

#include "String.h"

template <class T>
class StringHashTable {
 public:
  struct Entry {
    String key;
    T value;
  };
  using const_iterator = typename std::list<Entry>::const_iterator;

  explicit StringHashTable(unsigned int buckets = 32) { m_index.reserve(buckets); }
  StringHashTable(StringHashTable const&) = delete;
  StringHashTable& operator=(StringHashTable const&) = delete;

  size_t size() const { return m_entries.size(); }
  bool isEmpty() const { return m_entries.empty(); }

  // Appends key -> value; false, and nothing changes, when key is present.
  bool add(String const& key, T const& value) {
    if (contains(key))
      return false;
    m_entries.push_back(Entry{key, value});
    auto const last = std::prev(m_entries.end());
    m_index.emplace(std::string_view(last->key.str()), last);
    return true;
  }

  // The value under key, or null.
  T* get(String const& key) {
    auto const found = m_index.find(std::string_view(key.str()));
    return found == m_index.end() ? nullptr : &found->second->value;
  }
  T const* get(String const& key) const { return const_cast<StringHashTable*>(this)->get(key); }

  bool contains(String const& key) const { return m_index.count(std::string_view(key.str())) != 0; }

  // Removes the entry of key; false when there is none.
  bool remove(String const& key) {
    auto const found = m_index.find(std::string_view(key.str()));
    if (found == m_index.end())
      return false;
    auto const entry = found->second;
    m_index.erase(found);
    m_entries.erase(entry);
    return true;
  }

  void clear() {
    m_index.clear();
    m_entries.clear();
  }

  // Entries in insertion order.
  const_iterator begin() const { return m_entries.begin(); }
  const_iterator end() const { return m_entries.end(); }

 private:
  // List nodes never move, so the index can view the keys they hold.
  std::list<Entry> m_entries;
  std::unordered_map<std::string_view, typename std::list<Entry>::iterator> m_index;
};
