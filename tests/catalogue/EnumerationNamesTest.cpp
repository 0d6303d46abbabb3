#include "LS_EnumerationText.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <set>
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

using NameFn = char const* (*)(uint32_t);

template <class Holder>
char const* nameOf(uint32_t value) {
  return Holder::NAME(static_cast<typename Holder::Type>(value));
}

struct EnumerationRow {
  NameFn name;
  uint32_t values;  // they run from 0 without gaps
  char const* first;
  char const* last;
};

// Distinct texts, first and last pinned (the odd spellings sit last), the platform's invalid text past them.
TEST(EnumerationNames, GiveDistinctTextsForEachValueAndTheInvalidTextPastThem) {
  std::vector<EnumerationRow> const rows = {
      {nameOf<LS_Strategy>, 3, "localOnly", "localOrBase"},
      {nameOf<LS_Imperative>, 3, "authoritative", "foreign"},
      {nameOf<LS_IdentityType>, 2, "Identity", "Identity-Group"},
      {nameOf<LS_IdentityFace>, 7, "Outbound Authentication", "Inbound Call"},
      {nameOf<LS_User>, 4, "undefined", "dialstring"},
      {nameOf<LS_AuthenticationType>, 2, "Outbound", "Inbound"},
      {nameOf<LS_RegistrationMode>, 3, "none", "back-to-back"},
      {nameOf<LS_NatTraversalMethod>, 3, "none", "address-detection"},
      {nameOf<LS_KeepAliveMethod>, 4, "none", "ping"},
      {nameOf<LS_MwiSubscriptionMode>, 3, "none", "implicit"},
      {nameOf<LS_FilterType>, 2, "accept", "deny"},
      {nameOf<LS_AuthenticationProtocol>, 2, "HTTP", "3GPP"},
      {nameOf<LS_ProtocolConfig>, 10, "preferred-none", "forced-udp"},
      {nameOf<LS_UriScheme>, 3, "sip", "transparent"},
  };
  for (EnumerationRow const& row : rows) {
    std::set<std::string> texts;
    for (uint32_t value = 0; value < row.values; ++value) {
      std::string const text = row.name(value);
      EXPECT_NE(text, ERROR::INVALID) << row.first << " " << value;
      EXPECT_TRUE(texts.insert(text).second) << text;
    }
    EXPECT_STREQ(row.name(0), row.first);
    EXPECT_STREQ(row.name(row.values - 1), row.last);
    EXPECT_STREQ(row.name(row.values), ERROR::INVALID) << row.first;
    EXPECT_STREQ(row.name(UINT32_MAX), ERROR::INVALID) << row.first;
  }
  EXPECT_STREQ(nameOf<LS_ProtocolConfig>(1), "preferred-udp-tcp-tls");
  EXPECT_STREQ(nameOf<LS_KeepAliveMethod>(1), "crlf");
}

// The one enumeration with an invalid-value text of its own; the others,
// LS_FilterType at the same value for one, keep the platform's.
TEST(ForcedDestinationNames, GiveTheirOwnInvalidTextPastTheirTwoTexts) {
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(0), "manual");
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(1), "registrar-address");
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(2), "(invalid)");
  EXPECT_STREQ(nameOf<LS_ForcedDestination>(UINT32_MAX), "(invalid)");
  EXPECT_STREQ(nameOf<LS_FilterType>(2), ERROR::INVALID);
  EXPECT_STRNE(ERROR::INVALID, "(invalid)");
}

}  // namespace
