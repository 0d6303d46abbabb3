// Vector<T>: the utility library's growable array. Indices are positions
// from 0; the caller checks them (an index at or past size() is a bug).
#pragma once

#include <cstddef>
#include <utility>
#include <vector>

template <class T>
class Vector {
 public:
  using iterator = typename std::vector<T>::iterator;
  using const_iterator = typename std::vector<T>::const_iterator;

  size_t size() const { return m_items.size(); }
  bool isEmpty() const { return m_items.empty(); }

  T& operator[](size_t index) { return m_items[index]; }
  T const& operator[](size_t index) const { return m_items[index]; }

  void add(T const& item) { m_items.push_back(item); }
  void add(T&& item) { m_items.push_back(std::move(item)); }
  // Inserts before position index; index may equal size() to append.
  void insert(size_t index, T const& item) { m_items.insert(m_items.begin() + index, item); }
  void remove(size_t index) { m_items.erase(m_items.begin() + index); }
  void clear() { m_items.clear(); }

  iterator begin() { return m_items.begin(); }
  iterator end() { return m_items.end(); }
  const_iterator begin() const { return m_items.begin(); }
  const_iterator end() const { return m_items.end(); }

  bool operator==(Vector const& other) const { return m_items == other.m_items; }
  bool operator!=(Vector const& other) const { return m_items != other.m_items; }

 private:
  std::vector<T> m_items;
};
