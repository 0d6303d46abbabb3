#include "LS_Proxy.h"

#include <gtest/gtest.h>

#include <initializer_list>
#include <memory>
#include <type_traits>

#include "LS_Alias.h"
#include "LS_AliasRange.h"
#include "LS_Credentials.h"
#include "LS_ForcedDestination.h"
#include "LS_LifetimeRange.h"

namespace {

// Copied by value like every record, though it holds a counted reference.
static_assert(std::is_copy_constructible_v<LS_Credentials> && std::is_copy_assignable_v<LS_Credentials>);

CHostPort const kProxy("proxy.example.com", 5060);
CHostPort const kProxyTls("proxy.example.com", 5061);
CHostPort const kOtherHost("other.example.com", 5060);

// Each variant differs from value in one field, so each field must take part in the comparison.
template <class T>
void expectEveryFieldCompared(T const& value, std::initializer_list<T> variants) {
  EXPECT_TRUE(value == T(value));
  int field = 0;
  for (T const& variant : variants)
    EXPECT_FALSE(value == variant) << "variant " << field++;
}

using Forced = LS_ForcedDestination;

TEST(ValueRecords, ProxyComparesBothAddressesAndTheRouteFlag) {
  expectEveryFieldCompared(LS_Proxy(kProxy, kProxyTls, true),
                           {LS_Proxy(kOtherHost, kProxyTls, true), LS_Proxy(kProxy, kProxy, true),
                            LS_Proxy(kProxy, kProxyTls, false)});
  EXPECT_TRUE(LS_Proxy() == LS_Proxy(CHostPort(), CHostPort(), false));
}

// The address the type does not use still counts.
TEST(ValueRecords, ForcedDestinationComparesBothAddressesAndTheType) {
  expectEveryFieldCompared(
      Forced{kProxy, kProxyTls, Forced::REGISTRAR_ADDRESS},
      {Forced{kOtherHost, kProxyTls, Forced::REGISTRAR_ADDRESS},
       Forced{kProxy, kOtherHost, Forced::REGISTRAR_ADDRESS}, Forced{kProxy, kProxyTls, Forced::MANUAL}});
  EXPECT_TRUE(Forced() == (Forced{CHostPort(), CHostPort(), Forced::MANUAL}));
}

TEST(ValueRecords, AliasRangeComparesBothEndsByteForByte) {
  expectEveryFieldCompared(LS_AliasRange{"a1000", "a1999"},
                           {LS_AliasRange{"a1001", "a1999"}, LS_AliasRange{"a1000", "a2999"},
                            LS_AliasRange{"A1000", "a1999"}, LS_AliasRange{"a1000", "a1999 "}});
}

TEST(ValueRecords, LifetimeRangeComparesEveryField) {
  expectEveryFieldCompared(
      LS_LifetimeRange{60, 3600, 600},
      {LS_LifetimeRange{61, 3600, 600}, LS_LifetimeRange{60, 3601, 600}, LS_LifetimeRange{60, 3600, 601}});
}

// References held on the pattern, not counting the probe's own.
unsigned int holdersOf(RegEx::Pattern* pattern) {
  unsigned int const counted = pattern->addRef();
  pattern->release();
  return counted - 1;
}

TEST(ValueRecords, AliasCopySharesItsCompiledPatternAndKeepsItWhenTheOriginalGoes) {
  auto original = std::make_unique<LS_Alias>();
  original->expressions.add("1[0-9]{3}");
  original->patterns.add(RegEx::COMPILE_EXPRESSION("1[0-9]{3}"));
  ASSERT_TRUE(original->patterns[0]);
  LS_Alias const copy = *original;
  EXPECT_EQ(copy.patterns[0].get(), original->patterns[0].get());
  EXPECT_EQ(holdersOf(copy.patterns[0].get()), 2u);
  original.reset();
  EXPECT_EQ(holdersOf(copy.patterns[0].get()), 1u);
  EXPECT_TRUE(copy.patterns[0]->match("1234", 0).isSuccess());
}

}  // namespace
