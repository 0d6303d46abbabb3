#include "String.h"

#include <gtest/gtest.h>

namespace {

TEST(String, FormatReplacesAndConcatfAppends) {
  String text("old");
  EXPECT_EQ(text.format("%s-%u", "new", 5u), String("new-5"));
  EXPECT_EQ(text.concatf("%d", 12).concatf("%s", "b"), String("new-512b"));
}

TEST(String, IndexOfFindsTheFirstOccurrenceOrIsNegative) {
  EXPECT_EQ(String("a;b;c").indexOf(';'), 1);
  EXPECT_EQ(String("a;b;c").indexOf('a'), 0);
  EXPECT_LT(String("a;b;c").indexOf('x'), 0);
  EXPECT_LT(String().indexOf('x'), 0);
}

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
