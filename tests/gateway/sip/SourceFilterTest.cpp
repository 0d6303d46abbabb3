#include "sip/SourceFilter.h"

#include <gtest/gtest.h>

namespace {

sa address(char const* host) {
  sa result;
  sa_set_str(&result, host, 5060);
  return result;
}

TEST(SourceFilter, AdmitsEveryoneUntilANetworkIsGiven) {
  SourceFilter filter;
  EXPECT_TRUE(filter.admits(address("203.0.113.9")));
  ASSERT_TRUE(filter.allow("10.1.0.0/15"));
  EXPECT_TRUE(filter.admits(address("10.0.255.1")));
  EXPECT_FALSE(filter.admits(address("10.2.0.1")));
  EXPECT_FALSE(filter.admits(address("203.0.113.9")));
}

struct Case {
  char const* network;
  char const* source;
  bool admitted;
};

class SourceFilterCases : public testing::TestWithParam<Case> {};

TEST_P(SourceFilterCases, MatchesItsPrefix) {
  SourceFilter filter;
  ASSERT_TRUE(filter.allow(GetParam().network));
  EXPECT_EQ(GetParam().admitted, filter.admits(address(GetParam().source)));
}

INSTANTIATE_TEST_SUITE_P(Prefixes,
                         SourceFilterCases,
                         testing::Values(Case{"192.0.2.7", "192.0.2.7", true},
                                         Case{"192.0.2.7", "192.0.2.6", false},
                                         Case{"192.0.2.0/31", "192.0.2.1", true},
                                         Case{"192.0.2.0/31", "192.0.2.2", false},
                                         Case{"0.0.0.0/0", "198.51.100.1", true},
                                         Case{"0.0.0.0/0", "2001:db8::1", false},
                                         Case{"192.0.2.0/24", "::ffff:192.0.2.9", true},
                                         Case{"2001:db8::/33", "2001:db8:7fff::1", true},
                                         Case{"2001:db8::/33", "2001:db8:8000::1", false},
                                         Case{"::/0", "2001:db8::1", true}));

TEST(SourceFilter, RefusesWhatIsNoNetwork) {
  SourceFilter filter;
  EXPECT_FALSE(filter.allow("example.com/24"));
  EXPECT_FALSE(filter.allow("192.0.2.0/33"));
  EXPECT_FALSE(filter.allow("192.0.2.0/"));
  EXPECT_FALSE(filter.allow("192.0.2.0/8x"));
  EXPECT_TRUE(filter.admits(address("203.0.113.9")));
}

}  // namespace
