#include "StringTokenizer.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

struct TokenCase {
  char const* text;
  char const* delimiters;
  std::vector<std::string> tokens;
};

class StringTokenizerTokens : public testing::TestWithParam<TokenCase> {};

// With none left, nextToken gives the empty text.
TEST_P(StringTokenizerTokens, YieldsTheNonEmptyTokensInOrder) {
  StringTokenizer tokenizer(GetParam().text, GetParam().delimiters);
  std::vector<std::string> tokens;
  while (tokenizer.hasMoreTokens())
    tokens.push_back(tokenizer.nextToken().str());
  EXPECT_EQ(tokens, GetParam().tokens);
  EXPECT_EQ(tokenizer.nextToken(), String(""));
}

INSTANTIATE_TEST_SUITE_P(Cases,
                         StringTokenizerTokens,
                         testing::Values(TokenCase{"user;phone-context=x", ";", {"user", "phone-context=x"}},
                                         TokenCase{";user", ";", {"user"}},
                                         TokenCase{"a;;b;", ";", {"a", "b"}},
                                         TokenCase{"", ";", {}},
                                         TokenCase{";;;", ";", {}},
                                         TokenCase{"a, b,c", ", ", {"a", "b", "c"}},
                                         TokenCase{"a;b", "", {"a;b"}}));

}  // namespace
