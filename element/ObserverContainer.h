// ObserverContainer<S, O>: the observers of one subject, in notification
// order: ascending priority, and the most recent registration first among
// equal priorities.
//
// Re-entrancy: a handler may register or unregister observers, itself
// included, while a broadcast runs. An entry unregistered then is only marked
// (count 0, delegate dropped) and skipped; it is unlinked by the housekeeping
// that ends the outermost broadcast. Outside broadcasts it is unlinked at
// once. An entry registered during a broadcast
// is linked at once and is reached if it lies ahead of the current one.
//
// Cost: a group's value is watched by every member that inherits it, so one
// subject may carry tens of thousands of observers. Registering and
// unregistering must not walk such a list. Once a list grows past
// kIndexedFrom entries it keeps an index: live entries by observer, and the
// first entry of each priority; shorter lists are walked, which costs less
// than hashing and keeps the many subjects with one or two observers small.
// A delegate whose notifications were stopped no longer names the observer
// it was indexed under; the rare calls that must find one (registering it
// again, or unregistering a null observer) walk the list. Housekeeping visits
// only the entries waiting to be unlinked.
//
// Threading: not synchronised; one thread at a time, under the owner's lock.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <vector>

#include "List.h"
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
  ~ObserverContainer() = default;

  // Registers delegate, taking a reference on it. Registering the very same
  // delegate again only counts the registration up. A null delegate would
  // notify nobody and is not registered.
  void addObserver(Delegate* delegate, unsigned int priority, bool flag) {
    doHousekeeping();
    if (!delegate)
      return;
    Position const registered = entryHolding(delegate);
    if (registered != m_entries.end()) {
      ++registered->count;
      return;
    }
    link(delegate, priority, flag);
  }

  // The registration every subject of the library offers: a new delegate
  // for observer, owned by this container alone.
  void addObserver(O* observer, unsigned int priority) {
    doHousekeeping();
    RefPtr<Delegate> const delegate = adoptRef(new Delegate(observer));
    link(delegate.get(), priority, true);  // a new delegate holds no entry yet
  }

  // Undoes one registration of observer, the first in notification order;
  // unknown observers are ignored. The delegate is released, not stopped.
  void removeObserver(O* observer) {
    Position const registration = firstRegistrationOf(observer);
    if (registration != m_entries.end() && --registration->count <= 0)
      retire(registration);
    doHousekeeping();
  }

  // Hands each live observer its own clone of event.
  void broadcastEvent(ObserverEvent<S> const& event, Handler handler) {
    ++m_busy;
    for (Wrapper& wrapper : m_entries) {
      if (wrapper.count <= 0 || !wrapper.delegate)
        continue;
      std::unique_ptr<ObserverEvent<S>> const copy = event.clone();
      if (!copy)
        continue;
      // The handler may unregister this very entry; the delegate must
      // outlive its own call.
      RefPtr<Delegate> const delegate = wrapper.delegate;
      delegate->notifyEvent(handler, *copy);
    }
    --m_busy;
    doHousekeeping();
  }

  // Unlinks the entries marked dead, unless a broadcast is running.
  void doHousekeeping() {
    if (m_busy || m_retired == 0)
      return;
    m_retired = 0;
    if (!m_index) {
      // Short: sweeping it costs no more than keeping a list of the dead.
      for (Position position = m_entries.begin(); position != m_entries.end();)
        position = position->count > 0 ? std::next(position) : unlink(position);
      return;
    }
    // Unlinking the last entry drops the index, and with it this list.
    std::vector<Position> retired;
    retired.swap(m_index->retired);
    for (Position const position : retired)
      unlink(position);
  }

  // Registrations still linked, dead ones awaiting housekeeping included.
  unsigned int getSize() const { return static_cast<unsigned int>(m_entries.size()); }

 private:
  struct Wrapper {
    RefPtr<Delegate> delegate;  // null once unregistered
    unsigned int priority;
    bool flag;  // stored as registered; nothing in the library reads it
    int count;  // registrations of this delegate; 0 marks the entry dead
    // The observer the entry is indexed under: the delegate's at
    // registration, which a stopped delegate no longer names.
    O* observer;
    // Among equal priorities, higher serials come first; given only while
    // the list keeps an index, which alone compares entries this way.
    std::uint64_t serial;
  };
  using Position = typename List<Wrapper>::iterator;

  struct Index {
    explicit Index(size_t expected) : live(expected) {}
    ObserverIndex<O, Position> live;  // by Wrapper::observer
    std::map<unsigned int, Position> firstOfPriority;  // dead entries included
    std::vector<Position> retired;  // during a broadcast, still linked
    std::uint64_t nextSerial = 0;
  };

  static bool comesBefore(Wrapper const& left, Wrapper const& right) {
    if (left.priority != right.priority)
      return left.priority < right.priority;
    return left.serial > right.serial;
  }

  // The live entry of delegate, or end().
  Position entryHolding(Delegate* delegate) {
    O* const observer = delegate->getObserver();
    if (!m_index || !observer)
      return walkFor([delegate](Wrapper const& wrapper) { return wrapper.delegate.get() == delegate; });
    Position found = m_entries.end();
    m_index->live.forEach(observer, [&found, delegate](Position candidate) {
      if (candidate->delegate.get() == delegate)
        found = candidate;
    });
    return found;
  }

  // The live entry whose delegate still notifies observer and that comes
  // first in notification order, or end().
  Position firstRegistrationOf(O* observer) {
    auto const notifies = [observer](Wrapper const& wrapper) {
      return wrapper.delegate && wrapper.delegate->getObserver() == observer;
    };
    if (!m_index || !observer)
      return walkFor(notifies);
    Position first = m_entries.end();
    m_index->live.forEach(observer, [&](Position candidate) {
      if (notifies(*candidate) && (first == m_entries.end() || comesBefore(*candidate, *first)))
        first = candidate;
    });
    return first;
  }

  template <class Predicate>
  Position walkFor(Predicate const& matches) {
    for (Position position = m_entries.begin(); position != m_entries.end(); ++position) {
      if (matches(*position))
        return position;
    }
    return m_entries.end();
  }

  // In front of the first entry of priority or higher, or at the end.
  Position insertionPoint(unsigned int priority) {
    if (m_index) {
      auto const group = m_index->firstOfPriority.lower_bound(priority);
      return group == m_index->firstOfPriority.end() ? m_entries.end() : group->second;
    }
    return walkFor([priority](Wrapper const& wrapper) { return wrapper.priority >= priority; });
  }

  void link(Delegate* delegate, unsigned int priority, bool flag) {
    Wrapper wrapper{RefPtr<Delegate>(delegate), priority, flag, 1, delegate->getObserver(),
                    m_index ? m_index->nextSerial++ : 0};
    Position const position = m_entries.insert(insertionPoint(priority), std::move(wrapper));
    if (!m_index) {
      if (m_entries.size() > kIndexedFrom)
        buildIndex();
      return;
    }
    m_index->firstOfPriority[priority] = position;
    if (position->observer)
      m_index->live.add(position->observer, position);
  }

  void buildIndex() {
    m_index = std::make_unique<Index>(m_entries.size());
    // Serials that fall along the list: newest first within a priority.
    m_index->nextSerial = m_entries.size() + 1;
    std::uint64_t serial = m_entries.size();
    for (Position position = m_entries.begin(); position != m_entries.end(); ++position) {
      position->serial = serial--;
      m_index->firstOfPriority.emplace(position->priority, position);  // keeps the first of each
      if (position->count <= 0)
        m_index->retired.push_back(position);
      else if (position->observer)
        m_index->live.add(position->observer, position);
    }
  }

  // Ends the entry whose last registration was undone: unlinked at once, or
  // marked and left to the housekeeping that ends the outermost broadcast.
  void retire(Position position) {
    position->count = 0;
    position->delegate = nullptr;
    if (m_index && position->observer)
      m_index->live.remove(position->observer, position);
    if (m_busy) {
      ++m_retired;
      if (m_index)
        m_index->retired.push_back(position);
      return;
    }
    unlink(position);
  }

  // Returns the position after the unlinked one.
  Position unlink(Position position) {
    if (m_index) {
      auto const group = m_index->firstOfPriority.find(position->priority);
      if (group != m_index->firstOfPriority.end() && group->second == position) {
        Position const next = std::next(position);
        if (next != m_entries.end() && next->priority == position->priority)
          group->second = next;
        else
          m_index->firstOfPriority.erase(group);
      }
    }
    Position const next = m_entries.remove(position);
    if (m_entries.isEmpty())
      m_index.reset();
    return next;
  }

  List<Wrapper> m_entries;
  unsigned int m_busy = 0;  // nesting depth of running broadcasts
  unsigned int m_retired = 0;  // entries retired during a broadcast, still linked
  std::unique_ptr<Index> m_index;  // built past kIndexedFrom entries, dropped when empty
};
