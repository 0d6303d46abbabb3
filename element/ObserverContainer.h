// ObserverContainer<S, O>: the observers of one subject, in notification
// order: ascending priority, and the most recent registration first among
// equal priorities.
//
// Re-entrancy: a handler may register or unregister observers, itself
// included, while a broadcast runs. An unregistered entry is only marked
// (count 0, delegate dropped) and skipped; it is unlinked by the housekeeping
// that ends the outermost broadcast. An entry registered during a broadcast
// is linked at once and is reached if it lies ahead of the current one.
//
// Threading: not synchronised; one thread at a time, under the owner's lock.
#pragma once

#include "List.h"
#include "ObserverDelegate.h"
#include "RefPtr.h"

template <class S, class O>
class ObserverContainer {
 public:
  using Delegate = ObserverDelegate<S, O>;
  using Handler = void (O::*)(ObserverEvent<S>&);

  ObserverContainer() = default;
  ObserverContainer(ObserverContainer const&) = delete;
  ObserverContainer& operator=(ObserverContainer const&) = delete;
  // Observers are not told: a subject that goes away announces it first.
  ~ObserverContainer() = default;

  // Registers delegate, taking a reference on it. Registering the very same
  // delegate again only counts the registration up.
  void addObserver(Delegate* delegate, unsigned int priority, bool flag) {
    doHousekeeping();
    for (Wrapper& wrapper : m_entries) {
      if (wrapper.delegate.get() == delegate) {
        ++wrapper.count;
        return;
      }
    }
    auto position = m_entries.begin();
    while (position != m_entries.end() && position->priority < priority)
      ++position;
    m_entries.insert(position, Wrapper{RefPtr<Delegate>(delegate), priority, flag, 1});
    ++m_size;
  }

  // The registration every subject of the library offers: a new delegate
  // for observer, owned by this container alone.
  void addObserver(O* observer, unsigned int priority) {
    RefPtr<Delegate> const delegate = adoptRef(new Delegate(observer));
    addObserver(delegate.get(), priority, true);
  }

  // Undoes one registration of observer, the first in notification order;
  // unknown observers are ignored. The delegate is released, not stopped.
  void removeObserver(O* observer) {
    for (Wrapper& wrapper : m_entries) {
      if (!wrapper.delegate || wrapper.delegate->getObserver() != observer)
        continue;
      if (--wrapper.count <= 0)
        wrapper.delegate = nullptr;
      break;
    }
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
    if (m_busy)
      return;
    for (auto position = m_entries.begin(); position != m_entries.end();) {
      if (position->count > 0) {
        ++position;
        continue;
      }
      position = m_entries.remove(position);
      --m_size;
    }
  }

  // Registrations still linked, dead ones awaiting housekeeping included.
  unsigned int getSize() const { return m_size; }

 private:
  struct Wrapper {
    RefPtr<Delegate> delegate;  // null once unregistered
    unsigned int priority;
    bool flag;  // stored as registered; nothing in the library reads it
    int count;  // registrations of this delegate; 0 marks the entry dead
  };

  List<Wrapper> m_entries;
  unsigned int m_size = 0;
  unsigned int m_busy = 0;  // nesting depth of running broadcasts
};
