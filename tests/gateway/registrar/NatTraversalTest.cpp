#include "registrar/NatTraversal.h"

#include <gtest/gtest.h>

namespace {

struct Case {
  char const* contact;
  char const* source;
  char const* target;                     // null when the contact stands as it is
  sip_transp transport = SIP_TRANSP_UDP;  // what the REGISTER came over
};

class NatTraversalTest : public testing::TestWithParam<Case> {};

TEST_P(NatTraversalTest, RedirectsUnreachableContactsToTheirSource) {
  Case const& c = GetParam();
  pl contact;
  pl_set_str(&contact, c.contact);
  sa source;
  ASSERT_EQ(sa_decode(&source, c.source, std::char_traits<char>::length(c.source)), 0);
  std::string target = "untouched";
  bool const nated = NatTraversal::natedTarget(contact, source, c.transport, target);
  if (c.target) {
    EXPECT_TRUE(nated) << c.contact;
    EXPECT_EQ(target, c.target);
  } else {
    EXPECT_FALSE(nated) << c.contact;
    EXPECT_EQ(target, "untouched");
  }
}

INSTANTIATE_TEST_SUITE_P(
    Ranges,
    NatTraversalTest,
    testing::Values(Case{"sip:alice@192.168.1.10:5062;transport=udp", "203.0.113.5:40312",
                         "sip:alice@203.0.113.5:40312;transport=udp"},
                    Case{"sip:alice@10.1.2.3", "203.0.113.5:5060", "sip:alice@203.0.113.5:5060"},
                    Case{"sip:alice@172.31.255.1:5060", "203.0.113.5:1024", "sip:alice@203.0.113.5:1024"},
                    Case{"sip:alice@100.64.0.9:5060", "203.0.113.5:1024", "sip:alice@203.0.113.5:1024"},
                    Case{"sip:alice@169.254.7.7:5060", "203.0.113.5:1024", "sip:alice@203.0.113.5:1024"},
                    Case{"sip:alice@[fe80::1]:5062", "[2001:db8::5]:5062", "sip:alice@[2001:db8::5]:5062"},
                    Case{"sip:alice@127.0.0.1:5999?X=y", "127.0.0.1:5062", "sip:alice@127.0.0.1:5062?X=y"},
                    // Reachable as registered: a public address, a name, the source itself.
                    Case{"sip:alice@198.51.100.7:5062", "203.0.113.5:40312", nullptr},
                    Case{"sip:alice@172.32.0.1:5062", "203.0.113.5:40312", nullptr},
                    Case{"sip:alice@100.128.0.1:5062", "203.0.113.5:40312", nullptr},
                    Case{"sip:alice@phone.example.com", "203.0.113.5:40312", nullptr},
                    Case{"sip:alice@192.168.1.10:5062", "192.168.1.10:5062", nullptr},
                    Case{"sip:alice@192.168.1.10", "192.168.1.10:5060", nullptr},
                    Case{"sip:alice@[fd00::2]:5062", "[2001:db8::5]:5062", nullptr},
                    // Over a connection the source port is the connection's
                    // own, never the port the phone listens on: only the
                    // address tells whether a NAT stands between.
                    Case{"sip:u2@127.0.0.1:5070;transport=tcp", "127.0.0.1:46038", nullptr, SIP_TRANSP_TCP},
                    Case{"sip:u2@[fe80::1]:5061;transport=tls", "[fe80::1]:51000", nullptr, SIP_TRANSP_TLS},
                    Case{"sip:u2@192.168.1.10:5070;transport=tcp", "203.0.113.5:46038",
                         "sip:u2@203.0.113.5:46038;transport=tcp", SIP_TRANSP_TCP}));

}  // namespace
