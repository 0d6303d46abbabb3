#include "LS_EnumerationText.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "LS_AuthenticationProtocol.h"
#include "LS_AuthenticationType.h"
#include "LS_FilterType.h"
#include "LS_ForcedDestination.h"
#include "LS_IdentityFace.h"
#include "LS_IdentityType.h"
#include "LS_Imperative.h"
#include "LS_KeepAliveMethod.h"
#include "LS_MwiSubscriptionMode.h"
#include "LS_NatTraversalMethod.h"
#include "LS_ProtocolConfig.h"
#include "LS_RegistrationMode.h"
#include "LS_Strategy.h"
#include "LS_UriScheme.h"
#include "LS_User.h"
#include "PlatformTexts.h"

namespace {

template <class Holder>
char const* nameOf(uint32_t value) {
  return Holder::NAME(static_cast<typename Holder::Type>(value));
}

struct EnumerationRow {
  char const* holder;
  char const* (*name)(uint32_t);
  // Indexed by value; the values run from 0 without gaps.
  std::vector<char const*> texts;
};

std::vector<EnumerationRow> const kEnumerations = {
    {"LS_Strategy", &nameOf<LS_Strategy>, {"localOnly", "baseOnly", "localOrBase"}},
    {"LS_Imperative", &nameOf<LS_Imperative>, {"authoritative", "backup", "foreign"}},
    {"LS_IdentityType", &nameOf<LS_IdentityType>, {"Identity", "Identity-Group"}},
    {"LS_IdentityFace",
     &nameOf<LS_IdentityFace>,
     {"Outbound Authentication", "Inbound Authentication", "Outbound Registration", "Inbound Registration",
      "Message Subscription", "Outbound Call", "Inbound Call"}},
    {"LS_User", &nameOf<LS_User>, {"undefined", "phone", "ip", "dialstring"}},
    {"LS_AuthenticationType", &nameOf<LS_AuthenticationType>, {"Outbound", "Inbound"}},
    {"LS_RegistrationMode", &nameOf<LS_RegistrationMode>, {"none", "auto", "back-to-back"}},
    {"LS_NatTraversalMethod", &nameOf<LS_NatTraversalMethod>, {"none", "nortel", "address-detection"}},
    {"LS_KeepAliveMethod", &nameOf<LS_KeepAliveMethod>, {"none", "crlf", "options", "ping"}},
    {"LS_MwiSubscriptionMode", &nameOf<LS_MwiSubscriptionMode>, {"none", "explicit", "implicit"}},
    {"LS_FilterType", &nameOf<LS_FilterType>, {"accept", "deny"}},
    {"LS_AuthenticationProtocol", &nameOf<LS_AuthenticationProtocol>, {"HTTP", "3GPP"}},
    {"LS_ProtocolConfig",
     &nameOf<LS_ProtocolConfig>,
     {"preferred-none", "preferred-udp-tcp-tls", "preferred-udp-tls-tcp", "preferred-tcp-udp-tls",
      "preferred-tcp-tls-udp", "preferred-tls-udp-tcp", "preferred-tls-tcp-udp", "forced-tls", "forced-tcp",
      "forced-udp"}},
    {"LS_UriScheme", &nameOf<LS_UriScheme>, {"sip", "sips", "transparent"}},
};

class EnumerationNames : public ::testing::TestWithParam<EnumerationRow> {};

TEST_P(EnumerationNames, GiveTheTextOfEachValue) {
  EnumerationRow const& row = GetParam();
  for (size_t value = 0; value < row.texts.size(); ++value)
    EXPECT_STREQ(row.name(static_cast<uint32_t>(value)), row.texts[value]) << row.holder << " " << value;
}

TEST_P(EnumerationNames, GiveTheInvalidTextJustPastTheTable) {
  EnumerationRow const& row = GetParam();
  EXPECT_STREQ(row.name(static_cast<uint32_t>(row.texts.size())), ERROR::INVALID) << row.holder;
}

TEST_P(EnumerationNames, GiveTheInvalidTextForTheLargestValue) {
  EnumerationRow const& row = GetParam();
  EXPECT_STREQ(row.name(UINT32_MAX), ERROR::INVALID) << row.holder;
}

INSTANTIATE_TEST_SUITE_P(All,
                         EnumerationNames,
                         ::testing::ValuesIn(kEnumerations),
                         [](::testing::TestParamInfo<EnumerationRow> const& info) {
                           return std::string(info.param.holder);
                         });

TEST(ForcedDestinationNames, GiveTheTextOfEachType) {
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(0), "manual");
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(1), "registrar-address");
}

// The one enumeration with an invalid-value text of its own; the others,
// LS_FilterType at the same value for one, keep the platform's.
TEST(ForcedDestinationNames, GiveTheirOwnInvalidTextPastTheTable) {
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(2), "(invalid)");
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(UINT32_MAX), "(invalid)");
  EXPECT_STREQ(nameOf<LS_FilterType>(2), ERROR::INVALID);
}

}  // namespace
