#include "CSocketAddr.h"

#include <gtest/gtest.h>

namespace {

struct SocketAddrCase {
  char const* address;
  bool valid;
  unsigned int kind;
  char const* text;
};

void PrintTo(SocketAddrCase const& c, std::ostream* os) {
  *os << '"' << (c.address ? c.address : "(null)") << '"';
}

class CSocketAddrSet : public ::testing::TestWithParam<SocketAddrCase> {};

// A failed Set forgets the previous address.
TEST_P(CSocketAddrSet, GivesKindAndNumericTextOrTheDefault) {
  SocketAddrCase const& c = GetParam();
  CSocketAddr address;
  ASSERT_TRUE(address.Set("::1", 5061));
  EXPECT_EQ(c.valid, address.Set(c.address, 5060));
  EXPECT_EQ(c.kind, address.GetKind());
  EXPECT_EQ(CString(c.text), address.GetAddress(true));
  EXPECT_EQ(c.valid ? 5060 : 0, address.GetPort());
}

INSTANTIATE_TEST_SUITE_P(
    Table,
    CSocketAddrSet,
    ::testing::Values(SocketAddrCase{"192.168.1.20", true, CSocketAddr::KIND_IPV4, "192.168.1.20"},
                      SocketAddrCase{"2001:DB8:0:0::1", true, CSocketAddr::KIND_IPV6, "2001:db8::1"},
                      SocketAddrCase{"::", true, CSocketAddr::KIND_IPV6, "::"},
                      SocketAddrCase{"[::1]", false, CSocketAddr::KIND_IPV4, "0.0.0.0"},
                      SocketAddrCase{"256.1.1.1", false, CSocketAddr::KIND_IPV4, "0.0.0.0"},
                      SocketAddrCase{"example.com", false, CSocketAddr::KIND_IPV4, "0.0.0.0"},
                      SocketAddrCase{"", false, CSocketAddr::KIND_IPV4, "0.0.0.0"},
                      SocketAddrCase{nullptr, false, CSocketAddr::KIND_IPV4, "0.0.0.0"}));

}  // namespace
