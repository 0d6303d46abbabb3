#include "LS_AddressText.h"

#include <gtest/gtest.h>

namespace {

struct AddressRow {
  char const* address;
  unsigned short port;
  char const* text;
};

// The do-not-output marker is 0 on this platform, so both host-port forms agree.
class HostPortText : public ::testing::TestWithParam<AddressRow> {};

TEST_P(HostPortText, HasTheHostAndAnyNonZeroPort) {
  CHostPort const hostPort(GetParam().address, GetParam().port);
  EXPECT_EQ(LS_hostPortToString(hostPort), GetParam().text);
  EXPECT_EQ(hostPortStr(hostPort), GetParam().text);
}

INSTANTIATE_TEST_SUITE_P(Rows,
                         HostPortText,
                         ::testing::Values(AddressRow{"example.com", 5060, "example.com:5060"},
                                           AddressRow{"example.com", 0, "example.com"},
                                           AddressRow{"10.0.0.1", 65535, "10.0.0.1:65535"},
                                           AddressRow{"[2001:db8::1]", 5061, "[2001:db8::1]:5061"},
                                           AddressRow{"", 0, ""}));

class SocketAddressText : public ::testing::TestWithParam<AddressRow> {};

TEST_P(SocketAddressText, BracketsOnlyAnIpv6AddressWithAPort) {
  CSocketAddr socketAddr;
  ASSERT_TRUE(socketAddr.Set(GetParam().address, GetParam().port));
  EXPECT_EQ(hostPortStr(socketAddr), GetParam().text);
}

INSTANTIATE_TEST_SUITE_P(Rows,
                         SocketAddressText,
                         ::testing::Values(AddressRow{"192.0.2.7", 5060, "192.0.2.7:5060"},
                                           AddressRow{"192.0.2.7", 0, "192.0.2.7"},
                                           AddressRow{"2001:db8::1", 5061, "[2001:db8::1]:5061"},
                                           AddressRow{"2001:db8::1", 0, "2001:db8::1"}));

TEST(AddressToString, ReplacesWhatTheOutputHeldAndReturnsIt) {
  String out("stale text");
  EXPECT_EQ(&LS_hostPortToString(CHostPort("example.com", 5060), out), &out);
  EXPECT_EQ(out, "example.com:5060");
  CNameAddr nameAddr;
  ASSERT_TRUE(nameAddr.Parse("Alice <sip:alice@example.com>", 29));
  EXPECT_EQ(&LS_nameAddrToString(nameAddr, out), &out);
  EXPECT_EQ(out, "\"Alice\" <sip:alice@example.com>");
  EXPECT_EQ(LS_nameAddrToString(nameAddr), out);
  EXPECT_EQ(LS_nameAddrToString(CNameAddr(), out), "");
}

}  // namespace
