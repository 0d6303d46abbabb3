#include "ObserverContainer.h"

#include <gtest/gtest.h>

#include <functional>

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

}  // namespace
