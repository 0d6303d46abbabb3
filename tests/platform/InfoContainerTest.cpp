#include "InfoContainer.h"

#include <gtest/gtest.h>

namespace {

class InfoContainerTest : public testing::Test {
 protected:
  void SetUp() override {
    m_info.add(0, 0, "Location Service", "");
    m_info.add(1, 2, "Match any domain", "yes");
    m_info.add(2, 0, "Domain", "example.com");
  }

  InfoContainer m_info;
};

TEST_F(InfoContainerTest, KeepsLinesInTheOrderAdded) {
  ASSERT_EQ(m_info.size(), 3u);
  EXPECT_EQ(m_info[0].key, String("Location Service"));
  EXPECT_EQ(m_info[1].level, 1u);
  EXPECT_EQ(m_info[1].detail, 2u);
  EXPECT_EQ(m_info[1].key, String("Match any domain"));
  EXPECT_EQ(m_info[1].value, String("yes"));
  EXPECT_EQ(m_info[2].value, String("example.com"));
}

TEST_F(InfoContainerTest, TextIndentsByLevelAndOmitsEmptyValues) {
  EXPECT_EQ(m_info.toText(), String("Location Service\n"
                                    "  Match any domain: yes\n"
                                    "    Domain: example.com\n"));
}

}  // namespace
