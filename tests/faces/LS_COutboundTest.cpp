#include "LS_COutbound.h"

#include <gtest/gtest.h>

#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include "DumpRows.h"
#include "FaceValueFamilies.h"
#include "LS_ElementClassTable.h"
#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

// The shared suite of the value families; every outbound face instantiates it.

TEST_P(FaceValueFamilyTest, NothingSetAnywhereShowsTheDefault) {
  EXPECT_EQ(family().configured(*face), NONE);
  EXPECT_EQ(family().effective(*face), family().defaultText);
}

TEST_P(FaceValueFamilyTest, BaseValueIsEffectiveButNotConfigured) {
  family().set(*base, false);

  EXPECT_EQ(family().configured(*face), NONE);
  EXPECT_EQ(family().effective(*face), family().firstText);
}

TEST_P(FaceValueFamilyTest, OwnValueHidesTheBaseValue) {
  family().set(*base, false);
  family().set(*face, true);

  EXPECT_EQ(family().configured(*face), family().secondText);
  EXPECT_EQ(family().effective(*face), family().secondText);
}

TEST_P(FaceValueFamilyTest, RemovingTheOwnValueShowsTheBaseValueAgain) {
  family().set(*base, false);
  family().set(*face, true);

  family().remove(*face);

  EXPECT_EQ(family().configured(*face), NONE);
  EXPECT_EQ(family().effective(*face), family().firstText);
}

TEST_P(FaceValueFamilyTest, ChangingAValueIsAnnouncedAsOneChangeOfItsKey) {
  family().set(*face, false);
  Journal journal;
  ContainerWatch watch(face.get(), journal, "face");

  family().set(*face, true);

  EXPECT_EQ(journal, (Journal{"face:change:" + family().key, "face:change"}));
}

TEST_P(FaceValueFamilyTest, SettingOneFamilyLeavesEveryOtherFamilyUnset) {
  family().set(*face, true);

  for (FaceValueFamily const& sibling : *family().siblings) {
    if (sibling.name == family().name)
      continue;
    EXPECT_EQ(sibling.configured(*face), NONE) << sibling.name;
  }
}

namespace {

// The outbound face is abstract; this is the smallest face that can be made.
class TestOutbound : public LS_COutbound {
 public:
  XCode create(RefPtr<LS_IElement>& element) override { return LS_makeElement<TestOutbound>(element); }
};

std::vector<FaceValueFamily> const& outboundFamilies() {
  using Face = LS_COutbound;
  static FaceValueFamilies<Face, TestOutbound> families;
  static bool const filled = [] {
    LS_ForcedDestination manual;
    manual.udpTcpAddress = CHostPort("fd", 5060);
    LS_ForcedDestination registrar;
    registrar.type = LS_ForcedDestination::REGISTRAR_ADDRESS;
    families
        .add("PreferredProtocol", "preferred-protocol", LS_ProtocolConfig::FORCED_TLS,
             LS_ProtocolConfig::PREFERRED_NONE, &Face::setConfigPreferredProtocol,
             &Face::getConfigPreferredProtocol, &Face::getPreferredProtocol, NONE,
             &Face::removeConfigPreferredProtocol)
        .add("TrafficClass", "traffic-class", 46u, 0u, &Face::setConfigTrafficClass,
             &Face::getConfigTrafficClass, &Face::getTrafficClass, NONE, &Face::removeConfigTrafficClass)
        .add("InviteTransactionTimeout", "invite-transaction-timeout", 64u, 0u,
             &Face::setConfigInviteTransactionTimeout, &Face::getConfigInviteTransactionTimeout,
             &Face::getInviteTransactionTimeout, "32", &Face::removeConfigInviteTransactionTimeout)
        .add("NonInviteTransactionTimeout", "non-invite-transaction-timeout", 16u, 8u,
             &Face::setConfigNonInviteTransactionTimeout, &Face::getConfigNonInviteTransactionTimeout,
             &Face::getNonInviteTransactionTimeout, "32", &Face::removeConfigNonInviteTransactionTimeout)
        .add("PenaltyBox", "penalty-box", true, false, &Face::setConfigPenaltyBox, &Face::getConfigPenaltyBox,
             &Face::getPenaltyBox, "0", &Face::removeConfigPenaltyBox)
        .add("RequestUriDynamicRegistrar", "request-uri", true, false,
             &Face::setConfigRequestUriDynamicRegistrar, &Face::getConfigRequestUriDynamicRegistrar,
             &Face::getRequestUriDynamic, "0", &Face::removeConfigRequestUriDynamicRegistrar)
        .add("ForcedDestination", "forced-destination", manual, registrar, &Face::setConfigForcedDestination,
             &Face::getConfigForcedDestination, &Face::getForcedDestination, NONE,
             &Face::removeConfigForcedDestination)
        .add("UseFlows", "use-flows", true, false, &Face::setConfigUseFlows, &Face::getConfigUseFlows,
             &Face::getUseFlows, "0", &Face::removeConfigUseFlows);
    return true;
  }();
  (void)filled;
  return families.rows();
}

INSTANTIATE_TEST_SUITE_P(Outbound, FaceValueFamilyTest, ::testing::ValuesIn(outboundFamilies()), familyName);

template <class Param>
std::string rowName(::testing::TestParamInfo<Param> const& info) {
  return info.param.name;
}

RefPtr<TestOutbound> makeOutbound() {
  return adoptRef(new TestOutbound);
}

unsigned short const NO_PORT = CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT;

// Proxies are named by host; "d", the entry that tests write, is the only
// strict one.
LS_Proxy proxyOf(std::string const& host) {
  return LS_Proxy(CHostPort(host.c_str(), 5060), CHostPort(host.c_str(), 5061), host == "d");
}

std::string describe(CHostPort const& address, CHostPort const& tlsAddress, bool strictRoute) {
  return valueText(address) + " " + valueText(tlsAddress) + (strictRoute ? " strict" : " loose");
}

std::vector<std::string> described(std::vector<std::string> const& hosts) {
  std::vector<std::string> texts;
  for (std::string const& host : hosts) {
    LS_Proxy const proxy = proxyOf(host);
    texts.push_back(describe(proxy.address, proxy.tlsAddress, proxy.strictRoute));
  }
  return texts;
}

std::vector<std::string> const NO_LIST = {"<no list>"};

// The entries that a count and an indexed getter show.
template <class Getter>
std::vector<std::string> proxies(LS_COutbound const& face, unsigned int count, Getter getter) {
  std::vector<std::string> texts;
  for (unsigned int index = 0; index < count; ++index) {
    CHostPort address;
    CHostPort tlsAddress;
    bool strictRoute = false;
    EXPECT_TRUE((face.*getter)(index, address, tlsAddress, strictRoute).isSuccess());
    texts.push_back(describe(address, tlsAddress, strictRoute));
  }
  return texts;
}

std::vector<std::string> configuredProxies(LS_COutbound const& face) {
  unsigned int count = 9;
  if (face.getNumberOfConfigProxies(count).isFailure())
    return count == 0 ? NO_LIST : std::vector<std::string>{"<count not reset>"};
  return proxies(face, count, &LS_COutbound::getConfigProxy);
}

std::vector<std::string> effectiveProxies(LS_COutbound const& face) {
  return proxies(face, face.getNumberOfProxies(), &LS_COutbound::getProxy);
}

XCode insertProxy(LS_COutbound& face, unsigned int index, std::string const& host) {
  LS_Proxy const proxy = proxyOf(host);
  return face.insertConfigProxy(index, proxy.address, proxy.tlsAddress, proxy.strictRoute);
}

void insertProxies(LS_COutbound& face, std::vector<std::string> const& hosts) {
  for (std::string const& host : hosts)
    insertProxy(face, 99, host);
}

XCode modifyToD(LS_COutbound& face, unsigned int index) {
  LS_Proxy const d = proxyOf("d");
  return face.modifyConfigProxy(index, d.address, d.tlsAddress, d.strictRoute);
}

XCode done(std::function<void()> const& edit) {
  edit();
  return XCode::success();
}

// One edit of the face's own list [a, b, c], or of a face without a list.
struct ProxyEdit {
  char const* name;
  bool startsWithList;
  std::function<XCode(LS_COutbound&)> edit;
  bool succeeds;
  std::vector<std::string> after;  // hosts, or NO_LIST
  Journal notices;
};

Journal const CHANGED = {"face:change:proxy", "face:change"};
Journal const STARTED = {"face:add:proxy", "face:change", "face:change:proxy", "face:change"};

std::vector<ProxyEdit> const PROXY_EDITS = {
    {"InsertAtFrontShiftsTheRest",
     true,
     [](auto& f) { return insertProxy(f, 0, "d"); },
     true,
     {"d", "a", "b", "c"},
     CHANGED},
    {"InsertBeyondTheLengthAppends",
     true,
     [](auto& f) { return insertProxy(f, 7, "d"); },
     true,
     {"a", "b", "c", "d"},
     CHANGED},
    {"InsertWithoutListStartsAnOwnList",
     false,
     [](auto& f) { return insertProxy(f, 5, "d"); },
     true,
     {"d"},
     STARTED},
    {"ModifyOverwritesEveryField",
     true,
     [](auto& f) { return modifyToD(f, 1); },
     true,
     {"a", "d", "c"},
     CHANGED},
    {"ModifyAtTheLengthFails", true, [](auto& f) { return modifyToD(f, 3); }, false, {"a", "b", "c"}, {}},
    {"ModifyWithoutListFails", false, [](auto& f) { return modifyToD(f, 0); }, false, NO_LIST, {}},
    {"MoveFirstFarForwardStopsAtTheEnd",
     true,
     [](auto& f) { return f.moveConfigProxy(0, 5); },
     true,
     {"b", "c", "a"},
     CHANGED},
    {"MoveLastBackOnePlace",
     true,
     [](auto& f) { return f.moveConfigProxy(2, -1); },
     true,
     {"a", "c", "b"},
     CHANGED},
    {"MoveLastFarBackStopsAtTheFront",
     true,
     [](auto& f) { return f.moveConfigProxy(2, -9); },
     true,
     {"c", "a", "b"},
     CHANGED},
    {"MoveByZeroKeepsTheOrderButIsAnnounced",
     true,
     [](auto& f) { return f.moveConfigProxy(1, 0); },
     true,
     {"a", "b", "c"},
     CHANGED},
    {"MoveAtTheLengthFails",
     true,
     [](auto& f) { return f.moveConfigProxy(3, 1); },
     false,
     {"a", "b", "c"},
     {}},
    {"RemoveClosesTheGap",
     true,
     [](auto& f) { return done([&] { f.removeConfigProxy(1); }); },
     true,
     {"a", "c"},
     CHANGED},
    {"RemoveBeyondTheLengthChangesNothing",
     true,
     [](auto& f) { return done([&] { f.removeConfigProxy(5); }); },
     true,
     {"a", "b", "c"},
     {}},
    {"ClearLeavesAnEmptyOwnList",
     true,
     [](auto& f) { return done([&] { f.clearConfigProxies(); }); },
     true,
     {},
     CHANGED},
    {"ClearWithoutListStartsAnEmptyOwnList",
     false,
     [](auto& f) { return done([&] { f.clearConfigProxies(); }); },
     true,
     {},
     STARTED},
    {"DestroyDropsTheOwnList",
     true,
     [](auto& f) { return done([&] { f.destroyConfigProxies(); }); },
     true,
     NO_LIST,
     {"face:remove:proxy", "face:change"}},
};

void PrintTo(ProxyEdit const& edit, std::ostream* out) {
  *out << edit.name;
}

class ProxyEditTest : public ::testing::TestWithParam<ProxyEdit> {};

TEST_P(ProxyEditTest, EditsTheOwnListByTheIndexRules) {
  ProxyEdit const& edit = GetParam();
  RefPtr<TestOutbound> face = makeOutbound();
  if (edit.startsWithList)
    insertProxies(*face, {"a", "b", "c"});
  Journal journal;
  ContainerWatch watch(face.get(), journal, "face");

  EXPECT_EQ(edit.edit(*face).isSuccess(), edit.succeeds);
  EXPECT_EQ(configuredProxies(*face), edit.after == NO_LIST ? NO_LIST : described(edit.after));
  EXPECT_EQ(journal, edit.notices);
}

INSTANTIATE_TEST_SUITE_P(Outbound, ProxyEditTest, ::testing::ValuesIn(PROXY_EDITS), rowName<ProxyEdit>);

// A face whose base face holds the proxies [a, b, c].
class InheritedProxiesTest : public ::testing::Test {
 protected:
  InheritedProxiesTest() {
    face->setBase(base.get());
    insertProxies(*base, {"a", "b", "c"});
  }

  RefPtr<TestOutbound> base = makeOutbound();
  RefPtr<TestOutbound> face = makeOutbound();
  CHostPort const h{"h", 5070};
};

TEST_F(InheritedProxiesTest, InheritedProxiesAreEffectiveButNotConfigured) {
  EXPECT_EQ(configuredProxies(*face), NO_LIST);
  EXPECT_EQ(effectiveProxies(*face), described({"a", "b", "c"}));
}

TEST_F(InheritedProxiesTest, InsertStartsAnOwnListWithoutCopyingTheInheritedOne) {
  insertProxy(*face, 7, "d");

  EXPECT_EQ(configuredProxies(*face), described({"d"}));
  EXPECT_EQ(effectiveProxies(*face), described({"d"}));
}

TEST_F(InheritedProxiesTest, ClearHidesTheInheritedListAndDestroyShowsItAgain) {
  face->clearConfigProxies();
  EXPECT_EQ(face->getNumberOfProxies(), 0u);

  face->destroyConfigProxies();
  EXPECT_EQ(face->getNumberOfProxies(), 3u);
}

TEST_F(InheritedProxiesTest, DynamicProxyTakesThePlaceOfTheFirstProxy) {
  face->setDynamicProxy(h, true);

  std::vector<std::string> expected = described({"a", "b", "c"});
  expected[0] = describe(h, h, true);
  EXPECT_EQ(effectiveProxies(*face), expected);
}

TEST_F(InheritedProxiesTest, DynamicProxyIsTheOnlyProxyWithoutConfiguredOnes) {
  face->clearConfigProxies();

  face->setDynamicProxy(h, false);

  EXPECT_EQ(effectiveProxies(*face), std::vector<std::string>{describe(h, h, false)});
  CHostPort address, tlsAddress;
  bool strictRoute = false;
  EXPECT_TRUE(face->getProxy(1, address, tlsAddress, strictRoute).isFailure());
}

// Dumps at level 1 with room to spare: rows go in at level 2.
class OutboundDumpTest : public ::testing::Test {
 protected:
  DumpRows dump() const {
    InfoContainer info;
    face->getInfo(info, 9, 1, 5, 2, "ignored ");
    return dumpRows(info);
  }
  void hideTimeouts() {
    face->setConfigInviteTransactionTimeout(0);
    face->setConfigNonInviteTransactionTimeout(0);
  }

  RefPtr<TestOutbound> base = makeOutbound();
  RefPtr<TestOutbound> face = makeOutbound();
};

TEST_F(OutboundDumpTest, NothingConfiguredShowsTheDefaultTimeoutsOnly) {
  EXPECT_EQ(dump(), (DumpRows{"2|Invite transaction timeout|32", "2|Non-Invite transaction timeout|32"}));
}

TEST_F(OutboundDumpTest, ShowsTheEffectiveSettingsInOrder) {
  face->setBase(base.get());
  LS_ForcedDestination destination;
  destination.udpTcpAddress = CHostPort("fd", 5060);
  destination.tlsDestination = CHostPort("fd-tls", 5061);
  face->setConfigForcedDestination(destination);
  face->setConfigPreferredProtocol(LS_ProtocolConfig::FORCED_TCP);
  base->setConfigInviteTransactionTimeout(64);
  face->setConfigTrafficClass(46);
  face->setConfigPenaltyBox(true);
  insertProxies(*base, {"a", "b"});
  face->setDynamicProxy(CHostPort("h", 5070), true);

  EXPECT_EQ(dump(), (DumpRows{
                        "2|Forced Destination for UDP/TCP|fd:5060",
                        "2|Forced Destination for TLS|fd-tls:5061",
                        "2|Transport Protocol|forced-tcp",
                        "2|Invite transaction timeout|64",
                        "2|Non-Invite transaction timeout|32",
                        "2|Proxy|h:5070 tls-port:5070 (strict route)",
                        "2|Proxy|b:5060 tls-port:5061 (loose route)",
                    }));
}

TEST_F(OutboundDumpTest, ZeroTimeoutsHideTheirRows) {
  hideTimeouts();

  EXPECT_EQ(dump(), DumpRows{});
}

TEST_F(OutboundDumpTest, ProxyWithoutTlsPortShowsAnEmptyMiddleField) {
  hideTimeouts();
  face->insertConfigProxy(0, CHostPort("p", 5060), CHostPort("p", NO_PORT), false);
  face->insertConfigProxy(1, CHostPort("q", NO_PORT), CHostPort(), true);

  EXPECT_EQ(dump(), (DumpRows{"2|Proxy|p:5060  (loose route)", "2|Proxy|q  (strict route)"}));
}

TEST_F(OutboundDumpTest, ForcedDestinationOfTheRegistrarAddressShowsNoAddresses) {
  hideTimeouts();
  LS_ForcedDestination destination;
  destination.udpTcpAddress = CHostPort("u", 5060);
  destination.type = LS_ForcedDestination::REGISTRAR_ADDRESS;

  face->setConfigForcedDestination(destination);

  EXPECT_EQ(dump(), DumpRows{"2|Forced Destination|Registrar-Address"});
}

struct ProxyLog {
  char const* name;
  std::function<void(LS_COutbound&)> call;
  char const* format;  // "%p" is the face
};

std::vector<ProxyLog> const PROXY_LOGS = {
    {"Insert", [](auto& f) { f.insertConfigProxy(7, CHostPort("a", 5060), CHostPort("a", 5061), true); },
     "LS_COutbound(%p)::insertConfigProxy(7, a:5060, yes)\n"},
    {"RejectedModifyIsLoggedToo",
     [](auto& f) { f.modifyConfigProxy(1, CHostPort("b", NO_PORT), CHostPort(), false); },
     "LS_COutbound(%p)::modifyConfigProxy(1, b, no)\n"},
    {"MovePrintsTheDeltaUnsigned", [](auto& f) { f.moveConfigProxy(2, -1); },
     "LS_COutbound(%p)::moveConfigProxy(2, 4294967295)\n"},
    {"Remove", [](auto& f) { f.removeConfigProxy(5); }, "LS_COutbound(%p)::removeConfigProxy(5)\n"},
};

class ProxyLogTest : public ::testing::TestWithParam<ProxyLog> {};

TEST_P(ProxyLogTest, LogsTheCallOnEntry) {
  RefPtr<TestOutbound> face = makeOutbound();
  LogCapture capture;

  GetParam().call(*face);

  ASSERT_FALSE(capture.lines().empty());
  EXPECT_EQ(capture.lines().front(),
            formatted(GetParam().format, static_cast<void const*>(static_cast<LS_IElement*>(face.get()))));
}

INSTANTIATE_TEST_SUITE_P(Outbound, ProxyLogTest, ::testing::ValuesIn(PROXY_LOGS), rowName<ProxyLog>);

}  // namespace
