#include "LS_AddressText.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

struct HostPortRow {
  char const* host;
  unsigned short port;
  // Through LS_hostPortToString, then through hostPortStr.
  char const* text;
  char const* str;
};

// The do-not-output marker is 0 on this platform, so both forms agree.
class HostPortText : public ::testing::TestWithParam<HostPortRow> {};

TEST_P(HostPortText, HasTheHostAndAnyPrintablePort) {
  HostPortRow const& row = GetParam();
  EXPECT_EQ(LS_hostPortToString(CHostPort(row.host, row.port)), row.text);
}

TEST_P(HostPortText, HasTheHostAndAnyNonZeroPortThroughHostPortStr) {
  HostPortRow const& row = GetParam();
  EXPECT_EQ(hostPortStr(CHostPort(row.host, row.port)), row.str);
}

INSTANTIATE_TEST_SUITE_P(
    Rows,
    HostPortText,
    ::testing::Values(HostPortRow{"example.com", 5060, "example.com:5060", "example.com:5060"},
                      HostPortRow{"example.com", 0, "example.com", "example.com"},
                      HostPortRow{"10.0.0.1", 65535, "10.0.0.1:65535", "10.0.0.1:65535"},
                      HostPortRow{"[2001:db8::1]", 5061, "[2001:db8::1]:5061", "[2001:db8::1]:5061"},
                      HostPortRow{"", 0, "", ""}));

TEST(HostPortToString, ReplacesWhatTheOutputHeldAndReturnsIt) {
  String out("stale text");
  String& result = LS_hostPortToString(CHostPort("example.com", 5060), out);
  EXPECT_EQ(&result, &out);
  EXPECT_EQ(out, "example.com:5060");
}

struct SocketRow {
  char const* address;
  unsigned short port;
  char const* text;
};

class SocketAddressText : public ::testing::TestWithParam<SocketRow> {};

TEST_P(SocketAddressText, BracketsOnlyAnIpv6AddressWithAPort) {
  SocketRow const& row = GetParam();
  CSocketAddr socketAddr;
  ASSERT_TRUE(socketAddr.Set(row.address, row.port));
  EXPECT_EQ(hostPortStr(socketAddr), row.text);
}

INSTANTIATE_TEST_SUITE_P(Rows,
                         SocketAddressText,
                         ::testing::Values(SocketRow{"192.0.2.7", 5060, "192.0.2.7:5060"},
                                           SocketRow{"192.0.2.7", 0, "192.0.2.7"},
                                           SocketRow{"2001:db8::1", 5061, "[2001:db8::1]:5061"},
                                           SocketRow{"2001:db8::1", 0, "2001:db8::1"}));

CNameAddr parsed(char const* text) {
  CNameAddr nameAddr;
  EXPECT_TRUE(nameAddr.Parse(text, std::strlen(text))) << text;
  return nameAddr;
}

TEST(NameAddrToString, ReplacesWhatTheOutputHeldAndReturnsIt) {
  String out("stale text");
  String const& result = LS_nameAddrToString(parsed("Alice <sip:alice@example.com>"), out);
  EXPECT_EQ(&result, &out);
  EXPECT_EQ(out, "\"Alice\" <sip:alice@example.com>");
}

TEST(NameAddrToString, GivesTheSameTextAsANewString) {
  CNameAddr const nameAddr = parsed("<sip:bob@example.com;transport=tcp>");
  String out;
  EXPECT_EQ(LS_nameAddrToString(nameAddr), LS_nameAddrToString(nameAddr, out));
  EXPECT_EQ(LS_nameAddrToString(nameAddr), "<sip:bob@example.com;transport=tcp>");
}

TEST(NameAddrToString, GivesTheEmptyTextForANameAddrWithoutUri) {
  String out("stale text");
  EXPECT_EQ(LS_nameAddrToString(CNameAddr(), out), "");
}

TEST(EmptyHostPort, IsTheSameEmptyObjectOnEveryCall) {
  EXPECT_EQ(&LS_emptyHostPort(), &LS_emptyHostPort());
  EXPECT_EQ(LS_emptyHostPort(), CHostPort());
}

}  // namespace
