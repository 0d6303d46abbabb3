#include "IpAddress.h"

#include <gtest/gtest.h>

#include <string>

namespace {

struct IpAddressCase {
  std::string address;
  std::string netMask;
  bool valid;
  char const* addressText;
  char const* netMaskText;
};

void PrintTo(IpAddressCase const& c, std::ostream* os) {
  *os << '"' << c.address << "\" / \"" << c.netMask << '"';
}

class IpAddressSet : public ::testing::TestWithParam<IpAddressCase> {};

TEST_P(IpAddressSet, GivesCanonicalTextsOrTheEmptyValue) {
  IpAddressCase const& c = GetParam();
  IpAddress address;
  ASSERT_TRUE(address.set("10.9.9.9", "255.255.0.0"));
  EXPECT_EQ(c.valid, address.set(String(c.address.data(), c.address.size()),
                                 String(c.netMask.data(), c.netMask.size())));
  String text("unchanged");
  String mask("unchanged");
  address.getIpAddrAsString(text);
  address.getNetMaskAsString(mask);
  EXPECT_EQ(String(c.addressText), text);
  EXPECT_EQ(String(c.netMaskText), mask);
  EXPECT_EQ(*c.addressText == '\0', address.isEmpty());
}

INSTANTIATE_TEST_SUITE_P(
    Table,
    IpAddressSet,
    ::testing::Values(IpAddressCase{"10.0.0.0", "255.0.0.0", true, "10.0.0.0", "255.0.0.0"},
                      IpAddressCase{"10.1.2.3", "255.0.0.0", true, "10.1.2.3", "255.0.0.0"},
                      IpAddressCase{"192.168.1.7", "", true, "192.168.1.7", "255.255.255.255"},
                      IpAddressCase{"0.0.0.0", "0.0.0.0", true, "0.0.0.0", "0.0.0.0"},
                      IpAddressCase{"2001:DB8:0::0", "ffff:ffff::", true, "2001:db8::", "ffff:ffff::"},
                      IpAddressCase{"::1", "", true, "::1", "ffff:ffff:ffff:ffff:ffff:ffff:ffff:ffff"},
                      IpAddressCase{"", "", true, "", ""},
                      IpAddressCase{"", "255.0.0.0", false, "", ""},
                      IpAddressCase{"10.0.0.0", "255.0.255.0", false, "", ""},
                      IpAddressCase{"10.0.0.0", "ffff::", false, "", ""},
                      IpAddressCase{"2001:db8::", "255.255.0.0", false, "", ""},
                      IpAddressCase{"10.0.0", "255.0.0.0", false, "", ""},
                      IpAddressCase{"10.0.0.256", "", false, "", ""},
                      IpAddressCase{"any", "", false, "", ""},
                      IpAddressCase{"[::1]", "", false, "", ""},
                      IpAddressCase{" 10.0.0.1", "", false, "", ""},
                      IpAddressCase{std::string("10.0.0.1\0x", 10), "", false, "", ""},
                      IpAddressCase{"10.0.0.1", std::string("255.0.0.0\0", 10), false, "", ""},
                      IpAddressCase{std::string(64 * 1024, '1'), "", false, "", ""}));

IpAddress ipAddress(char const* address, char const* netMask) {
  IpAddress ip;
  EXPECT_TRUE(ip.set(address, netMask)) << address << " / " << netMask;
  return ip;
}

TEST(IpAddress, EqualityComparesAddressAndMask) {
  IpAddress const a = ipAddress("10.0.0.0", "255.0.0.0");
  EXPECT_TRUE(a == ipAddress("10.0.0.0", "255.0.0.0"));
  EXPECT_FALSE(a == ipAddress("10.0.0.0", "255.255.0.0"));
  EXPECT_FALSE(a == ipAddress("10.0.0.1", "255.0.0.0"));
  EXPECT_FALSE(a == IpAddress());
  EXPECT_TRUE(IpAddress() == IpAddress());
}

}  // namespace
