#include "sip/SourceThrottle.h"

#include <gtest/gtest.h>

namespace {

sa address(char const* host, uint16_t port) {
  sa result;
  sa_set_str(&result, host, port);
  return result;
}

TEST(SourceThrottle, HoldsASourceOverItsLimitOnceForItsHold) {
  SourceThrottle throttle(3, 1000, 5000, 64);
  sa const source = address("192.0.2.1", 5060);
  for (int i = 0; i < 3; ++i)
    ASSERT_EQ(SourceThrottle::Verdict::PASSED, throttle.count(source, 100));
  // Another port of the same address counts the same.
  EXPECT_EQ(SourceThrottle::Verdict::HELD_NOW, throttle.count(address("192.0.2.1", 6000), 200));
  EXPECT_EQ(SourceThrottle::Verdict::HELD, throttle.count(source, 300));
  EXPECT_TRUE(throttle.held(source, 5199));
  EXPECT_FALSE(throttle.held(address("192.0.2.2", 5060), 300));
  EXPECT_FALSE(throttle.held(source, 5200));
  EXPECT_EQ(SourceThrottle::Verdict::PASSED, throttle.count(source, 5200));
}

TEST(SourceThrottle, CountStartsAgainEachWindow) {
  SourceThrottle throttle(2, 1000, 5000, 64);
  sa const source = address("192.0.2.1", 5060);
  for (uint64_t now = 0; now < 10000; now += 500)
    ASSERT_EQ(SourceThrottle::Verdict::PASSED, throttle.count(source, now)) << now;
}

// A flood from many addresses through one bucket must not free the source
// being held while others not held can make room.
TEST(SourceThrottle, HeldSourceOutlivesAFloodOfOthers) {
  SourceThrottle throttle(1, 1000, 60000, SourceThrottle::kWays);
  sa const attacker = address("192.0.2.1", 5060);
  throttle.count(attacker, 0);
  ASSERT_EQ(SourceThrottle::Verdict::HELD_NOW, throttle.count(attacker, 0));
  for (uint32_t i = 0; i < 1000; ++i) {
    sa other;
    sa_set_in(&other, 0x0a000000 + i, 5060);
    throttle.count(other, 10);
  }
  EXPECT_TRUE(throttle.held(attacker, 20));
}

}  // namespace
