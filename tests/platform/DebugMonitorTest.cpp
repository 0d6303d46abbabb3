#include "DebugMonitor.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

constexpr unsigned int kChannel = 11;

class DebugMonitorTest : public testing::Test {
 protected:
  void TearDown() override { DebugMonitor::disable(kChannel); }

  std::vector<std::string> m_lines;
};

TEST_F(DebugMonitorTest, OnlyAnEnabledChannelUpToItsMaximumLevelGivesAMonitorUntilDisabled) {
  EXPECT_EQ(DebugMonitor::get(kChannel, 0), nullptr);
  DebugMonitor::enable(kChannel, 1, [this](char const* line) { m_lines.emplace_back(line); });
  EXPECT_NE(DebugMonitor::get(kChannel, 1), nullptr);
  EXPECT_EQ(DebugMonitor::get(kChannel, 2), nullptr);
  DebugMonitor* const monitor = DebugMonitor::get(kChannel, 0);
  ASSERT_NE(monitor, nullptr);

  DebugMonitor::disable(kChannel);
  EXPECT_EQ(DebugMonitor::get(kChannel, 0), nullptr);
  // A monitor handed out before stays usable and writes nowhere.
  monitor->log("late\n");
  EXPECT_TRUE(m_lines.empty());
}

}  // namespace
