#include "PlatformTexts.h"

#include <gtest/gtest.h>

namespace {

TEST(PlatformTexts, YesNoNamesTheFlag) {
  EXPECT_STREQ(YES_NO(true), "yes");
  EXPECT_STREQ(YES_NO(false), "no");
}

TEST(PlatformTexts, InvalidTextIsDistinctFromTheEnumerationsOwn) {
  char const* const invalid = ERROR::INVALID;
  EXPECT_STRNE(invalid, "(invalid)");
  EXPECT_STRNE(invalid, "");
}

}  // namespace
