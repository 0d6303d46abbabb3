// LS_ElementTable: the children of one container under their names, in the
// order they joined the table; and LS_ElementName, the counted name text
// that tables share.
//
// Why not a StringHashTable: a derived identity holds a table of shadows in
// itself and in each of its faces, so a gateway keeps hundreds of thousands
// of these tables, nearly all with a handful of entries. A hashed table
// spends a bucket array, a list node and a map node per entry and a copy of
// every name; here an entry is two pointers in one array. A shadow takes its
// name from the entry of its base container (see sharedNameOf), so a name is
// stored once per inheritance chain, not once per member; an empty table
// costs one pointer. Tables past
// kIndexedFrom entries keep an open-addressing index of entry positions by
// name hash, so that large containers still find a name without a walk.
//
// Not here: what the entries mean (local child or shadow), which is the
// container's business.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <new>
#include <string_view>

#include "LS_IElement.h"
#include "String.h"

// An immutable name text with a count of the tables that use it.
class LS_ElementName {
 public:
  LS_ElementName() = default;
  explicit LS_ElementName(String const& text) : m_text(new Text(text)) {}
  LS_ElementName(LS_ElementName const& other) : m_text(other.m_text) {
    if (m_text)
      m_text->refs.fetch_add(1, std::memory_order_relaxed);
  }
  LS_ElementName(LS_ElementName&& other) noexcept : m_text(other.m_text) { other.m_text = nullptr; }
  LS_ElementName& operator=(LS_ElementName other) noexcept {
    std::swap(m_text, other.m_text);
    return *this;
  }
  ~LS_ElementName() {
    if (m_text && m_text->refs.fetch_sub(1, std::memory_order_acq_rel) == 1)
      delete m_text;
  }

  String const& text() const { return m_text ? m_text->text : String::s_empty; }
  // The hash that the index files the name under, computed once per text.
  size_t hash() const { return m_text ? m_text->hash : 0; }
  bool equals(String const& other, size_t otherHash) const {
    return m_text && m_text->hash == otherHash && m_text->text == other;
  }

  static size_t hashOf(String const& text) { return std::hash<std::string_view>()(text.str()); }

 private:
  struct Text {
    explicit Text(String const& value) : text(value), hash(hashOf(value)) {}
    std::atomic<unsigned int> refs{1};
    String const text;
    size_t const hash;
  };
  Text* m_text = nullptr;
};

class LS_ElementTable {
 public:
  struct Entry {
    LS_ElementName name;
    RefPtr<LS_IElement> value;
    String const& key() const { return name.text(); }
  };
  using const_iterator = Entry const*;

  // Tables with more entries than this keep an index.
  static constexpr size_t kIndexedFrom = 16;

  LS_ElementTable() = default;
  LS_ElementTable(LS_ElementTable const&) = delete;
  LS_ElementTable& operator=(LS_ElementTable const&) = delete;
  ~LS_ElementTable() { release(m_block); }

  size_t size() const { return m_block ? m_block->size : 0; }
  // Room for count entries in all without growing, where the count is
  // known ahead.
  void reserve(size_t count) {
    if (count > capacity())
      moveTo(count);
  }

  RefPtr<LS_IElement>* get(String const& key) {
    Entry* const entry = find(key);
    return entry ? &entry->value : nullptr;
  }
  RefPtr<LS_IElement> const* get(String const& key) const { return const_cast<LS_ElementTable*>(this)->get(key); }
  bool contains(String const& key) const { return get(key) != nullptr; }
  // The name object of key, for a table that is to share it; null when
  // absent.
  LS_ElementName const* nameOf(String const& key) const {
    Entry const* const entry = const_cast<LS_ElementTable*>(this)->find(key);
    return entry ? &entry->name : nullptr;
  }

  // Appends; the caller makes sure the name is not present.
  void add(LS_ElementName name, LS_IElement* value) {
    if (size() == capacity())
      moveTo(capacity() ? capacity() * 2 : 1);
    new (m_block->entries() + m_block->size) Entry{std::move(name), RefPtr<LS_IElement>(value)};
    ++m_block->size;
    if (m_block->index())
      indexEntry(m_block->size - 1);
    else if (m_block->size > kIndexedFrom)
      rebuildIndex();
  }

  // Moves the entry of key out into value, and its name object into name
  // when given; false when absent. Later entries keep their order.
  bool take(String const& key, RefPtr<LS_IElement>& value, LS_ElementName* name = nullptr) {
    Entry* const entry = find(key);
    if (!entry)
      return false;
    value = std::move(entry->value);
    if (name)
      *name = std::move(entry->name);
    for (Entry* later = entry + 1; later != m_block->end(); ++later)
      later[-1] = std::move(*later);
    m_block->end()[-1].~Entry();
    if (--m_block->size == 0) {
      release(m_block);
      m_block = nullptr;
      return true;
    }
    rebuildIndex();
    return true;
  }

  const_iterator begin() const { return m_block ? m_block->entries() : nullptr; }
  const_iterator end() const { return m_block ? m_block->end() : nullptr; }

 private:
  static constexpr std::uint32_t kEmpty = 0;  // index slots hold position + 1

  // The entries follow the header in the same allocation; an empty table
  // has none. A block with room for more than kIndexedFrom entries, and
  // only such a block, has one more word after its entries, for the index:
  // the few-entry tables that derived identities hold by the hundred
  // thousand never need one.
  struct Block {
    unsigned int size;
    unsigned int capacity;

    static size_t bytesFor(size_t capacity) {
      return sizeof(Block) + capacity * sizeof(Entry) +
             (capacity > kIndexedFrom ? sizeof(std::uint32_t*) : 0);
    }
    Entry* entries() { return reinterpret_cast<Entry*>(this + 1); }
    Entry* end() { return entries() + size; }
    // Open addressing over entry positions: slot 0 holds the mask, the
    // slots after it position + 1 or kEmpty. Null for a short table.
    std::uint32_t* index() { return capacity > kIndexedFrom ? *indexWord() : nullptr; }
    // Only a block with the word may be given a non-null index.
    void setIndex(std::uint32_t* index) {
      if (capacity > kIndexedFrom)
        new (indexWord()) std::uint32_t*(index);
    }

   private:
    std::uint32_t** indexWord() { return reinterpret_cast<std::uint32_t**>(entries() + capacity); }
  };
  static_assert(sizeof(Block) % alignof(Entry) == 0, "entries follow the header");
  static_assert(alignof(Entry) % alignof(std::uint32_t*) == 0, "the index word follows the entries");

  static void release(Block* block) {
    if (!block)
      return;
    for (Entry* entry = block->entries(); entry != block->end(); ++entry)
      entry->~Entry();
    delete[] block->index();
    ::operator delete(block);
  }

  size_t capacity() const { return m_block ? m_block->capacity : 0; }

  // Moves the entries to a block of room for capacity.
  void moveTo(size_t capacity) {
    void* const memory = ::operator new(Block::bytesFor(capacity));
    Block* const moved = new (memory) Block{0, static_cast<unsigned int>(capacity)};
    moved->setIndex(nullptr);
    if (m_block) {
      for (Entry* entry = m_block->entries(); entry != m_block->end(); ++entry)
        new (moved->entries() + moved->size++) Entry{std::move(*entry)};
      // Tables only grow, so a block with an index moves to one with room
      // for it.
      moved->setIndex(m_block->index());
      m_block->setIndex(nullptr);
      release(m_block);
    }
    m_block = moved;
  }

  Entry* find(String const& key) {
    if (!m_block)
      return nullptr;
    size_t const hash = LS_ElementName::hashOf(key);
    std::uint32_t const* const index = m_block->index();
    if (!index) {
      for (Entry* entry = m_block->entries(); entry != m_block->end(); ++entry) {
        if (entry->name.equals(key, hash))
          return entry;
      }
      return nullptr;
    }
    std::uint32_t const mask = index[0];
    for (size_t slot = hash & mask; index[slot + 1] != kEmpty; slot = (slot + 1) & mask) {
      Entry* const entry = m_block->entries() + (index[slot + 1] - 1);
      if (entry->name.equals(key, hash))
        return entry;
    }
    return nullptr;
  }

  void indexEntry(size_t position) {
    std::uint32_t* const index = m_block->index();
    std::uint32_t const mask = index[0];
    if (m_block->size * 4 > (size_t{mask} + 1) * 3) {
      rebuildIndex();
      return;
    }
    size_t slot = m_block->entries()[position].name.hash() & mask;
    while (index[slot + 1] != kEmpty)
      slot = (slot + 1) & mask;
    index[slot + 1] = static_cast<std::uint32_t>(position + 1);
  }

  // Short tables drop their index; long ones file every entry anew, at most
  // three quarters full.
  void rebuildIndex() {
    delete[] m_block->index();
    m_block->setIndex(nullptr);
    if (m_block->size <= kIndexedFrom)
      return;
    size_t slots = 32;
    while (m_block->size * 4 > slots * 3)
      slots *= 2;
    std::uint32_t* const index = new std::uint32_t[slots + 1]();
    index[0] = static_cast<std::uint32_t>(slots - 1);
    m_block->setIndex(index);
    for (size_t position = 0; position < m_block->size; ++position)
      indexEntry(position);
  }

  Block* m_block = nullptr;
};
