#include "String.h"

#include <gtest/gtest.h>

namespace {

TEST(String, StringOfUnsignedShortIsDecimal) {
  EXPECT_EQ(String::stringOf<unsigned short>(0), String("0"));
  EXPECT_EQ(String::stringOf<unsigned short>(65535), String("65535"));
}

TEST(String, BytesOrderAsUnsignedAndEqualityIsLengthAndBytes) {
  EXPECT_GT(String("\xff"), String("a"));
  EXPECT_LT(String("a"), String("\x80"));
  EXPECT_NE(String("a\0b", 3), String("a"));
  EXPECT_NE(String("abc"), String("ABC"));
  EXPECT_EQ(String(nullptr), String(""));
}

}  // namespace
