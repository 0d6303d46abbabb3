#include "store/StorableText.h"

#include <gtest/gtest.h>

#include <string>

namespace {

struct Case {
  char const* name;
  std::string text;
  bool storable;
};

TEST(StorableTextTest, OnlyWellFormedUtf8WithoutNulIsStorable) {
  Case const cases[] = {
      {"ascii", "a84b4c76e66710@pc33.atlanta.com", true},
      {"empty", "", true},
      {"two, three and four bytes", "\xc3\xa9\xe2\x82\xac\xf0\x9f\x93\x9e", true},
      {"highest code point", "\xf4\x8f\xbf\xbf", true},
      {"a byte no UTF-8 has", "call-\xff", false},
      {"a NUL byte", std::string("call\0id", 7), false},
      {"a lone continuation byte", "\x80", false},
      {"overlong two bytes", "\xc0\xaf", false},
      {"overlong three bytes", "\xe0\x80\xaf", false},
      {"overlong four bytes", "\xf0\x80\x80\xaf", false},
      {"a surrogate", "\xed\xa0\x80", false},
      {"past U+10FFFF", "\xf4\x90\x80\x80", false},
      {"cut short at the end", "ok\xe2\x82", false},
      {"a continuation byte missing inside", "\xe2\x82z", false},
  };
  for (Case const& each : cases)
    EXPECT_EQ(each.storable, isStorableText(each.text.data(), each.text.size())) << each.name;
}

}  // namespace
