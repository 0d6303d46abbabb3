#include "LS_CRegistrationOutbound.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "DumpRows.h"
#include "FaceValueFamilies.h"
#include "support/LogCapture.h"

namespace {

using Face = LS_CRegistrationOutbound;

std::vector<FaceValueFamily> const& registrationFamilies() {
  static FaceValueFamilies<Face> families;
  static bool const filled = [] {
    families
        .add("Lifetime", "lifetime", 600u, 60u, &Face::setConfigLifetime, &Face::getConfigLifetime,
             &Face::getLifetime, "3600", &Face::removeConfigLifetime)
        .add("DnsSecurityCheck", "dns-security-check", true, false, &Face::setConfigDnsSecurityCheck,
             &Face::getConfigDnsSecurityCheck, &Face::getDnsSecurityCheck, "0",
             &Face::removeConfigDnsSecurityCheck)
        .add("RegistrationMode", "mode", LS_RegistrationMode::AUTO, LS_RegistrationMode::BACK_TO_BACK,
             &Face::setConfigRegistrationMode, &Face::getConfigRegistrationMode, &Face::getRegistrationMode,
             "0", &Face::removeConfigRegistrationMode)
        .add("UriScheme", "uri-scheme", LS_UriScheme::SIPS, LS_UriScheme::TRANSPARENT,
             &Face::setConfigUriScheme, &Face::getConfigUriScheme, &Face::getUriScheme, "0",
             &Face::removeConfigUriScheme)
        .add("RetryTimeoutOnSystemError", "on-system-error", 20u, 30u,
             &Face::setConfigRetryTimeoutOnSystemError, &Face::getConfigRetryTimeoutOnSystemError,
             &Face::getRetryTimeoutOnSystemError, "10", &Face::removeConfigRetryTimeoutOnSystemError)
        .add("RetryTimeoutOnClientError", "on-client-error", 21u, 31u,
             &Face::setConfigRetryTimeoutOnClientError, &Face::getConfigRetryTimeoutOnClientError,
             &Face::getRetryTimeoutOnClientError, "10", &Face::removeConfigRetryTimeoutOnClientError)
        .add("RetryTimeoutOnServerError", "on-server-error", 22u, 32u,
             &Face::setConfigRetryTimeoutOnServerError, &Face::getConfigRetryTimeoutOnServerError,
             &Face::getRetryTimeoutOnServerError, "10", &Face::removeConfigRetryTimeoutOnServerError)
        .add("NatTraversalFlows", "nat-traversal-flows", true, false, &Face::setConfigNatTraversalFlows,
             &Face::getConfigNatTraversalFlows, &Face::getNatTraversalFlows, "0",
             &Face::removeConfigNatTraversalFlows)
        .add("NatTraversalMethod", "nat-traversal", LS_NatTraversalMethod::NORTEL,
             LS_NatTraversalMethod::ADDRESS_DETECTION, &Face::setConfigNatTraversalMethod,
             &Face::getConfigNatTraversalMethod, &Face::getNatTraversalMethod, "0",
             &Face::removeConfigNatTraversalMethod)
        .add("KeepAliveMethod", "keepalive-method", LS_KeepAliveMethod::OPTIONS, LS_KeepAliveMethod::PING,
             &Face::setConfigKeepAliveMethod, &Face::getConfigKeepAliveMethod, &Face::getKeepAliveMethod, "0",
             &Face::removeConfigKeepAliveMethod)
        .add("KeepAliveInterval", "keepalive-interval", 25u, 0u, &Face::setConfigKeepAliveInterval,
             &Face::getConfigKeepAliveInterval, &Face::getKeepAliveInterval, "55",
             &Face::removeConfigKeepAliveInterval)
        .add("Priority", "priority", 0u, 7u, &Face::setConfigPriority, &Face::getConfigPriority,
             &Face::getPriority, "4294967295", &Face::removeConfigPriority);
    return true;
  }();
  (void)filled;
  return families.rows();
}

INSTANTIATE_TEST_SUITE_P(RegistrationOutbound,
                         FaceValueFamilyTest,
                         ::testing::ValuesIn(registrationFamilies()),
                         familyName);

RefPtr<Face> makeFace() {
  return adoptRef(new Face);
}

void const* logAddressOf(Face* face) {
  return static_cast<void const*>(static_cast<LS_IElement*>(face));
}

unsigned short const NO_PORT = CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT;

// A registration face and the same face of its base identity; dumps at level
// 1 with room to spare.
class RegistrationOutboundTest : public ::testing::Test {
 protected:
  RegistrationOutboundTest() { face->setBase(base.get()); }

  template <class Getter>
  static std::string pair(Face const& of, Getter getter) {
    CHostPort address;
    CHostPort tlsAddress;
    return (of.*getter)(address, tlsAddress).isSuccess() ? valueText(address) + " " + valueText(tlsAddress)
                                                         : NONE;
  }
  DumpRows dump(String const& prefix = String(),
                unsigned int maxLevel = 9,
                unsigned int maxDetail = 5) const {
    InfoContainer info;
    face->getInfo(info, maxLevel, 1, maxDetail, 2, prefix);
    return dumpRows(info);
  }

  RefPtr<Face> base = makeFace();
  RefPtr<Face> face = makeFace();
  CHostPort const r{"r", 5060};
  CHostPort const t{"t", 5061};
};

TEST_F(RegistrationOutboundTest, InheritedRegistrarIsEffectiveButNotConfigured) {
  base->setConfigRegistrar(r, t);

  EXPECT_EQ(pair(*face, &Face::getConfigRegistrar), NONE);
  EXPECT_EQ(pair(*face, &Face::getRegistrar), "r:5060 t:5061");
}

TEST_F(RegistrationOutboundTest, RemovingTheRegistrarDropsBothKeysAndShowsTheBasePair) {
  base->setConfigRegistrar(r, t);
  face->setConfigRegistrar(CHostPort("r2", 5062), CHostPort("t2", 5063));
  EXPECT_EQ(pair(*face, &Face::getRegistrar), "r2:5062 t2:5063");

  face->removeConfigRegistrar();

  EXPECT_FALSE(face->containsElement("registrar", LS_Strategy::LOCAL_ONLY));
  EXPECT_FALSE(face->containsElement("registrar-tls", LS_Strategy::LOCAL_ONLY));
  EXPECT_EQ(pair(*face, &Face::getRegistrar), "r:5060 t:5061");
}

TEST_F(RegistrationOutboundTest, DynamicRegistrarOfTheBaseFaceIsSeenButIsNotTheRegistrar) {
  base->setDynamicRegistrar(CHostPort("d", 5070));

  CHostPort address;
  EXPECT_TRUE(face->getDynamicRegistrar(address).isSuccess());
  EXPECT_EQ(valueText(address), "d:5070");
  EXPECT_EQ(pair(*face, &Face::getRegistrar), NONE);

  base->removeDynamicRegistrar();
  EXPECT_TRUE(face->getDynamicRegistrar(address).isFailure());
}

TEST_F(RegistrationOutboundTest, RegistrarAddressOfTheBaseFaceIsSeenThroughTheFace) {
  base->setRegistrarAddr(CHostPort("a", 5080));

  CHostPort address;
  EXPECT_TRUE(face->getRegistrarAddr(address).isSuccess());
  EXPECT_EQ(valueText(address), "a:5080");
}

TEST_F(RegistrationOutboundTest, NothingConfiguredDumpsTheHeadingTheOutboundRowsAndTheDefaults) {
  EXPECT_EQ(dump(), (DumpRows{
                        "1|Outbound Registration|",
                        "2|Invite transaction timeout|32",
                        "2|Non-Invite transaction timeout|32",
                        "2|Registration Lifetime|3600",
                        "2|Registration URI scheme|sip",
                        "2|Registration Mode|none",
                    }));
}

TEST_F(RegistrationOutboundTest, DumpShowsTheEffectiveSettingsAfterThePrefixedHeading) {
  base->setConfigRegistrar(r, t);
  base->setConfigLifetime(600);
  face->setConfigUriScheme(LS_UriScheme::SIPS);
  face->setConfigRegistrationMode(LS_RegistrationMode::BACK_TO_BACK);
  face->setRegistrarAddr(CHostPort("a", 5080));
  face->setConfigPreferredProtocol(LS_ProtocolConfig::FORCED_UDP);
  face->setDynamicRegistrar(CHostPort("d", 5070));
  face->setConfigPriority(3);

  EXPECT_EQ(dump("-> "), (DumpRows{
                             "1|-> Outbound Registration|",
                             "2|Transport Protocol|forced-udp",
                             "2|Invite transaction timeout|32",
                             "2|Non-Invite transaction timeout|32",
                             "2|Registrar|r:5060",
                             "2|Registrar TLS|t:5061",
                             "2|Registration Lifetime|600",
                             "2|Registration URI scheme|sips",
                             "2|Registration Mode|back-to-back",
                             "2|Registrar Address|a:5080",
                         }));
}

TEST_F(RegistrationOutboundTest, DumpShowsAddressesWithoutPortAsTheHostAloneAndNoTlsRow) {
  face->setConfigInviteTransactionTimeout(0);
  face->setConfigNonInviteTransactionTimeout(0);
  face->setConfigRegistrar(CHostPort("r", NO_PORT), CHostPort("t", NO_PORT));
  face->setRegistrarAddr(CHostPort("a", NO_PORT));

  EXPECT_EQ(dump(), (DumpRows{
                        "1|Outbound Registration|",
                        "2|Registrar|r",
                        "2|Registration Lifetime|3600",
                        "2|Registration URI scheme|sip",
                        "2|Registration Mode|none",
                        "2|Registrar Address|a",
                    }));
}

TEST_F(RegistrationOutboundTest, DumpAtTheMaximumLevelShowsOnlyTheHeading) {
  face->setConfigRegistrar(r, t);

  EXPECT_EQ(dump(String(), 1), DumpRows{"1|Outbound Registration|"});
  EXPECT_EQ(dump(String(), 9, 1), DumpRows{});
}

struct RegistrationLog {
  char const* name;
  std::function<void(Face&)> call;
  char const* format;  // "%p", where present, is the face
};

std::vector<RegistrationLog> const REGISTRATION_LOGS = {
    {"SetConfigRegistrarLogsOnlyTheRegistrar",
     [](Face& f) { f.setConfigRegistrar(CHostPort("r", 5060), CHostPort()); },
     "LS_CRegistrationOutbound(%p)::setConfigRegistrar(r:5060)\n"},
    {"SetDynamicRegistrar", [](Face& f) { f.setDynamicRegistrar(CHostPort("d", 0)); },
     "LS_CRegistrationOutbound(%p)::setDynamicRegistrar(d)\n"},
    {"SetRegistrarAddrHasNoAddressAndNoLineEnd", [](Face& f) { f.setRegistrarAddr(CHostPort("a", 5080)); },
     "[LS REG OUT] Set registrar address: a:5080"},
    {"SetConfigKeepAliveIntervalPrintsSigned", [](Face& f) { f.setConfigKeepAliveInterval(4294967295u); },
     "LS_CRegistrationOutbound(%p)::setConfigKeepAliveInterval(-1)\n"},
    {"SetConfigDnsSecurityCheckLogsNoValue", [](Face& f) { f.setConfigDnsSecurityCheck(true); },
     "LS_CRegistrationOutbound(%p)::setConfigDnsSecurityCheck()\n"},
    {"RemoveConfigNatTraversalMethod", [](Face& f) { f.removeConfigNatTraversalMethod(); },
     "LS_CRegistrationOutbound(%p)::ConfigNatTraversalMethod()\n"},
    {"RemoveConfigKeepAliveInterval", [](Face& f) { f.removeConfigKeepAliveInterval(); },
     "LS_CRegistrationOutbound(%p)::ConfigKeepAliveInterval()\n"},
};

class RegistrationLogTest : public ::testing::TestWithParam<RegistrationLog> {};

TEST_P(RegistrationLogTest, LogsTheCallFirst) {
  RefPtr<Face> face = makeFace();
  LogCapture capture;

  GetParam().call(*face);

  ASSERT_FALSE(capture.lines().empty());
  EXPECT_EQ(capture.lines().front(), formatted(GetParam().format, logAddressOf(face.get())));
}

INSTANTIATE_TEST_SUITE_P(RegistrationOutbound,
                         RegistrationLogTest,
                         ::testing::ValuesIn(REGISTRATION_LOGS),
                         [](::testing::TestParamInfo<RegistrationLog> const& info) {
                           return info.param.name;
                         });

}  // namespace
