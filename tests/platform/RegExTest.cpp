#include "RegEx.h"

#include <gtest/gtest.h>

#include <chrono>
#include <string>

namespace {

struct MatchCase {
  char const* expression;
  std::string text;
  unsigned int start;
  bool matches;
};

class RegExMatch : public testing::TestWithParam<MatchCase> {};

TEST_P(RegExMatch, MatchesTheWholeRestOfTheText) {
  MatchCase const& c = GetParam();
  RefPtr<RegEx::Pattern> const pattern = RegEx::COMPILE_EXPRESSION(c.expression);
  ASSERT_TRUE(pattern);
  String const text(c.text.data(), c.text.size());
  EXPECT_EQ(pattern->match(text, c.start).isSuccess(), c.matches)
      << "'" << c.expression << "' against '" << c.text << "' from " << c.start;
}

INSTANTIATE_TEST_SUITE_P(Cases,
                         RegExMatch,
                         testing::Values(MatchCase{"1[0-9]{3}", "1000", 0, true},
                                         MatchCase{"1[0-9]{3}", "10000", 0, false},
                                         MatchCase{"1[0-9]{3}", "1000x", 0, false},
                                         MatchCase{"1[0-9]{3}", "x1000", 0, false},
                                         MatchCase{"1[0-9]{3}", "x1000", 1, true},
                                         MatchCase{"^1[0-9]{3}$", "+1000", 1, true},
                                         MatchCase{"[0-9]*", "12", 2, true},
                                         MatchCase{"[0-9]+", "12", 2, false},
                                         MatchCase{"[0-9]*", "12", 3, false},
                                         MatchCase{"", "", 0, true},
                                         MatchCase{"abc", "ABC", 0, false},
                                         // Bytes, not UTF-8 characters: "é" in UTF-8 is two bytes.
                                         MatchCase{"..", "\xc3\xa9", 0, true},
                                         MatchCase{".", "\xff", 0, true},
                                         MatchCase{"a.b", std::string("a\0b", 3), 0, true}));

// Backreferences and lookaround would need backtracking: not accepted.
TEST(RegEx, TextThatDoesNotCompileGivesNull) {
  for (char const* expression : {"(", "[a-", "a{2,1}", "*a", "(a)\\1", "(?=a)a"})
    EXPECT_FALSE(RegEx::COMPILE_EXPRESSION(expression)) << expression;
}

TEST(RegEx, PathologicalPatternFailsQuicklyOnALongText) {
  RefPtr<RegEx::Pattern> const pattern = RegEx::COMPILE_EXPRESSION("(a*)*b");
  ASSERT_TRUE(pattern);
  std::string const text(64 * 1024, 'a');
  auto const begin = std::chrono::steady_clock::now();
  EXPECT_TRUE(pattern->match(String(text.data(), text.size()), 0).isFailure());
  EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(2));
}

}  // namespace
