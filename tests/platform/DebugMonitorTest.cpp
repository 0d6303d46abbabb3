#include "DebugMonitor.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "String.h"

namespace {

constexpr unsigned int kChannel = 11;

class DebugMonitorTest : public testing::Test {
 protected:
  void TearDown() override { DebugMonitor::disable(kChannel); }

  void enable(unsigned int maxLevel) {
    DebugMonitor::enable(kChannel, maxLevel, [this](char const* line) { m_lines.emplace_back(line); });
  }

  std::vector<std::string> m_lines;
};

TEST_F(DebugMonitorTest, SinkReceivesTheExactLine) {
  enable(0);
  DebugMonitor* const monitor = DebugMonitor::get(kChannel, 0);
  ASSERT_NE(monitor, nullptr);
  monitor->log("C(%p)::f(%s, %u)\n", static_cast<void const*>(nullptr), "x", 3u);
  monitor->log("no line end");
  std::string const nullAddress = String().format("%p", static_cast<void const*>(nullptr)).str();
  EXPECT_EQ(m_lines, (std::vector<std::string>{"C(" + nullAddress + ")::f(x, 3)\n", "no line end"}));
}

TEST_F(DebugMonitorTest, OnlyAnEnabledChannelUpToItsMaximumLevelGivesAMonitor) {
  EXPECT_EQ(DebugMonitor::get(kChannel, 0), nullptr);
  enable(1);
  EXPECT_NE(DebugMonitor::get(kChannel, 1), nullptr);
  EXPECT_EQ(DebugMonitor::get(kChannel, 2), nullptr);
}

TEST_F(DebugMonitorTest, DisableStopsTheLines) {
  enable(0);
  DebugMonitor* const monitor = DebugMonitor::get(kChannel, 0);
  ASSERT_NE(monitor, nullptr);
  DebugMonitor::disable(kChannel);
  EXPECT_EQ(DebugMonitor::get(kChannel, 0), nullptr);
  // A monitor handed out before stays usable and writes nowhere.
  monitor->log("late\n");
  EXPECT_TRUE(m_lines.empty());
}

}  // namespace
