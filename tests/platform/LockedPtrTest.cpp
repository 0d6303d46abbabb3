#include "LockedPtr.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <thread>

namespace {

struct Locked {
  explicit Locked(Lock* lock) : m_lock(lock) {}
  Lock* getLock() const { return m_lock; }
  int value() const { return 7; }

  Lock* m_lock;
};

// A second holder on another thread is not held up by the first.
TEST(LockedPtr, NullLockCallsWithoutLocking) {
  Locked object(nullptr);
  LockedPtr<Locked> held(&object);
  std::atomic<int> value{0};
  std::thread([&] { value = LockedPtr<Locked>(&object)->value(); }).join();
  EXPECT_EQ(value, 7);
}

TEST(LockedPtr, LockIsReentrantOnOneThread) {
  Lock lock;
  Locked object(&lock);
  LockedPtr<Locked> outer(&object);
  LockedPtr<Locked> inner(&object);
  EXPECT_EQ(inner->value(), 7);
}

TEST(LockedPtr, OtherThreadWaitsUntilTheHolderIsGone) {
  Lock lock;
  Locked object(&lock);
  std::atomic<bool> entered{false};
  std::thread other;
  {
    LockedPtr<Locked> held(&object);
    other = std::thread([&] {
      LockedPtr<Locked> waiting(&object);
      entered = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    EXPECT_FALSE(entered);
  }
  other.join();
  EXPECT_TRUE(entered);
}

}  // namespace
