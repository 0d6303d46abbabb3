#include "CString.h"

#include <gtest/gtest.h>

namespace {

TEST(CString, NullTextIsEmpty) {
  EXPECT_TRUE(CString(nullptr).isEmpty());
  EXPECT_TRUE(CString(nullptr, 4).isEmpty());
  EXPECT_EQ(CString(), static_cast<char const*>(nullptr));
}

TEST(CString, EqualityIsByteEqualityIncludingLength) {
  CString const withZero("ab\0c", 4);
  EXPECT_EQ(4u, withZero.length());
  EXPECT_EQ(withZero, CString("ab\0c", 4));
  EXPECT_NE(withZero, "ab");
  EXPECT_NE(withZero, CString("ab"));
  EXPECT_NE(CString("Host"), "host");
}

TEST(CString, EqualsIgnoringCaseFoldsAsciiLettersOnly) {
  EXPECT_TRUE(CString("Local-HOST").equalsIgnoringCase("local-host"));
  EXPECT_FALSE(CString("local-host").equalsIgnoringCase("local-hos"));
  EXPECT_FALSE(CString("\xc4").equalsIgnoringCase("\xe4"));
  EXPECT_FALSE(CString("[").equalsIgnoringCase("{")) << "no folding outside the letters";
}

}  // namespace
