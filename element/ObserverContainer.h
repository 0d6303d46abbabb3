// ObserverContainer<S, O>: the observers of one subject, in notification
// order: ascending priority, and the most recent registration first among
// equal priorities.
//
// Re-entrancy: a handler may register or unregister observers, itself
// included, while a broadcast runs. An entry unregistered then is only marked
// (its target cleared, a delegate dropped) and skipped; it is unlinked by the
// housekeeping that ends the outermost broadcast. Outside broadcasts it is
// unlinked at once. An entry registered during a broadcast is linked at once
// and is reached if it lies ahead of the current one.
//
// Layout: the entries lie in one array in the reverse of notification order,
// so that the registration the library always makes (priority 0, notified
// first) is an append, and a broadcast walks the array from its end. Every
// running broadcast keeps its cursor in a frame on its own stack, chained
// from the array's header; an entry inserted below a cursor moves that
// cursor up with the entries it displaced, which is what keeps an insertion
// ahead of the current entry reachable. The subject itself holds one
// word: null while nobody is registered, and the observer itself while the
// only registration is a bare observer of priority 0, which is what nearly
// every element carries (its container watching it). Such a list has no
// array at all; a broadcast spreads it into an array of one on its own stack
// and folds it back when it ends, so that handlers meet the same array as
// anywhere else, and a registration made meanwhile moves the array to the
// heap as any growth does.
//
// Cost: a group's value is watched by every member that inherits it, so one
// subject may carry tens of thousands of observers. Registering and
// unregistering must not walk such a list. A list past kIndexedFrom entries
// finds an observer through an index of its live bare observers by observer;
// shorter lists are walked, which costs less than hashing and keeps the many
// subjects with one or two observers small. The index is built at the first
// lookup of an observer (an unregistration) and kept up to date from then on:
// loading a configuration registers every member of a group with each of the
// group's thirty-odd subjects and unregisters none, and an index made
// meanwhile would cost every member some 7 bytes in each of those lists.
// Building it walks the list once, which the registrations that made the list
// have paid for. A long list does not close the gap an unregistered entry
// leaves at once: the entry stays as a tombstone, and the array is compacted
// (and any index rebuilt) once tombstones make up half of it, so that every
// operation stays constant in amortised time. That holds for registrations of
// the lowest priority yet registered (the library's are all 0): one of a
// higher priority goes below them in the array and moves them up, a cost that
// grows with the list.
//
// Memory: the library registers bare observers (addObserver(O*, priority)),
// and the delegate it would make for each of them is reachable by nobody
// but this container: nobody can stop it or register it again. Such an
// entry therefore holds the observer itself, which notifies exactly as its
// private delegate would, and saves the delegate's allocation on each of the
// millions of registrations a large gateway holds. Delegates registered by
// a caller are kept as such, counted, and stay out of the index: a stopped
// delegate no longer names its observer, so the rare lists holding any
// (tests of the delegate contract) are walked when an observer is looked
// up.
//
// Threading: not synchronised; one thread at a time, under the owner's lock.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <new>
#include <optional>

#include "ObserverDelegate.h"
#include "ObserverIndex.h"
#include "RefPtr.h"

template <class S, class O>
class ObserverContainer {
 public:
  using Delegate = ObserverDelegate<S, O>;
  using Handler = void (O::*)(ObserverEvent<S>&);

  // Lists with more entries than this keep an index.
  static constexpr unsigned int kIndexedFrom = 16;

  ObserverContainer() = default;
  ObserverContainer(ObserverContainer const&) = delete;
  ObserverContainer& operator=(ObserverContainer const&) = delete;
  // Observers are not told: a subject that goes away announces it first.
  ~ObserverContainer() {
    if (!m_word || single())
      return;
    for (Entry& entry : *block())
      entry.drop();
    release(block());
  }

  // Registers delegate, taking a reference on it. Registering the very same
  // delegate again only counts the registration up. A null delegate would
  // notify nobody and is not registered.
  void addObserver(Delegate* delegate, unsigned int priority, bool flag) {
    doHousekeeping();
    if (!delegate)
      return;
    if (Entry* const registered = entryHolding(delegate)) {
      ++registered->registered()->count;
      return;
    }
    delegate->addRef();
    link(Entry::ofDelegate(delegate, flag), priority);
  }

  // The registration every subject of the library offers: observer, notified
  // as a delegate of its own owned by this container alone would notify it.
  void addObserver(O* observer, unsigned int priority) {
    if (!observer) {
      // Notifies nobody, yet counts as a registration that
      // removeObserver(nullptr) undoes: only a delegate can stand for it.
      RefPtr<Delegate> const nobody = adoptRef(new Delegate(nullptr));
      addObserver(nobody.get(), priority, true);
      return;
    }
    static_assert(alignof(O) >= 4, "the low two bits of an observer's address are free");
    doHousekeeping();
    if (!m_word && priority == 0) {
      m_word = Entry::ofObserver(observer) | kSingle;
      return;
    }
    link(Entry::ofObserver(observer), priority);
  }

  // Undoes one registration of observer, the first in notification order;
  // unknown observers are ignored. A delegate is released, not stopped.
  void removeObserver(O* observer) {
    if (single()) {
      // No broadcast runs on a single registration (see broadcastEvent).
      if (single() == observer)
        m_word = 0;
      return;
    }
    Entry* const registration = firstRegistrationOf(observer);
    if (registration && registration->undoOneRegistration())
      retire(registration);
    doHousekeeping();
  }

  // Hands each live observer its own clone of event.
  void broadcastEvent(ObserverEvent<S> const& event, Handler handler) {
    if (!m_word)
      return;
    // A single registration is spread into an array of one on this stack
    // for the broadcast, so that handlers meet the array they always meet,
    // and folded back afterwards.
    OnStack local;
    if (O* const observer = single()) {
      local.header = Block{nullptr, nullptr, 1, 1 | kOnStack};
      local.entry = Entry{Entry::ofObserver(observer), 0};
      setBlock(&local.header);
    }
    Broadcast frame{block()->size, block()->broadcasts};
    block()->broadcasts = &frame;
    while (frame.cursor > 0) {
      --frame.cursor;
      // Handlers may move the array: read it afresh for every entry.
      Entry const entry = block()->at(frame.cursor);
      if (!entry.live())
        continue;
      std::unique_ptr<ObserverEvent<S>> const copy = event.clone();
      if (!copy)
        continue;
      if (!entry.isDelegate()) {
        (entry.observer()->*handler)(*copy);
        continue;
      }
      // The handler may unregister this very entry; the delegate must
      // outlive its own call.
      RefPtr<Delegate> const delegate = entry.delegate();
      delegate->notifyEvent(handler, *copy);
    }
    block()->broadcasts = frame.outer;
    if (block() == &local.header) {
      // Nothing could be added without moving the array to the heap, so the
      // entry is still the single observer, alive or unregistered.
      m_word = local.entry.live() ? local.entry.target | kSingle : 0;
      return;
    }
    doHousekeeping();
  }

  // Unlinks the entries marked dead, unless a broadcast is running.
  void doHousekeeping() {
    if (!m_word || single() || block()->broadcasts)
      return;
    Long* const extra = block()->extra;
    if (!extra) {
      if (holdsDeadEntries())
        compact();
      return;
    }
    if (extra->pending == 0)
      return;
    extra->pending = 0;
    if (extra->tombstones * 2 >= block()->size)
      compact();
  }

  // No registration at all: a subject checks this before building an event
  // that nobody would receive (a group's change is told to every member).
  bool isEmpty() const { return !m_word; }

  // Registrations still linked, dead ones awaiting housekeeping included.
  unsigned int getSize() const {
    if (!m_word)
      return 0;
    if (single())
      return 1;
    Long const* const extra = block()->extra;
    return block()->size - (extra ? extra->tombstones - extra->pending : 0);
  }

 private:
  // What a delegate's registration holds beyond its priority, kept out of
  // the array: only callers register delegates, and rarely, while a bare
  // observer's registration always counts 1 and was made with the flag set,
  // so that its entry needs no room for either.
  struct Registered {
    Delegate* delegate;  // holds a counted reference
    int count;  // registrations of this delegate; at least 1 while linked
    bool flag;  // stored as registered; nothing in the library reads it
  };

  // Two words: on 32-bit targets, where a group's value holds one entry for
  // every member, a third word for the count and flag cost each member four
  // bytes in each of the group's lists.
  struct Entry {
    // A bare observer, or its Registered record with the low bit set; 0
    // once unregistered, which is what marks the entry dead.
    std::uintptr_t target;
    unsigned int priority;

    static std::uintptr_t ofDelegate(Delegate* delegate, bool flag) {
      return reinterpret_cast<std::uintptr_t>(new Registered{delegate, 1, flag}) | 1u;
    }
    static std::uintptr_t ofObserver(O* observer) { return reinterpret_cast<std::uintptr_t>(observer); }

    bool live() const { return target != 0; }
    bool isDelegate() const { return (target & 1u) != 0; }
    Registered* registered() const {
      return isDelegate() ? reinterpret_cast<Registered*>(target & ~std::uintptr_t{1}) : nullptr;
    }
    Delegate* delegate() const { return isDelegate() ? registered()->delegate : nullptr; }
    // A bare observer (null for a delegate entry).
    O* observer() const { return isDelegate() ? nullptr : reinterpret_cast<O*>(target); }
    // Whom the entry notifies now: a stopped delegate notifies nobody.
    O* notified() const { return isDelegate() ? delegate()->getObserver() : observer(); }
    // Counts one registration down; true when it was the last.
    bool undoOneRegistration() { return !isDelegate() || --registered()->count <= 0; }
    // Ends the entry's hold on its delegate.
    void drop() {
      if (Registered* const held = registered()) {
        held->delegate->release();
        delete held;
      }
      target = 0;
    }
  };

  // A running broadcast: the position of the entry being notified.
  struct Broadcast {
    unsigned int cursor;
    Broadcast* outer;
  };

  // What only a long list keeps. A short one holds dead entries only until
  // the next housekeeping, so it needs no count of them.
  struct Long {
    // Live bare observers by observer; absent until an observer is first
    // looked up (see Cost).
    std::optional<ObserverIndex<O>> index;
    size_t liveDelegates = 0;  // while any, observers are found by walking
    unsigned int tombstones = 0;  // dead entries still in the array
    unsigned int pending = 0;  // of those, retired since the last housekeeping
  };

  // The header of the entry array, which follows it in the same allocation.
  struct Block {
    Broadcast* broadcasts;  // innermost running broadcast, or null
    Long* extra;  // owned; while the list has more than kIndexedFrom entries
    unsigned int size;
    unsigned int capacity;

    Entry* entries() { return reinterpret_cast<Entry*>(this + 1); }
    Entry& at(unsigned int position) { return entries()[position]; }
    Entry* begin() { return entries(); }
    Entry* end() { return entries() + size; }
  };
  static_assert(sizeof(Block) % alignof(Entry) == 0, "entries follow the header");

  static constexpr std::uintptr_t kSingle = 2;
  // Marks the capacity of an array that lives on a broadcast's stack.
  static constexpr unsigned int kOnStack = 1u << 31;

  struct OnStack {
    Block header;
    Entry entry;
  };
  static_assert(sizeof(Block) % alignof(Entry) == 0 && offsetof(OnStack, entry) == sizeof(Block),
                "the entry follows the header as in an array");

  O* single() const { return (m_word & kSingle) ? reinterpret_cast<O*>(m_word & ~kSingle) : nullptr; }
  Block* block() const { return reinterpret_cast<Block*>(m_word); }
  void setBlock(Block* block) { m_word = reinterpret_cast<std::uintptr_t>(block); }

  // Turns a single registration into an array of one.
  void spread() {
    O* const observer = single();
    if (!observer)
      return;
    Block* const spread = allocate(2);
    spread->at(0) = Entry{Entry::ofObserver(observer), 0};
    spread->size = 1;
    setBlock(spread);
  }

  static Block* allocate(unsigned int capacity) {
    void* const memory = ::operator new(sizeof(Block) + capacity * sizeof(Entry));
    Block* const block = new (memory) Block{nullptr, nullptr, 0, capacity};
    return block;
  }
  static void release(Block* block) {
    delete block->extra;
    ::operator delete(block);
  }

  // The observer the index files the entry at a position under.
  auto keyOf() const {
    Block* const array = block();
    return [array](unsigned int position) { return array->at(position).observer(); };
  }

  unsigned int positionOf(Entry const* entry) const { return static_cast<unsigned int>(entry - block()->entries()); }

  // The live entry of delegate, or null.
  Entry* entryHolding(Delegate* delegate) {
    if (!m_word || single())
      return nullptr;
    for (Entry& entry : *block()) {
      if (entry.delegate() == delegate)
        return &entry;
    }
    return nullptr;
  }

  // The live entry that notifies observer and comes first in notification
  // order (the last in the array), or null.
  Entry* firstRegistrationOf(O* observer) {
    if (!block())
      return nullptr;
    auto const notifies = [observer](Entry const& entry) { return entry.target && entry.notified() == observer; };
    Long* const extra = block()->extra;
    if (!extra || !observer || extra->liveDelegates) {
      for (unsigned int position = block()->size; position > 0; --position) {
        if (notifies(block()->at(position - 1)))
          return &block()->at(position - 1);
      }
      return nullptr;
    }
    if (!extra->index)
      reindex();
    Entry* first = nullptr;
    extra->index->forEach(observer, keyOf(), [&](unsigned int position) {
      Entry& candidate = block()->at(position);
      if (notifies(candidate) && (!first || first < &candidate))
        first = &candidate;
    });
    return first;
  }

  // In the array, after every entry of priority or higher (they are notified
  // before it), in front of the first of a lower priority.
  unsigned int insertionPoint(unsigned int priority) const {
    unsigned int low = 0;
    unsigned int high = block()->size;
    while (low < high) {
      unsigned int const middle = low + (high - low) / 2;
      if (block()->at(middle).priority >= priority)
        low = middle + 1;
      else
        high = middle;
    }
    return low;
  }

  void link(std::uintptr_t target, unsigned int priority) {
    spread();
    if (!block())
      setBlock(allocate(1));
    else if (block()->size == (block()->capacity & ~kOnStack))
      grow();
    unsigned int const position = insertionPoint(priority);
    Entry* const at = &block()->at(position);
    std::memmove(static_cast<void*>(at + 1), at, (block()->size - position) * sizeof(Entry));
    *at = Entry{target, priority};
    ++block()->size;
    for (Broadcast* running = block()->broadcasts; running; running = running->outer) {
      if (position <= running->cursor)
        ++running->cursor;
    }
    Long* const extra = block()->extra;
    if (!extra) {
      if (block()->size > kIndexedFrom)
        becomeLong();
      return;
    }
    if (at->isDelegate())
      ++extra->liveDelegates;
    if (!extra->index)
      return;
    if (position + 1 != block()->size)
      extra->index->shiftFrom(position);
    if (at->observer())
      extra->index->add(at->observer(), position, keyOf());
  }

  // Makes the array half as large again; the header, running broadcasts'
  // chain included, moves with it. Half, not double: a group's value holds
  // an entry for every member, so the room a growth leaves empty is paid by
  // every member, up to a whole entry each after doubling and half of one
  // now, for a copy more of each entry over the list's growth.
  void grow() {
    bool const onStack = (block()->capacity & kOnStack) != 0;
    unsigned int const capacity = block()->capacity & ~kOnStack;
    Block* const larger = allocate(capacity + (capacity + 1) / 2);
    unsigned int const largerCapacity = larger->capacity;
    std::memcpy(static_cast<void*>(larger), block(), sizeof(Block) + block()->size * sizeof(Entry));
    larger->capacity = largerCapacity;
    if (!onStack)
      ::operator delete(block());
    setBlock(larger);
  }

  void becomeLong() {
    block()->extra = new Long;
    for (Entry const& entry : *block()) {
      if (!entry.live())
        ++block()->extra->tombstones;
      else if (entry.isDelegate())
        ++block()->extra->liveDelegates;
    }
    block()->extra->pending = block()->extra->tombstones;
  }

  // Files every live bare observer of a long list anew.
  void reindex() {
    Long* const extra = block()->extra;
    extra->index.emplace(block()->size - extra->tombstones);
    for (unsigned int position = 0; position < block()->size; ++position) {
      Entry const& entry = block()->at(position);
      if (entry.live() && entry.observer())
        extra->index->add(entry.observer(), position, keyOf());
    }
  }

  bool holdsDeadEntries() {
    for (Entry const& entry : *block()) {
      if (!entry.live())
        return true;
    }
    return false;
  }

  // Ends the entry whose last registration was undone. It stays in the
  // array as a tombstone until housekeeping: at once outside broadcasts for
  // a short list, when tombstones fill half of a long one.
  void retire(Entry* entry) {
    if (Long* const extra = block()->extra) {
      if (entry->isDelegate())
        --extra->liveDelegates;
      else if (entry->observer() && extra->index)
        extra->index->remove(entry->observer(), positionOf(entry), keyOf());
      ++extra->tombstones;
      ++extra->pending;
    }
    entry->drop();
  }

  // Closes every gap; frees the array once nothing is left in it.
  void compact() {
    Entry* kept = block()->begin();
    for (Entry const& entry : *block()) {
      if (entry.live())
        *kept++ = entry;
    }
    block()->size = static_cast<unsigned int>(kept - block()->begin());
    if (block()->size == 0) {
      release(block());
      m_word = 0;
      return;
    }
    Long* const extra = block()->extra;
    if (!extra)
      return;
    extra->tombstones = 0;
    if (block()->size > kIndexedFrom) {
      if (extra->index)
        reindex();
      return;
    }
    delete extra;
    block()->extra = nullptr;
  }

  // Null, a Block, or a single bare observer registered with priority 0
  // tagged with kSingle: the one registration nearly every element has (its
  // container's, or its derived element's), kept without an array.
  std::uintptr_t m_word = 0;
};
