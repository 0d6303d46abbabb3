#include "sip/MonotonicTimer.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

// Runs libre's loop until a handler stops it, or for at most kLimitMs.
class MonotonicTimerTest : public ::testing::Test {
 protected:
  static constexpr uint64_t kLimitMs = 10000;

  void SetUp() override {
    ASSERT_EQ(0, libre_init());
    tmr_init(&m_limit);
  }
  void TearDown() override {
    tmr_cancel(&m_limit);
    libre_close();
  }

  void loop() {
    tmr_start(
        &m_limit, kLimitMs, [](void*) { re_cancel(); }, nullptr);
    re_main(nullptr);
  }

  tmr m_limit;
};

// Records its name and, when last, stops the loop.
struct Firing {
  std::vector<char const*>* fired;
  char const* name;
  bool last;
};

void onFire(void* argument) {
  Firing const& firing = *static_cast<Firing*>(argument);
  firing.fired->push_back(firing.name);
  if (firing.last)
    re_cancel();
}

TEST_F(MonotonicTimerTest, FiresInOrderOfDelayWithAZeroDelayFirst) {
  std::vector<char const*> fired;
  Firing later{&fired, "later", true};
  Firing now{&fired, "now", false};
  MonotonicTimer second;
  MonotonicTimer first;
  second.start(50, onFire, &later);
  first.start(0, onFire, &now);
  loop();
  EXPECT_EQ((std::vector<char const*>{"now", "later"}), fired);
  EXPECT_FALSE(first.running());
}

TEST_F(MonotonicTimerTest, CancelledOrRestartedTimerKeepsOnlyItsLastStart) {
  std::vector<char const*> fired;
  Firing cancelled{&fired, "cancelled", false};
  Firing replaced{&fired, "replaced", false};
  Firing last{&fired, "last", true};
  MonotonicTimer gone;
  MonotonicTimer restarted;
  gone.start(0, onFire, &cancelled);
  gone.cancel();
  restarted.start(0, onFire, &replaced);
  restarted.start(100, onFire, &last);
  loop();
  EXPECT_EQ((std::vector<char const*>{"last"}), fired);
}

}  // namespace
