#include "CHostPort.h"

#include <gtest/gtest.h>

#include <string>

namespace {

struct HostPortCase {
  std::string text;
  bool valid;
  char const* host;
  unsigned short port;
};

void PrintTo(HostPortCase const& c, std::ostream* os) {
  *os << '"' << c.text << '"';
}

class CHostPortParse : public ::testing::TestWithParam<HostPortCase> {};

TEST_P(CHostPortParse, GivesHostAndPortOrFailsWithEmptyValue) {
  HostPortCase const& c = GetParam();
  CHostPort hostPort(CString("previous"), 1);
  EXPECT_EQ(c.valid, hostPort.Parse(c.text.data(), c.text.size()));
  EXPECT_EQ(CString(c.host), hostPort.GetHost());
  EXPECT_EQ(c.port, hostPort.GetPort());
}

INSTANTIATE_TEST_SUITE_P(Table,
                         CHostPortParse,
                         ::testing::Values(HostPortCase{"example.com", true, "example.com", 0},
                                           HostPortCase{"Example.COM:5060", true, "Example.COM", 5060},
                                           HostPortCase{"10.0.0.1:65535", true, "10.0.0.1", 65535},
                                           HostPortCase{"host:0", true, "host", 0},
                                           HostPortCase{"host:05061", true, "host", 5061},
                                           HostPortCase{"*.example.com", true, "*.example.com", 0},
                                           HostPortCase{"sip_gw-1.local:5080", true, "sip_gw-1.local", 5080},
                                           HostPortCase{"[::1]", true, "[::1]", 0},
                                           HostPortCase{"[2001:db8::10]:5061", true, "[2001:db8::10]", 5061},
                                           HostPortCase{"[::ffff:10.0.0.1]:1", true, "[::ffff:10.0.0.1]", 1},
                                           HostPortCase{"", false, "", 0},
                                           HostPortCase{":5060", false, "", 0},
                                           HostPortCase{"host:", false, "", 0},
                                           HostPortCase{"host:65536", false, "", 0},
                                           HostPortCase{"host:99999999999999999999", false, "", 0},
                                           HostPortCase{"host:+5060", false, "", 0},
                                           HostPortCase{"host:-1", false, "", 0},
                                           HostPortCase{"host:50a", false, "", 0},
                                           HostPortCase{"host:5060:1", false, "", 0},
                                           HostPortCase{"::1", false, "", 0},
                                           HostPortCase{"[::1", false, "", 0},
                                           HostPortCase{"::1]", false, "", 0},
                                           HostPortCase{"[]", false, "", 0},
                                           HostPortCase{"[::1]]", false, "", 0},
                                           HostPortCase{"[::1]x", false, "", 0},
                                           HostPortCase{"[::1]:", false, "", 0},
                                           HostPortCase{"[10.0.0.1]", false, "", 0},
                                           HostPortCase{"[1:2:3:4:5:6:7:8:9]", false, "", 0},
                                           HostPortCase{"[example.com]", false, "", 0},
                                           HostPortCase{"ho st", false, "", 0},
                                           HostPortCase{" host", false, "", 0},
                                           HostPortCase{"user@host", false, "", 0},
                                           HostPortCase{"host/path", false, "", 0},
                                           HostPortCase{"host\r\n", false, "", 0},
                                           HostPortCase{std::string("host\0evil", 9), false, "", 0},
                                           HostPortCase{std::string("[::1\0]", 6), false, "", 0},
                                           HostPortCase{std::string("host:50\0"
                                                                    "60",
                                                                    10),
                                                        false, "", 0}));

TEST(CHostPort, AcceptsA64KiBHost) {
  std::string const text(64 * 1024, 'a');
  CHostPort hostPort;
  ASSERT_TRUE(hostPort.Parse(text.data(), text.size()));
  EXPECT_EQ(text.size(), hostPort.GetHost().length());
}

TEST(CHostPort, NullTextFails) {
  CHostPort hostPort(CString("host"), 5060);
  EXPECT_FALSE(hostPort.Parse(nullptr, 5));
  EXPECT_EQ(CHostPort(), hostPort);
}

TEST(CHostPort, AssigningMalformedTextResetsTheValue) {
  CHostPort hostPort(CString("host"), 5060);
  hostPort = CString("bad host:1");
  EXPECT_EQ(CHostPort(), hostPort);
}

TEST(CHostPort, AssigningItsOwnHostTextKeepsTheHost) {
  CHostPort hostPort(CString("example.com"), 5060);
  hostPort = hostPort.GetHost();
  EXPECT_EQ(CHostPort(CString("example.com"), 0), hostPort);
}

TEST(CHostPort, EqualityComparesHostBytesAndPort) {
  CHostPort const a(CString("example.com"), 5060);
  EXPECT_EQ(a, CHostPort(CString("example.com"), 5060));
  EXPECT_NE(a, CHostPort(CString("example.com"), 0));
  EXPECT_NE(a, CHostPort(CString("EXAMPLE.com"), 5060));
  EXPECT_NE(a, CHostPort(CString("example.co"), 5060));
}

TEST(CHostPort, TheDoNotOutputMarkerIsTheNoPortValue) {
  EXPECT_EQ(0, CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT);
  EXPECT_EQ(CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT, CHostPort().GetPort());
}

}  // namespace
