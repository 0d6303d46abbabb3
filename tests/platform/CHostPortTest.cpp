#include "CHostPort.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

struct HostPortCase {
  std::string text;
  char const* host;
  unsigned short port;
};

void PrintTo(HostPortCase const& c, std::ostream* os) {
  *os << '"' << c.text << '"';
}

class CHostPortParse : public ::testing::TestWithParam<HostPortCase> {};

TEST_P(CHostPortParse, GivesHostAndPort) {
  CHostPort hostPort(CString("previous"), 1);
  ASSERT_TRUE(hostPort.Parse(GetParam().text.data(), GetParam().text.size()));
  EXPECT_EQ(CHostPort(CString(GetParam().host), GetParam().port), hostPort);
}

INSTANTIATE_TEST_SUITE_P(Table,
                         CHostPortParse,
                         ::testing::Values(HostPortCase{"example.com", "example.com", 0},
                                           HostPortCase{"Example.COM:5060", "Example.COM", 5060},
                                           HostPortCase{"10.0.0.1:65535", "10.0.0.1", 65535},
                                           HostPortCase{"host:0", "host", 0},
                                           HostPortCase{"host:05061", "host", 5061},
                                           HostPortCase{"*.example.com", "*.example.com", 0},
                                           HostPortCase{"sip_gw-1.local:5080", "sip_gw-1.local", 5080},
                                           HostPortCase{"[::1]", "[::1]", 0},
                                           HostPortCase{"[2001:db8::10]:5061", "[2001:db8::10]", 5061},
                                           HostPortCase{"[::ffff:10.0.0.1]:1", "[::ffff:10.0.0.1]", 1}));

class CHostPortMalformed : public ::testing::TestWithParam<std::string> {};

TEST_P(CHostPortMalformed, FailsWithTheEmptyValue) {
  CHostPort hostPort(CString("previous"), 1);
  EXPECT_FALSE(hostPort.Parse(GetParam().data(), GetParam().size()));
  EXPECT_EQ(CHostPort(), hostPort);
}

INSTANTIATE_TEST_SUITE_P(Ports,
                         CHostPortMalformed,
                         ::testing::ValuesIn(std::vector<std::string>(
                             {"", ":5060", "host:", "host:65536", "host:99999999999999999999", "host:+5060",
                              "host:-1", "host:50a", "host:5060:1"})));

INSTANTIATE_TEST_SUITE_P(HostsAndBrackets,
                         CHostPortMalformed,
                         ::testing::ValuesIn(std::vector<std::string>(
                             {"::1", "[::1", "::1]", "[]", "[::1]]", "[::1]x", "[::1]:", "[10.0.0.1]",
                              "[1:2:3:4:5:6:7:8:9]", "[example.com]", "ho st", " host", "user@host",
                              "host/path", "host\r\n"})));

INSTANTIATE_TEST_SUITE_P(NulBytes,
                         CHostPortMalformed,
                         ::testing::Values(std::string("host\0evil", 9),
                                           std::string("[::1\0]", 6),
                                           std::string("host:50\00060", 10)));

// Configuration may write what a URI from the network may not; whatever
// both accept, they read as the same value.
struct HostGrammarCase {
  char const* text;
  bool configured;
  bool uri;
};

class CHostPortGrammar : public ::testing::TestWithParam<HostGrammarCase> {};

TEST_P(CHostPortGrammar, UriHostsAreTheStrictSubsetOfConfiguredOnes) {
  std::string const text = GetParam().text;
  CHostPort configured;
  CHostPort uri(CString("previous"), 1);
  EXPECT_EQ(GetParam().configured, configured.Parse(text.data(), text.size()));
  EXPECT_EQ(GetParam().uri, uri.ParseUriHostPort(text.data(), text.size()));
  EXPECT_EQ(GetParam().uri ? configured : CHostPort(), uri);
}

INSTANTIATE_TEST_SUITE_P(Table,
                         CHostPortGrammar,
                         ::testing::Values(HostGrammarCase{"gw-1.Example.com.:5060", true, true},
                                           HostGrammarCase{"a", true, true},
                                           HostGrammarCase{"010.0.0.255", true, true},
                                           HostGrammarCase{"[2001:db8::1]:5061", true, true},
                                           HostGrammarCase{"*.example.com", true, false},
                                           HostGrammarCase{"sip_gw.local", true, false},
                                           HostGrammarCase{"a..example.com", true, false},
                                           HostGrammarCase{"-a.example.com", true, false},
                                           HostGrammarCase{"a-.example.com", true, false},
                                           HostGrammarCase{"example.123", true, false},
                                           HostGrammarCase{"10.0.0.256", true, false},
                                           HostGrammarCase{"10.0.0", true, false},
                                           HostGrammarCase{"0001.0.0.1", true, false}));

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

TEST(CHostPort, AssigningTextParsesItAndMalformedTextResetsTheValue) {
  CHostPort hostPort(CString("example.com"), 5060);
  hostPort = hostPort.GetHost();
  EXPECT_EQ(CHostPort(CString("example.com"), 0), hostPort);
  hostPort = CString("bad host:1");
  EXPECT_EQ(CHostPort(), hostPort);
}

TEST(CHostPort, EqualityComparesPortAndHostIgnoringAsciiCase) {
  CHostPort const a(CString("example.com"), 5060);
  EXPECT_EQ(a, CHostPort(CString("EXAMPLE.com"), 5060));
  EXPECT_NE(a, CHostPort(CString("example.com"), 0));
  EXPECT_NE(a, CHostPort(CString("example.co"), 5060));
  EXPECT_STREQ("Example.COM", CHostPort(CString("Example.COM"), 0).GetHost().c_str()) << "kept as written";
}

}  // namespace
