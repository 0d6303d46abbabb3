#include "LS_CMwiSubscription.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "DumpRows.h"
#include "FaceValueFamilies.h"
#include "support/LogCapture.h"

namespace {

using Face = LS_CMwiSubscription;

std::vector<FaceValueFamily> const& mwiFamilies() {
  static FaceValueFamilies<Face> families;
  static bool const filled = [] {
    families
        .add("Lifetime", "lifetime", 600u, 60u, &Face::setConfigLifetime, &Face::getConfigLifetime,
             &Face::getLifetime, "3600", &Face::removeConfigLifetime)
        .add("MwiSubscriptionMode", "mode", LS_MwiSubscriptionMode::EXPLICIT,
             LS_MwiSubscriptionMode::IMPLICIT, &Face::setConfigMwiSubscriptionMode,
             &Face::getConfigMwiSubscriptionMode, &Face::getMwiSubscriptionMode, "0",
             &Face::removeConfigMwiSubscriptionMode)
        .add("RetryTimeoutOnSystemError", "on-system-error", 20u, 30u,
             &Face::setConfigRetryTimeoutOnSystemError, &Face::getConfigRetryTimeoutOnSystemError,
             &Face::getRetryTimeoutOnSystemError, "10", &Face::removeConfigRetryTimeoutOnSystemError)
        .add("RetryTimeoutOnClientError", "on-client-error", 21u, 31u,
             &Face::setConfigRetryTimeoutOnClientError, &Face::getConfigRetryTimeoutOnClientError,
             &Face::getRetryTimeoutOnClientError, "10", &Face::removeConfigRetryTimeoutOnClientError)
        .add("RetryTimeoutOnServerError", "on-server-error", 22u, 32u,
             &Face::setConfigRetryTimeoutOnServerError, &Face::getConfigRetryTimeoutOnServerError,
             &Face::getRetryTimeoutOnServerError, "10", &Face::removeConfigRetryTimeoutOnServerError);
    return true;
  }();
  (void)filled;
  return families.rows();
}

INSTANTIATE_TEST_SUITE_P(MwiSubscription,
                         FaceValueFamilyTest,
                         ::testing::ValuesIn(mwiFamilies()),
                         familyName);

RefPtr<Face> makeFace() {
  return adoptRef(new Face);
}

unsigned short const NO_PORT = CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT;

// A message-waiting face and the same face of its base identity; dumps at
// level 1 with room to spare.
class MwiSubscriptionTest : public ::testing::Test {
 protected:
  MwiSubscriptionTest() { face->setBase(base.get()); }

  template <class Getter>
  static std::string pair(Face const& of, Getter getter) {
    CHostPort address;
    CHostPort tlsAddress;
    return (of.*getter)(address, tlsAddress).isSuccess() ? valueText(address) + " " + valueText(tlsAddress)
                                                         : NONE;
  }
  DumpRows dump(String const& prefix = String()) const {
    InfoContainer info;
    face->getInfo(info, 9, 1, 5, 2, prefix);
    return dumpRows(info);
  }

  RefPtr<Face> base = makeFace();
  RefPtr<Face> face = makeFace();
};

TEST_F(MwiSubscriptionTest, InheritedNotifierIsEffectiveButNotConfigured) {
  base->setConfigMwiNotifier(CHostPort("m", 5060), CHostPort("mt", 5061));

  EXPECT_EQ(pair(*face, &Face::getConfigMwiNotifier), NONE);
  EXPECT_EQ(pair(*face, &Face::getMwiNotifier), "m:5060 mt:5061");
}

TEST_F(MwiSubscriptionTest, RemovingTheNotifierDropsBothKeysAndShowsTheBasePair) {
  base->setConfigMwiNotifier(CHostPort("m", 5060), CHostPort("mt", 5061));
  face->setConfigMwiNotifier(CHostPort("n", 5062), CHostPort("nt", 5063));
  EXPECT_EQ(pair(*face, &Face::getConfigMwiNotifier), "n:5062 nt:5063");

  face->removeConfigMwiNotifier();

  EXPECT_FALSE(face->containsElement("mwi-notifier", LS_Strategy::LOCAL_ONLY));
  EXPECT_FALSE(face->containsElement("mwi-notifier-tls", LS_Strategy::LOCAL_ONLY));
  EXPECT_EQ(pair(*face, &Face::getMwiNotifier), "m:5060 mt:5061");
}

TEST_F(MwiSubscriptionTest, DynamicNotifierOfTheBaseFaceIsSeenButNeitherIsNorDumpsAsTheNotifier) {
  base->setDynamicMwiNotifier(CHostPort("d", 5070));

  CHostPort address;
  EXPECT_TRUE(face->getDynamicMwiNotifier(address).isSuccess());
  EXPECT_EQ(valueText(address), "d:5070");
  EXPECT_EQ(pair(*face, &Face::getMwiNotifier), NONE);
  for (std::string const& row : dump())
    EXPECT_EQ(row.find("Message-Server"), std::string::npos) << row;
}

TEST_F(MwiSubscriptionTest, NothingConfiguredDumpsTheHeadingTheOutboundRowsAndTheDefaults) {
  EXPECT_EQ(dump(), (DumpRows{
                        "1|Mwi Subscription|",
                        "2|Invite transaction timeout|32",
                        "2|Non-Invite transaction timeout|32",
                        "2|Subscription Lifetime|3600",
                        "2|Subscription Mode|none",
                    }));
}

TEST_F(MwiSubscriptionTest, DumpShowsTheEffectiveSettingsAfterThePrefixedHeading) {
  base->setConfigMwiNotifier(CHostPort("m", 5060), CHostPort("mt", 5061));
  face->setConfigLifetime(900);
  face->setConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::IMPLICIT);
  face->setConfigRetryTimeoutOnClientError(40);
  face->insertConfigProxy(0, CHostPort("p", 5060), CHostPort("p", NO_PORT), true);

  EXPECT_EQ(dump("-> "), (DumpRows{
                             "1|-> Mwi Subscription|",
                             "2|Invite transaction timeout|32",
                             "2|Non-Invite transaction timeout|32",
                             "2|Proxy|p:5060  (strict route)",
                             "2|Message-Server|m:5060",
                             "2|Message-Server TLS|mt:5061",
                             "2|Subscription Lifetime|900",
                             "2|Subscription Mode|implicit",
                         }));
}

TEST_F(MwiSubscriptionTest, DumpShowsANotifierWithoutPortsAsTheHostAloneAndNoTlsRow) {
  face->setConfigMwiNotifier(CHostPort("m", NO_PORT), CHostPort("mt", NO_PORT));

  DumpRows const rows = dump();
  ASSERT_EQ(rows.size(), 6u);
  EXPECT_EQ(rows[3], "2|Message-Server|m");
  EXPECT_EQ(rows[4], "2|Subscription Lifetime|3600");
}

struct MwiLog {
  char const* name;
  std::function<void(Face&)> call;
  char const* format;  // "%p" is the face
};

std::vector<MwiLog> const MWI_LOGS = {
    {"SetConfigMwiNotifierLogsOnlyTheNotifier",
     [](Face& f) { f.setConfigMwiNotifier(CHostPort("m", 5060), CHostPort("mt", 5061)); },
     "LS_CMwiSubscription(%p)::setConfigMwiNotifier(m:5060)\n"},
    {"SetDynamicMwiNotifier", [](Face& f) { f.setDynamicMwiNotifier(CHostPort("d", 5070)); },
     "LS_CMwiSubscription(%p)::setDynamicMwiNotifier(d:5070)\n"},
    {"SetConfigMwiSubscriptionMode",
     [](Face& f) { f.setConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::EXPLICIT); },
     "LS_CMwiSubscription(%p)::setConfigMwiSubscriptionMode(explicit)\n"},
};

class MwiLogTest : public ::testing::TestWithParam<MwiLog> {};

TEST_P(MwiLogTest, LogsTheCallFirst) {
  RefPtr<Face> face = makeFace();
  LogCapture capture;

  GetParam().call(*face);

  ASSERT_FALSE(capture.lines().empty());
  EXPECT_EQ(capture.lines().front(),
            formatted(GetParam().format, static_cast<void const*>(static_cast<LS_IElement*>(face.get()))));
}

INSTANTIATE_TEST_SUITE_P(MwiSubscription,
                         MwiLogTest,
                         ::testing::ValuesIn(MWI_LOGS),
                         [](::testing::TestParamInfo<MwiLog> const& info) { return info.param.name; });

TEST(MwiSubscriptionLogTest, RemovingTheModeWritesNoLineOfTheFace) {
  RefPtr<Face> face = makeFace();
  face->setConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::EXPLICIT);
  LogCapture capture;

  face->removeConfigMwiSubscriptionMode();

  ASSERT_FALSE(capture.lines().empty());
  for (std::string const& line : capture.lines())
    EXPECT_EQ(line.find("LS_CMwiSubscription("), std::string::npos) << line;
}

}  // namespace
