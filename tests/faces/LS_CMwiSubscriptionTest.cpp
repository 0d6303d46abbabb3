#include "LS_CMwiSubscription.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "FaceValueFamilies.h"
#include "support/LogCapture.h"

namespace {

using Face = LS_CMwiSubscription;

std::vector<FaceValueFamily> mwiFamilies() {
  return FaceValueFamilies<Face>()
      .FACE_VALUE_FAMILY(Lifetime, "lifetime", 600u, 60u, "3600")
      .FACE_VALUE_FAMILY(MwiSubscriptionMode, "mode", LS_MwiSubscriptionMode::EXPLICIT,
                         LS_MwiSubscriptionMode::IMPLICIT, "0")
      .FACE_VALUE_FAMILY(RetryTimeoutOnSystemError, "on-system-error", 20u, 30u, "10")
      .FACE_VALUE_FAMILY(RetryTimeoutOnClientError, "on-client-error", 21u, 31u, "10")
      .FACE_VALUE_FAMILY(RetryTimeoutOnServerError, "on-server-error", 22u, 32u, "10")
      .rows();
}

INSTANTIATE_TEST_SUITE_P(MwiSubscription,
                         FaceValueFamilyTest,
                         ::testing::ValuesIn(mwiFamilies()),
                         rowName<FaceValueFamily>);

// A message-waiting face and the same face of its base identity.
class MwiSubscriptionTest : public ::testing::Test {
 protected:
  MwiSubscriptionTest() { face->setBase(base.get()); }

  RefPtr<Face> base = adoptRef(new Face);
  RefPtr<Face> face = adoptRef(new Face);
};

TEST_F(MwiSubscriptionTest, RemovingTheNotifierDropsBothKeysAndShowsTheBasePairAgain) {
  base->setConfigMwiNotifier(CHostPort("m", 5060), CHostPort("mt", 5061));
  face->setConfigMwiNotifier(CHostPort("n", 5062), CHostPort("nt", 5063));
  EXPECT_EQ(pairText(*face, &Face::getMwiNotifier), "n:5062 nt:5063");

  face->removeConfigMwiNotifier();

  EXPECT_EQ(pairText(*face, &Face::getConfigMwiNotifier), NONE);
  EXPECT_EQ(pairText(*face, &Face::getMwiNotifier), "m:5060 mt:5061");
}

TEST_F(MwiSubscriptionTest, DynamicNotifierOfTheBaseFaceIsSeenButNeitherIsNorDumpsAsTheNotifier) {
  base->setDynamicMwiNotifier(CHostPort("d", 5070));

  EXPECT_EQ(readText(*face, &Face::getDynamicMwiNotifier), "d:5070");
  EXPECT_EQ(pairText(*face, &Face::getMwiNotifier), NONE);
  for (std::string const& row : dumpOf(*face))
    EXPECT_EQ(row.find("Message-Server"), std::string::npos) << row;
}

TEST_F(MwiSubscriptionTest, DumpShowsTheEffectiveSettingsAndDefaultsAfterThePrefixedHeading) {
  base->setConfigMwiNotifier(CHostPort("m", 5060), CHostPort("mt", 5061));
  face->setConfigLifetime(900);
  face->setConfigRetryTimeoutOnClientError(40);
  face->insertConfigProxy(0, CHostPort("p", 5060), CHostPort("p", NO_PORT), true);

  EXPECT_EQ(dumpOf(*face, "-> "), (DumpRows{
                                      "1|-> Mwi Subscription|",
                                      "2|Invite transaction timeout|32",
                                      "2|Non-Invite transaction timeout|32",
                                      "2|Proxy|p:5060  (strict route)",
                                      "2|Message-Server|m:5060",
                                      "2|Message-Server TLS|mt:5061",
                                      "2|Subscription Lifetime|900",
                                      "2|Subscription Mode|none",
                                  }));
}

// Only the notifier is logged, the mode by its name, and removing the mode
// writes no line of the face.
TEST(MwiSubscriptionLogTest, OddLinesAreWrittenAsTheyAlwaysWere) {
  RefPtr<Face> face = adoptRef(new Face);
  LogCapture capture;

  face->setConfigMwiNotifier(CHostPort("m", 5060), CHostPort("mt", 5061));
  face->setConfigMwiSubscriptionMode(LS_MwiSubscriptionMode::EXPLICIT);
  face->removeConfigMwiSubscriptionMode();

  void const* const self = logAddressOf(face.get());
  EXPECT_EQ(faceLines(capture.lines()),
            (std::vector<std::string>{
                formatted("LS_CMwiSubscription(%p)::setConfigMwiNotifier(m:5060)\n", self),
                formatted("LS_CMwiSubscription(%p)::setConfigMwiSubscriptionMode(explicit)\n", self),
            }));
}

}  // namespace
