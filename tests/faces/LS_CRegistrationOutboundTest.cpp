#include "LS_CRegistrationOutbound.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "FaceValueFamilies.h"
#include "support/LogCapture.h"

namespace {

using Face = LS_CRegistrationOutbound;

std::vector<FaceValueFamily> registrationFamilies() {
  return FaceValueFamilies<Face>()
      .FACE_VALUE_FAMILY(Lifetime, "lifetime", 600u, 60u, "3600")
      .FACE_VALUE_FAMILY(DnsSecurityCheck, "dns-security-check", true, false, "0")
      .FACE_VALUE_FAMILY(RegistrationMode, "mode", LS_RegistrationMode::AUTO,
                         LS_RegistrationMode::BACK_TO_BACK, "0")
      .FACE_VALUE_FAMILY(UriScheme, "uri-scheme", LS_UriScheme::SIPS, LS_UriScheme::TRANSPARENT, "0")
      .FACE_VALUE_FAMILY(RetryTimeoutOnSystemError, "on-system-error", 20u, 30u, "10")
      .FACE_VALUE_FAMILY(RetryTimeoutOnClientError, "on-client-error", 21u, 31u, "10")
      .FACE_VALUE_FAMILY(RetryTimeoutOnServerError, "on-server-error", 22u, 32u, "10")
      .FACE_VALUE_FAMILY(NatTraversalFlows, "nat-traversal-flows", true, false, "0")
      .FACE_VALUE_FAMILY(NatTraversalMethod, "nat-traversal", LS_NatTraversalMethod::NORTEL,
                         LS_NatTraversalMethod::ADDRESS_DETECTION, "0")
      .FACE_VALUE_FAMILY(KeepAliveMethod, "keepalive-method", LS_KeepAliveMethod::OPTIONS,
                         LS_KeepAliveMethod::PING, "0")
      .FACE_VALUE_FAMILY(KeepAliveInterval, "keepalive-interval", 25u, 0u, "55")
      .FACE_VALUE_FAMILY(Priority, "priority", 0u, 7u, "4294967295")
      .rows();
}

INSTANTIATE_TEST_SUITE_P(RegistrationOutbound,
                         FaceValueFamilyTest,
                         ::testing::ValuesIn(registrationFamilies()),
                         rowName<FaceValueFamily>);

// A registration face and the same face of its base identity.
class RegistrationOutboundTest : public ::testing::Test {
 protected:
  RegistrationOutboundTest() { face->setBase(base.get()); }

  RefPtr<Face> base = adoptRef(new Face);
  RefPtr<Face> face = adoptRef(new Face);
};

TEST_F(RegistrationOutboundTest, RemovingTheRegistrarDropsBothKeysAndShowsTheBasePairAgain) {
  base->setConfigRegistrar(CHostPort("r", 5060), CHostPort("t", 5061));
  face->setConfigRegistrar(CHostPort("r2", 5062), CHostPort("t2", 5063));
  EXPECT_EQ(pairText(*face, &Face::getRegistrar), "r2:5062 t2:5063");

  face->removeConfigRegistrar();

  EXPECT_EQ(pairText(*face, &Face::getConfigRegistrar), NONE);
  EXPECT_EQ(pairText(*face, &Face::getRegistrar), "r:5060 t:5061");
}

TEST_F(RegistrationOutboundTest, RunTimeRegistrarsOfTheBaseFaceAreSeenButAreNotTheRegistrar) {
  base->setDynamicRegistrar(CHostPort("d", 5070));
  base->setRegistrarAddr(CHostPort("a", 5080));

  EXPECT_EQ(readText(*face, &Face::getDynamicRegistrar), "d:5070");
  EXPECT_EQ(readText(*face, &Face::getRegistrarAddr), "a:5080");
  EXPECT_EQ(pairText(*face, &Face::getRegistrar), NONE);

  base->removeDynamicRegistrar();
  EXPECT_EQ(readText(*face, &Face::getDynamicRegistrar), NONE);
}

TEST_F(RegistrationOutboundTest, DumpShowsTheEffectiveSettingsAndDefaultsAfterThePrefixedHeading) {
  base->setConfigRegistrar(CHostPort("r", NO_PORT), CHostPort("t", 5061));
  base->setConfigLifetime(600);
  face->setConfigRegistrationMode(LS_RegistrationMode::BACK_TO_BACK);
  face->setRegistrarAddr(CHostPort("a", NO_PORT));
  face->setConfigPreferredProtocol(LS_ProtocolConfig::FORCED_UDP);
  face->setDynamicRegistrar(CHostPort("d", 5070));
  face->setConfigPriority(3);

  EXPECT_EQ(dumpOf(*face, "-> "), (DumpRows{
                                      "1|-> Outbound Registration|",
                                      "2|Transport Protocol|forced-udp",
                                      "2|Invite transaction timeout|32",
                                      "2|Non-Invite transaction timeout|32",
                                      "2|Registrar|r",
                                      "2|Registrar TLS|t:5061",
                                      "2|Registration Lifetime|600",
                                      "2|Registration URI scheme|sip",
                                      "2|Registration Mode|back-to-back",
                                      "2|Registrar Address|a",
                                  }));
}

TEST_F(RegistrationOutboundTest, DumpOmitsATlsRegistrarWithoutPortAndStopsAtTheLevelAndDetailLimits) {
  face->setConfigRegistrar(CHostPort("r", 5060), CHostPort("t", NO_PORT));

  DumpRows const rows = dumpOf(*face);
  ASSERT_EQ(rows.size(), 7u);
  EXPECT_EQ(rows[3], "2|Registrar|r:5060");
  EXPECT_EQ(dumpOf(*face, String(), 1), DumpRows{"1|Outbound Registration|"});
  EXPECT_EQ(dumpOf(*face, String(), 9, 1), DumpRows{});
}

// The lines that do not follow the common "Class(%p)::operation(value)" shape.
TEST(RegistrationOutboundLogTest, OddLinesAreWrittenAsTheyAlwaysWere) {
  RefPtr<Face> face = adoptRef(new Face);
  LogCapture capture;

  face->setConfigRegistrar(CHostPort("r", 5060), CHostPort("t", 5061));
  face->setRegistrarAddr(CHostPort("a", 5080));
  face->setConfigKeepAliveInterval(4294967295u);
  face->setConfigDnsSecurityCheck(true);
  face->removeConfigNatTraversalMethod();
  face->removeConfigKeepAliveMethod();
  face->removeConfigKeepAliveInterval();

  void const* const self = logAddressOf(face.get());
  EXPECT_EQ(faceLines(capture.lines()),
            (std::vector<std::string>{
                formatted("LS_CRegistrationOutbound(%p)::setConfigRegistrar(r:5060)\n", self),
                "[LS REG OUT] Set registrar address: a:5080",
                formatted("LS_CRegistrationOutbound(%p)::setConfigKeepAliveInterval(-1)\n", self),
                formatted("LS_CRegistrationOutbound(%p)::setConfigDnsSecurityCheck()\n", self),
                formatted("LS_CRegistrationOutbound(%p)::ConfigNatTraversalMethod()\n", self),
                formatted("LS_CRegistrationOutbound(%p)::ConfigKeepAliveMethod()\n", self),
                formatted("LS_CRegistrationOutbound(%p)::ConfigKeepAliveInterval()\n", self),
            }));
}

}  // namespace
