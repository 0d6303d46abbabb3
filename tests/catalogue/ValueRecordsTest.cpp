#include "LS_Proxy.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "LS_Alias.h"
#include "LS_AliasRange.h"
#include "LS_Contact.h"
#include "LS_ForcedDestination.h"
#include "LS_LifetimeRange.h"

namespace {

CHostPort const kProxy("proxy.example.com", 5060);
CHostPort const kProxyTls("proxy.example.com", 5061);
CHostPort const kOtherHost("other.example.com", 5060);

// Two values and whether they must compare equal; == and != are checked
// together so that neither may drift from the other.
template <class T>
struct EqualityRow {
  char const* description;
  T left;
  T right;
  bool equal;
};

template <class T>
void expectEquality(EqualityRow<T> const& row) {
  EXPECT_EQ(row.left == row.right, row.equal) << row.description;
  EXPECT_EQ(row.left != row.right, !row.equal) << row.description;
}

using ProxyRow = EqualityRow<LS_Proxy>;

class ProxyEquality : public ::testing::TestWithParam<ProxyRow> {};

TEST_P(ProxyEquality, ComparesBothAddressesAndTheRouteFlag) {
  expectEquality(GetParam());
}

INSTANTIATE_TEST_SUITE_P(Rows,
                         ProxyEquality,
                         ::testing::Values(ProxyRow{"same fields", LS_Proxy(kProxy, kProxyTls, true),
                                                    LS_Proxy(kProxy, kProxyTls, true), true},
                                           ProxyRow{"route flags differ", LS_Proxy(kProxy, kProxyTls, true),
                                                    LS_Proxy(kProxy, kProxyTls, false), false},
                                           ProxyRow{"TLS ports differ", LS_Proxy(kProxy, kProxyTls, false),
                                                    LS_Proxy(kProxy, kProxy, false), false},
                                           ProxyRow{"hosts differ", LS_Proxy(kProxy, kProxyTls, false),
                                                    LS_Proxy(kOtherHost, kProxyTls, false), false},
                                           ProxyRow{"default is two empty host-ports with loose routing",
                                                    LS_Proxy(), LS_Proxy(CHostPort(), CHostPort(), false),
                                                    true}));

LS_ForcedDestination forced(CHostPort const& udpTcp, CHostPort const& tls, LS_ForcedDestination::Type type) {
  LS_ForcedDestination destination;
  destination.udpTcpAddress = udpTcp;
  destination.tlsDestination = tls;
  destination.type = type;
  return destination;
}

using ForcedRow = EqualityRow<LS_ForcedDestination>;

class ForcedDestinationEquality : public ::testing::TestWithParam<ForcedRow> {};

TEST_P(ForcedDestinationEquality, ComparesBothAddressesAndTheType) {
  expectEquality(GetParam());
}

INSTANTIATE_TEST_SUITE_P(
    Rows,
    ForcedDestinationEquality,
    ::testing::Values(ForcedRow{"same fields", forced(kProxy, kProxyTls, LS_ForcedDestination::MANUAL),
                                forced(kProxy, kProxyTls, LS_ForcedDestination::MANUAL), true},
                      ForcedRow{"types differ", forced(kProxy, kProxyTls, LS_ForcedDestination::MANUAL),
                                forced(kProxy, kProxyTls, LS_ForcedDestination::REGISTRAR_ADDRESS), false},
                      ForcedRow{"unused addresses still count",
                                forced(kProxy, kProxyTls, LS_ForcedDestination::REGISTRAR_ADDRESS),
                                forced(kOtherHost, kProxyTls, LS_ForcedDestination::REGISTRAR_ADDRESS),
                                false},
                      ForcedRow{"TLS destinations differ",
                                forced(kProxy, kProxyTls, LS_ForcedDestination::MANUAL),
                                forced(kProxy, kOtherHost, LS_ForcedDestination::MANUAL), false},
                      ForcedRow{"default is manual with empty host-ports", LS_ForcedDestination(),
                                forced(CHostPort(), CHostPort(), LS_ForcedDestination::MANUAL), true}));

using AliasRangeRow = EqualityRow<LS_AliasRange>;

class AliasRangeEquality : public ::testing::TestWithParam<AliasRangeRow> {};

TEST_P(AliasRangeEquality, ComparesBothEndsByteForByte) {
  AliasRangeRow const& row = GetParam();
  EXPECT_EQ(row.left == row.right, row.equal) << row.description;
}

INSTANTIATE_TEST_SUITE_P(
    Rows,
    AliasRangeEquality,
    ::testing::Values(AliasRangeRow{"same ends", {"1000", "1999"}, {"1000", "1999"}, true},
                      AliasRangeRow{"first ends differ", {"1000", "1999"}, {"1001", "1999"}, false},
                      AliasRangeRow{"last ends differ", {"1000", "1999"}, {"1000", "2999"}, false},
                      AliasRangeRow{"case differs", {"a", "z"}, {"A", "z"}, false},
                      AliasRangeRow{"blank differs", {"1000", "1999"}, {"1000", "1999 "}, false}));

using LifetimeRow = EqualityRow<LS_LifetimeRange>;

class LifetimeRangeEquality : public ::testing::TestWithParam<LifetimeRow> {};

TEST_P(LifetimeRangeEquality, ComparesEveryField) {
  expectEquality(GetParam());
}

INSTANTIATE_TEST_SUITE_P(
    Rows,
    LifetimeRangeEquality,
    ::testing::Values(LifetimeRow{"same fields", {60, 3600, 600}, {60, 3600, 600}, true},
                      LifetimeRow{"minimums differ", {60, 3600, 600}, {61, 3600, 600}, false},
                      LifetimeRow{"maximums differ", {60, 3600, 600}, {60, 3601, 600}, false},
                      LifetimeRow{"defaults differ", {60, 3600, 600}, {60, 3600, 601}, false}));

TEST(ContactRecord, TakesItsSevenFieldsInDeclaredOrder) {
  CNameAddr address;
  ASSERT_TRUE(address.Parse("<sip:alice@example.com>", 23));
  LS_Contact const contact("call-1", address, kProxy, "home", "carrier", 7, 3600);
  EXPECT_EQ(contact.callId, "call-1");
  EXPECT_EQ(contact.contact, address);
  EXPECT_EQ(contact.received, kProxy);
  EXPECT_EQ(contact.context, "home");
  EXPECT_EQ(contact.provider, "carrier");
  EXPECT_EQ(contact.priority, 7u);
  EXPECT_EQ(contact.expires, 3600u);
}

class AliasRecord : public ::testing::Test {
 protected:
  void SetUp() override {
    alias.expressions.add("1[0-9]{3}");
    alias.patterns.add(RegEx::COMPILE_EXPRESSION("1[0-9]{3}"));
    ASSERT_TRUE(alias.patterns[0]);
  }

  // References held on the pattern, not counting the probe's own.
  static unsigned int holdersOf(RegEx::Pattern* pattern) {
    unsigned int const counted = pattern->addRef();
    pattern->release();
    return counted - 1;
  }

  LS_Alias alias;
};

TEST_F(AliasRecord, CopySharesTheCompiledPatterns) {
  LS_Alias const copy = alias;
  EXPECT_EQ(copy.patterns[0].get(), alias.patterns[0].get());
  EXPECT_EQ(holdersOf(copy.patterns[0].get()), 2u);
}

TEST_F(AliasRecord, CopyKeepsItsPatternWhenTheOriginalGoes) {
  auto original = std::make_unique<LS_Alias>(alias);
  LS_Alias const copy = *original;
  alias = LS_Alias();
  original.reset();
  ASSERT_EQ(copy.patterns.size(), 1u);
  EXPECT_EQ(holdersOf(copy.patterns[0].get()), 1u);
  EXPECT_TRUE(copy.patterns[0]->match("1234", 0).isSuccess());
}

}  // namespace
