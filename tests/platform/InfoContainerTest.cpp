#include "InfoContainer.h"

#include <gtest/gtest.h>

namespace {

TEST(InfoContainer, TextKeepsTheOrderAddedIndentsByLevelAndOmitsEmptyValues) {
  InfoContainer info;
  info.add(0, 0, "Location Service", "");
  info.add(2, 0, "Domain", "example.com");
  info.add(1, 2, "Match any domain", "yes");
  EXPECT_EQ(info.toText(), String("Location Service\n"
                                  "    Domain: example.com\n"
                                  "  Match any domain: yes\n"));
}

}  // namespace
