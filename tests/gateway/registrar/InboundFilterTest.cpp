#include "registrar/InboundFilter.h"

#include <gtest/gtest.h>

namespace {

struct Case {
  char const* address;  // "" for the empty address: any
  char const* mask;     // "" for the host mask
  char const* source;
  bool matched;
};

class InboundFilterMatching : public testing::TestWithParam<Case> {};

TEST_P(InboundFilterMatching, MatchesTheMaskedAddressOfItsOwnFamily) {
  IpAddress rule;
  ASSERT_TRUE(rule.set(GetParam().address, GetParam().mask));
  sa source;
  ASSERT_EQ(0, sa_set_str(&source, GetParam().source, 5060));
  EXPECT_EQ(GetParam().matched, InboundFilter::matches(rule, source));
}

INSTANTIATE_TEST_SUITE_P(Rules,
                         InboundFilterMatching,
                         testing::Values(Case{"", "", "192.0.2.1", true},
                                         Case{"", "", "2001:db8::1", true},
                                         Case{"192.0.2.7", "", "192.0.2.7", true},
                                         Case{"192.0.2.7", "", "192.0.2.6", false},
                                         // Bits of the address outside the mask do not count.
                                         Case{"10.1.2.3", "255.0.0.0", "10.200.0.1", true},
                                         Case{"10.0.0.0", "255.0.0.0", "11.0.0.1", false},
                                         Case{"192.0.2.0", "255.255.255.128", "192.0.2.127", true},
                                         Case{"192.0.2.0", "255.255.255.128", "192.0.2.128", false},
                                         // A mapped source is its IPv4 address, and only that.
                                         Case{"10.0.0.0", "255.0.0.0", "::ffff:10.9.9.9", true},
                                         Case{"10.0.0.0", "255.0.0.0", "::ffff:11.9.9.9", false},
                                         Case{"10.0.0.0", "255.0.0.0", "::a00:1", false},
                                         Case{"::", "::", "::ffff:192.0.2.1", false},
                                         // Neither family's rule matches the other's source.
                                         Case{"0.0.0.0", "0.0.0.0", "198.51.100.1", true},
                                         Case{"0.0.0.0", "0.0.0.0", "2001:db8::1", false},
                                         Case{"::", "::", "2001:db8::1", true},
                                         Case{"::", "::", "198.51.100.1", false},
                                         Case{"2001:db8::", "ffff:ffff:8000::", "2001:db8:7fff::1", true},
                                         Case{"2001:db8::", "ffff:ffff:8000::", "2001:db8:8000::1", false},
                                         Case{"2001:db8::1", "", "2001:db8::1", true},
                                         Case{"2001:db8::1", "", "2001:db8::2", false}));

}  // namespace
