#include "String.h"

#include <gtest/gtest.h>

namespace {

TEST(String, FormatReplacesTheText) {
  String text("old");
  text.format("%s-%u", "new", 5u);
  EXPECT_EQ(text, String("new-5"));
}

TEST(String, ConcatfAppendsToTheText) {
  String text("a");
  text.concatf("%d", 12).concatf("%s", "b");
  EXPECT_EQ(text, String("a12b"));
}

TEST(String, IndexOfFindsTheFirstOccurrenceOrIsNegative) {
  String const text("a;b;c");
  EXPECT_EQ(text.indexOf(';'), 1);
  EXPECT_EQ(text.indexOf('a'), 0);
  EXPECT_LT(text.indexOf('x'), 0);
  EXPECT_LT(String().indexOf('x'), 0);
}

TEST(String, StringOfUnsignedShortIsDecimal) {
  EXPECT_EQ(String::stringOf<unsigned short>(0), String("0"));
  EXPECT_EQ(String::stringOf<unsigned short>(5060), String("5060"));
  EXPECT_EQ(String::stringOf<unsigned short>(65535), String("65535"));
}

TEST(String, BytesOrderAsUnsigned) {
  EXPECT_GT(String("\xff"), String("a"));
  EXPECT_LT(String("a"), String("\x80"));
}

TEST(String, EqualityIsLengthAndBytes) {
  EXPECT_NE(String("a\0b", 3), String("a"));
  EXPECT_NE(String("abc"), String("ABC"));
  EXPECT_NE(String("abc "), String("abc"));
  EXPECT_EQ(String(nullptr), String(""));
}

}  // namespace
