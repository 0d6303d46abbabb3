#include "SipStatistics.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

namespace {

TEST(SipStatistics, ConcurrentAddsAndRemovesKeepAnExactCount) {
  int const before = s_sipStatistics.getInboundRegistrations();
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([] {
      for (int i = 0; i < 10000; ++i) {
        s_sipStatistics.onInboundRegAdded();
        s_sipStatistics.onInboundRegAdded();
        s_sipStatistics.onInboundRegRemoved();
      }
    });
  }
  for (std::thread& thread : threads)
    thread.join();
  EXPECT_EQ(before + 40000, s_sipStatistics.getInboundRegistrations());
}

}  // namespace
