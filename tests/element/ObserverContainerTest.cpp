#include "ObserverContainer.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <deque>
#include <functional>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "LS_IElement.h"
#include "support/ElementRecorders.h"

namespace {

using Observers = ObserverContainer<LS_IElement, LS_IElementObserver>;

// An observer whose onChange runs an extra action after recording.
class ActingObserver : public ElementRecorder {
 public:
  ActingObserver(Journal& journal, std::string tag) : ElementRecorder(journal, std::move(tag)) {}
  void onChange(ObserverEvent<LS_IElement>& event) override {
    ElementRecorder::onChange(event);
    if (action)
      action();
  }
  std::function<void()> action;
};

class ObserverContainerTest : public ::testing::Test {
 protected:
  void broadcast() { observers.broadcastEvent(ObserverEvent<LS_IElement>(), &LS_IElementObserver::onChange); }

  Journal journal;
  Observers observers;
  ActingObserver a{journal, "A"};
  ActingObserver b{journal, "B"};
  ActingObserver c{journal, "C"};
};

TEST_F(ObserverContainerTest, EqualPrioritiesAreNotifiedNewestFirstAndHigherPrioritiesLater) {
  observers.addObserver(&a, 0);
  observers.addObserver(&b, 0);
  observers.addObserver(&c, 0);
  ActingObserver late(journal, "P5");
  observers.addObserver(&late, 5);
  ActingObserver first(journal, "D");
  observers.addObserver(&first, 0);

  broadcast();

  EXPECT_EQ(journal, (Journal{"D:change", "C:change", "B:change", "A:change", "P5:change"}));
}

TEST_F(ObserverContainerTest, ObserverRemovingItselfIsSkippedLaterAndUnlinkedAfterTheBroadcast) {
  observers.addObserver(&a, 0);
  observers.addObserver(&b, 0);
  b.action = [&] {
    observers.removeObserver(&b);
    EXPECT_EQ(observers.getSize(), 2u) << "unlinked while the broadcast runs";
  };

  broadcast();
  EXPECT_EQ(observers.getSize(), 1u);
  broadcast();

  EXPECT_EQ(journal, (Journal{"B:change", "A:change", "A:change"}));
}

TEST_F(ObserverContainerTest, RemovingAnObserverNotYetReachedPreventsItsCall) {
  observers.addObserver(&a, 0);
  observers.addObserver(&b, 0);
  b.action = [&] { observers.removeObserver(&a); };

  broadcast();

  EXPECT_EQ(journal, Journal{"B:change"});
}

TEST_F(ObserverContainerTest, ObserverAddedAheadDuringBroadcastIsReached) {
  observers.addObserver(&a, 0);
  observers.addObserver(&b, 0);
  b.action = [&] {
    b.action = nullptr;
    observers.addObserver(&c, 9);
  };

  broadcast();

  EXPECT_EQ(journal, (Journal{"B:change", "A:change", "C:change"}));
}

TEST_F(ObserverContainerTest, SameObserverAddedTwiceIsNotifiedTwiceAndRemovedOnceAtATime) {
  observers.addObserver(&a, 0);
  observers.addObserver(&a, 0);
  broadcast();
  observers.removeObserver(&a);
  broadcast();
  observers.removeObserver(&a);
  broadcast();

  EXPECT_EQ(journal, (Journal{"A:change", "A:change", "A:change"}));
  EXPECT_EQ(observers.getSize(), 0u);
}

TEST_F(ObserverContainerTest, TheSameDelegateRegisteredTwiceCountsItsRegistrations) {
  auto delegate = adoptRef(new Observers::Delegate(&a));
  observers.addObserver(delegate.get(), 0, true);
  observers.addObserver(delegate.get(), 0, true);
  EXPECT_EQ(observers.getSize(), 1u);
  broadcast();

  observers.removeObserver(&a);
  broadcast();
  observers.removeObserver(&a);
  broadcast();

  EXPECT_EQ(journal, (Journal{"A:change", "A:change"}));
}

TEST_F(ObserverContainerTest, RemovingAnUnknownObserverChangesNothing) {
  observers.addObserver(&a, 0);
  observers.removeObserver(&b);
  broadcast();
  EXPECT_EQ(journal, Journal{"A:change"});
}

TEST_F(ObserverContainerTest, StoppedDelegateNotifiesNobody) {
  auto delegate = adoptRef(new Observers::Delegate(&a));
  observers.addObserver(delegate.get(), 0, true);
  delegate->stopNotifications();
  broadcast();
  EXPECT_TRUE(journal.empty());
}

TEST_F(ObserverContainerTest, EachObserverReceivesItsOwnCopyOfTheEvent) {
  struct Keeper : LS_IElementObserver {
    void onChange(ObserverEvent<LS_IElement>& event) override { seen.push_back(&event); }
    void onDestroying(ObserverEvent<LS_IElement>&) override {}
    std::vector<ObserverEvent<LS_IElement>*> seen;
  } keeper;
  observers.addObserver(&keeper, 0);
  observers.addObserver(&keeper, 0);
  ObserverEvent<LS_IElement> const original;
  observers.broadcastEvent(original, &LS_IElementObserver::onChange);
  ASSERT_EQ(keeper.seen.size(), 2u);
  EXPECT_NE(keeper.seen[0], &original);
}


// The plain list that the indexed one must agree with: entries in a vector
// in notification order, every lookup a walk from the front.
class ReferenceObservers {
 public:
  using Delegate = ObserverDelegate<LS_IElement, LS_IElementObserver>;

  void addObserver(Delegate* delegate, unsigned int priority, bool) {
    doHousekeeping();
    for (Entry& entry : m_entries) {
      if (entry.delegate.get() == delegate) {
        ++entry.count;
        return;
      }
    }
    size_t at = 0;
    while (at < m_entries.size() && m_entries[at].priority < priority)
      ++at;
    m_entries.insert(m_entries.begin() + at, Entry{delegate, priority, 1});
    for (size_t& cursor : m_cursors) {
      if (at <= cursor)
        ++cursor;
    }
  }
  void addObserver(LS_IElementObserver* observer, unsigned int priority) {
    auto const delegate = adoptRef(new Delegate(observer));
    addObserver(delegate.get(), priority, true);
  }
  void removeObserver(LS_IElementObserver* observer) {
    for (Entry& entry : m_entries) {
      if (entry.delegate && entry.delegate->getObserver() == observer) {
        if (--entry.count == 0)
          entry.delegate = nullptr;
        break;
      }
    }
    doHousekeeping();
  }
  void broadcastEvent(ObserverEvent<LS_IElement> const& event, Observers::Handler handler) {
    m_cursors.push_back(0);
    for (size_t& cursor = m_cursors.back(); cursor < m_entries.size(); ++cursor) {
      RefPtr<Delegate> const delegate = m_entries[cursor].delegate;
      if (m_entries[cursor].count > 0 && delegate)
        delegate->notifyEvent(handler, *event.clone());
    }
    m_cursors.pop_back();
    doHousekeeping();
  }
  void doHousekeeping() {
    if (m_cursors.empty())
      m_entries.erase(std::remove_if(m_entries.begin(), m_entries.end(), [](Entry const& e) { return e.count == 0; }),
                      m_entries.end());
  }
  unsigned int getSize() const { return static_cast<unsigned int>(m_entries.size()); }

 private:
  struct Entry {
    RefPtr<Delegate> delegate;
    unsigned int priority;
    int count;
  };
  std::vector<Entry> m_entries;
  std::deque<size_t> m_cursors;  // one per running broadcast; references stay valid
};

// Random registrations, removals, stopped delegates and broadcasts, some of
// them made from inside handlers, on lists that grow well past the index
// threshold and shrink back to empty. Both worlds draw the same numbers, so
// they stay in step exactly as long as they behave alike.
template <class List>
class RandomWorld {
 public:
  static constexpr int kWatchers = 24;
  static constexpr int kKeptDelegates = 4;

  explicit RandomWorld(unsigned int start) : m_random(start) {
    for (int id = 0; id < kWatchers; ++id)
      m_watchers.push_back(std::make_unique<Watcher>(*this, id));
    for (int id = 0; id < kKeptDelegates; ++id)
      m_kept.push_back(adoptRef(new Observers::Delegate(m_watchers[id].get())));
  }

  void step(bool growing) {
    act(growing);
    journal.push_back("size " + std::to_string(observers.getSize()));
  }

  Journal journal;
  List observers;

 private:
  struct Watcher : LS_IElementObserver {
    Watcher(RandomWorld& world, int id) : world(world), id(id) {}
    void onChange(ObserverEvent<LS_IElement>&) override {
      world.journal.push_back(std::to_string(id));
      if (world.draw(4) == 0)
        world.act(world.draw(2) == 0);
    }
    void onDestroying(ObserverEvent<LS_IElement>&) override {}
    RandomWorld& world;
    int id;
  };

  unsigned int draw(unsigned int range) { return m_random() % range; }
  LS_IElementObserver* anyWatcher() { return m_watchers[draw(kWatchers)].get(); }

  void act(bool growing) {
    unsigned int const choice = draw(10);
    if (choice < (growing ? 5u : 2u)) {
      observers.addObserver(anyWatcher(), draw(3));
    } else if (choice < 7) {
      observers.removeObserver(anyWatcher());
    } else if (choice == 7) {
      observers.addObserver(m_kept[draw(kKeptDelegates)].get(), draw(3), true);
    } else if (choice == 8) {
      if (draw(6) == 0)
        m_kept[draw(kKeptDelegates)]->stopNotifications();
      else
        observers.removeObserver(draw(3) == 0 ? nullptr : anyWatcher());
    } else if (m_depth < 2) {
      ++m_depth;
      observers.broadcastEvent(ObserverEvent<LS_IElement>(), &LS_IElementObserver::onChange);
      --m_depth;
    }
  }

  std::mt19937 m_random;
  std::vector<std::unique_ptr<Watcher>> m_watchers;
  std::vector<RefPtr<Observers::Delegate>> m_kept;
  int m_depth = 0;
};

TEST(ObserverContainerIndexTest, LongListsBehaveExactlyAsThePlainList) {
  for (unsigned int run = 1; run <= 300; ++run) {
    RandomWorld<Observers> indexed(run);
    RandomWorld<ReferenceObservers> plain(run);
    for (int step = 0; step < 160; ++step) {
      bool const growing = step < 100;
      indexed.step(growing);
      plain.step(growing);
      ASSERT_EQ(indexed.journal, plain.journal) << "run " << run << ", step " << step;
      indexed.journal.clear();
      plain.journal.clear();
    }
  }
}

}  // namespace
