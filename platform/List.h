// List<T>: the utility library's doubly linked list. Positions stay valid
// while other entries are inserted or removed, which is what lets a list be
// walked while the walk itself adds entries.
#pragma once

#include <cstddef>
#include <list>
#include <utility>

template <class T>
class List {
 public:
  using iterator = typename std::list<T>::iterator;
  using const_iterator = typename std::list<T>::const_iterator;

  size_t size() const { return m_items.size(); }
  bool isEmpty() const { return m_items.empty(); }

  void add(T item) { m_items.push_back(std::move(item)); }
  // Inserts before position; end() appends. Returns the new entry's position.
  iterator insert(iterator position, T item) { return m_items.insert(position, std::move(item)); }
  // Returns the position after the removed entry.
  iterator remove(iterator position) { return m_items.erase(position); }
  void clear() { m_items.clear(); }

  iterator begin() { return m_items.begin(); }
  iterator end() { return m_items.end(); }
  const_iterator begin() const { return m_items.begin(); }
  const_iterator end() const { return m_items.end(); }

 private:
  std::list<T> m_items;
};
