#include "StringHashTable.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

class StringHashTableTest : public testing::Test {
 protected:
  void SetUp() override {
    for (char const* key : {"charlie", "alpha", "bravo", "delta"})
      m_table.add(key, static_cast<int>(m_table.size()));
  }

  std::vector<std::string> keys() const {
    std::vector<std::string> keys;
    for (auto const& entry : m_table)
      keys.push_back(entry.key.str());
    return keys;
  }

  StringHashTable<int> m_table{4};
};

TEST_F(StringHashTableTest, AddNeverReplacesAndKeepsInsertionOrder) {
  EXPECT_FALSE(m_table.add("alpha", 99));
  EXPECT_EQ(*m_table.get("alpha"), 1);
  EXPECT_EQ(keys(), (std::vector<std::string>{"charlie", "alpha", "bravo", "delta"}));
}

TEST_F(StringHashTableTest, RemoveKeepsTheOrderOfTheRest) {
  EXPECT_TRUE(m_table.remove("alpha"));
  EXPECT_FALSE(m_table.remove("alpha"));
  EXPECT_EQ(keys(), (std::vector<std::string>{"charlie", "bravo", "delta"}));
  EXPECT_EQ(*m_table.get("bravo"), 2);
}

TEST_F(StringHashTableTest, KeysAreExactBytes) {
  EXPECT_EQ(m_table.get("Alpha"), nullptr);
  EXPECT_FALSE(m_table.contains("alpha "));
  EXPECT_TRUE(m_table.add("Alpha", 5));
  EXPECT_EQ(*m_table.get("alpha"), 1);
  EXPECT_EQ(*m_table.get("Alpha"), 5);
}

// Enough entries to rehash past the sizing hint, and short keys whose text lives inside the entry itself.
TEST(StringHashTable, LookupsFollowManyAddsAndRemoves) {
  StringHashTable<int> table(2);
  for (int i = 0; i < 200; ++i)
    table.add(String().format("%d", i), i);
  for (int i = 0; i < 200; i += 2)
    table.remove(String().format("%d", i));
  for (int i = 1; i < 200; i += 2) {
    ASSERT_NE(table.get(String().format("%d", i)), nullptr) << i;
    EXPECT_EQ(*table.get(String().format("%d", i)), i);
  }
  EXPECT_EQ(table.size(), 100u);
}

}  // namespace
