#include "LS_COutbound.h"

#include <gtest/gtest.h>

#include <ostream>
#include <string>
#include <vector>

#include "FaceValueFamilies.h"
#include "LS_ElementClassTable.h"
#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

namespace {

// The outbound face is abstract; this is the smallest face that can be made.
class TestOutbound : public LS_COutbound {
 public:
  XCode create(RefPtr<LS_IElement>& element) override { return LS_makeElement<TestOutbound>(element); }
};

std::vector<FaceValueFamily> outboundFamilies() {
  using Face = LS_COutbound;
  LS_ForcedDestination manual;
  manual.udpTcpAddress = CHostPort("fd", 5060);
  LS_ForcedDestination registrar;
  registrar.type = LS_ForcedDestination::REGISTRAR_ADDRESS;
  return FaceValueFamilies<Face, TestOutbound>()
      .FACE_VALUE_FAMILY(PreferredProtocol, "preferred-protocol", LS_ProtocolConfig::FORCED_TLS,
                         LS_ProtocolConfig::PREFERRED_NONE, NONE)
      .FACE_VALUE_FAMILY(TrafficClass, "traffic-class", 46u, 0u, NONE)
      .FACE_VALUE_FAMILY(InviteTransactionTimeout, "invite-transaction-timeout", 64u, 0u, "32")
      .FACE_VALUE_FAMILY(NonInviteTransactionTimeout, "non-invite-transaction-timeout", 16u, 8u, "32")
      .FACE_VALUE_FAMILY(PenaltyBox, "penalty-box", true, false, "0")
      .add("RequestUriDynamicRegistrar", "request-uri", true, false,
           &Face::setConfigRequestUriDynamicRegistrar, &Face::getConfigRequestUriDynamicRegistrar,
           &Face::getRequestUriDynamic, "0", &Face::removeConfigRequestUriDynamicRegistrar)
      .FACE_VALUE_FAMILY(ForcedDestination, "forced-destination", manual, registrar, NONE)
      .FACE_VALUE_FAMILY(UseFlows, "use-flows", true, false, "0")
      .rows();
}

INSTANTIATE_TEST_SUITE_P(Outbound,
                         FaceValueFamilyTest,
                         ::testing::ValuesIn(outboundFamilies()),
                         rowName<FaceValueFamily>);

using F = LS_COutbound;

RefPtr<TestOutbound> makeOutbound() {
  return adoptRef(new TestOutbound);
}

// Proxies are named by one-letter hosts; "d", the entry that tests write, is
// the only strict one.
LS_Proxy proxyOf(char host) {
  std::string const name(1, host);
  return LS_Proxy(CHostPort(name.c_str(), 5060), CHostPort(name.c_str(), 5061), host == 'd');
}

std::string describe(CHostPort const& address, CHostPort const& tlsAddress, bool strictRoute) {
  return valueText(address) + " " + valueText(tlsAddress) + (strictRoute ? " strict" : " loose");
}

std::vector<std::string> described(std::string const& hosts) {
  std::vector<std::string> texts;
  for (char const host : hosts) {
    LS_Proxy const proxy = proxyOf(host);
    texts.push_back(describe(proxy.address, proxy.tlsAddress, proxy.strictRoute));
  }
  return texts;
}

std::vector<std::string> const NO_LIST = {"<no list>"};

template <class Getter>
std::vector<std::string> proxies(F const& face, unsigned int count, Getter getter) {
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

std::vector<std::string> configuredProxies(F const& face) {
  unsigned int count = 9;
  if (face.getNumberOfConfigProxies(count).isFailure())
    return count == 0 ? NO_LIST : std::vector<std::string>{"<count not reset>"};
  return proxies(face, count, &F::getConfigProxy);
}

std::vector<std::string> effectiveProxies(F const& face) {
  return proxies(face, face.getNumberOfProxies(), &F::getProxy);
}

XCode insertProxy(F& face, unsigned int index, char host) {
  LS_Proxy const proxy = proxyOf(host);
  return face.insertConfigProxy(index, proxy.address, proxy.tlsAddress, proxy.strictRoute);
}

void insertProxies(F& face, std::string const& hosts) {
  for (char const host : hosts)
    insertProxy(face, 99, host);
}

enum EditOp { INSERT, MODIFY, MOVE, REMOVE, CLEAR, DESTROY };

// One edit of the face's own list "abc", or of a face without a list; inserts
// and modifies write "d".
struct ProxyEdit {
  char const* name;
  char const* before;  // hosts, nullptr: no list
  EditOp op;
  unsigned int index;
  int delta;
  bool succeeds;
  char const* after;
  Journal notices;
};

bool apply(F& face, ProxyEdit const& edit) {
  LS_Proxy const d = proxyOf('d');
  switch (edit.op) {
    case INSERT:
      return face.insertConfigProxy(edit.index, d.address, d.tlsAddress, d.strictRoute).isSuccess();
    case MODIFY:
      return face.modifyConfigProxy(edit.index, d.address, d.tlsAddress, d.strictRoute).isSuccess();
    case MOVE:
      return face.moveConfigProxy(edit.index, edit.delta).isSuccess();
    case REMOVE:
      face.removeConfigProxy(edit.index);
      return true;
    case CLEAR:
      face.clearConfigProxies();
      return true;
    case DESTROY:
      face.destroyConfigProxies();
      return true;
  }
  return false;
}

Journal const CHANGED = {"face:change:proxy", "face:change"};
Journal const STARTED = {"face:add:proxy", "face:change", "face:change:proxy", "face:change"};
Journal const SILENT;

std::vector<ProxyEdit> const PROXY_EDITS = {
    {"InsertAtFrontShiftsTheRest", "abc", INSERT, 0, 0, true, "dabc", CHANGED},
    {"InsertBeyondTheLengthAppends", "abc", INSERT, 7, 0, true, "abcd", CHANGED},
    {"InsertWithoutListStartsAnOwnList", nullptr, INSERT, 5, 0, true, "d", STARTED},
    {"ModifyOverwritesEveryField", "abc", MODIFY, 1, 0, true, "adc", CHANGED},
    {"ModifyAtTheLengthFails", "abc", MODIFY, 3, 0, false, "abc", SILENT},
    {"ModifyWithoutListFails", nullptr, MODIFY, 0, 0, false, nullptr, SILENT},
    {"MoveFirstFarForwardStopsAtTheEnd", "abc", MOVE, 0, 5, true, "bca", CHANGED},
    {"MoveLastBackOnePlace", "abc", MOVE, 2, -1, true, "acb", CHANGED},
    {"MoveLastFarBackStopsAtTheFront", "abc", MOVE, 2, -9, true, "cab", CHANGED},
    {"MoveByZeroKeepsTheOrderButIsAnnounced", "abc", MOVE, 1, 0, true, "abc", CHANGED},
    {"MoveAtTheLengthFails", "abc", MOVE, 3, 1, false, "abc", SILENT},
    {"RemoveClosesTheGap", "abc", REMOVE, 1, 0, true, "ac", CHANGED},
    {"RemoveBeyondTheLengthChangesNothing", "abc", REMOVE, 5, 0, true, "abc", SILENT},
    {"ClearLeavesAnEmptyOwnList", "abc", CLEAR, 0, 0, true, "", CHANGED},
    {"ClearWithoutListStartsAnEmptyOwnList", nullptr, CLEAR, 0, 0, true, "", STARTED},
    {"DestroyDropsTheOwnList", "abc", DESTROY, 0, 0, true, nullptr, {"face:remove:proxy", "face:change"}},
};

class ProxyEditTest : public ::testing::TestWithParam<ProxyEdit> {};

TEST_P(ProxyEditTest, EditsTheOwnListByTheIndexRules) {
  ProxyEdit const& edit = GetParam();
  RefPtr<TestOutbound> face = makeOutbound();
  if (edit.before)
    insertProxies(*face, edit.before);
  Journal journal;
  ContainerWatch watch(face.get(), journal, "face");

  EXPECT_EQ(apply(*face, edit), edit.succeeds);
  EXPECT_EQ(configuredProxies(*face), edit.after ? described(edit.after) : NO_LIST);
  EXPECT_EQ(journal, edit.notices);
}

INSTANTIATE_TEST_SUITE_P(Outbound, ProxyEditTest, ::testing::ValuesIn(PROXY_EDITS), rowName<ProxyEdit>);

// A face whose base face holds the proxies [a, b, c].
class InheritedProxiesTest : public ::testing::Test {
 protected:
  InheritedProxiesTest() {
    face->setBase(base.get());
    insertProxies(*base, "abc");
  }

  RefPtr<TestOutbound> base = makeOutbound();
  RefPtr<TestOutbound> face = makeOutbound();
  CHostPort const h{"h", 5070};
};

TEST_F(InheritedProxiesTest, AnOwnListStartedByInsertOrClearHidesTheInheritedOneUntilDestroyed) {
  EXPECT_EQ(configuredProxies(*face), NO_LIST);
  EXPECT_EQ(effectiveProxies(*face), described("abc"));

  insertProxy(*face, 7, 'd');
  EXPECT_EQ(configuredProxies(*face), described("d"));
  EXPECT_EQ(effectiveProxies(*face), described("d"));

  face->clearConfigProxies();
  EXPECT_EQ(face->getNumberOfProxies(), 0u);
  face->destroyConfigProxies();
  EXPECT_EQ(effectiveProxies(*face), described("abc"));
}

TEST_F(InheritedProxiesTest, DynamicProxyTakesThePlaceOfTheFirstProxyOrIsTheOnlyOne) {
  face->setDynamicProxy(h, true);
  std::vector<std::string> expected = described("abc");
  expected[0] = describe(h, h, true);
  EXPECT_EQ(effectiveProxies(*face), expected);

  face->clearConfigProxies();
  face->setDynamicProxy(h, false);
  EXPECT_EQ(effectiveProxies(*face), std::vector<std::string>{describe(h, h, false)});
  CHostPort address, tlsAddress;
  bool strictRoute = false;
  EXPECT_TRUE(face->getProxy(1, address, tlsAddress, strictRoute).isFailure());
}

TEST_F(InheritedProxiesTest, DumpShowsTheEffectiveSettingsInOrderAndHidesZeroTimeoutsAndRegistrarAddresses) {
  LS_ForcedDestination destination;
  destination.udpTcpAddress = CHostPort("fd", NO_PORT);
  destination.tlsDestination = CHostPort("fd-tls", 5061);
  face->setConfigForcedDestination(destination);
  face->setConfigPreferredProtocol(LS_ProtocolConfig::FORCED_TCP);
  base->setConfigInviteTransactionTimeout(64);
  face->setConfigNonInviteTransactionTimeout(0);
  face->setConfigTrafficClass(46);
  face->setConfigPenaltyBox(true);
  base->removeConfigProxy(2);
  base->modifyConfigProxy(1, CHostPort("q", 5060), CHostPort("q", NO_PORT), false);
  face->setDynamicProxy(h, true);

  EXPECT_EQ(dumpOf(*face), (DumpRows{
                               "2|Forced Destination for UDP/TCP|fd",
                               "2|Forced Destination for TLS|fd-tls:5061",
                               "2|Transport Protocol|forced-tcp",
                               "2|Invite transaction timeout|64",
                               "2|Proxy|h:5070 tls-port:5070 (strict route)",
                               "2|Proxy|q:5060  (loose route)",
                           }));
  destination.type = LS_ForcedDestination::REGISTRAR_ADDRESS;
  face->setConfigForcedDestination(destination);
  EXPECT_EQ(dumpOf(*face)[0], "2|Forced Destination|Registrar-Address");
  EXPECT_EQ(dumpOf(*face).size(), 5u);
}

TEST(OutboundLogTest, ProxyEditsAreLoggedOnEntryEvenWhenRejected) {
  RefPtr<TestOutbound> face = makeOutbound();
  LogCapture capture;

  face->moveConfigProxy(2, -1);
  face->modifyConfigProxy(1, CHostPort("b", NO_PORT), CHostPort(), false);

  EXPECT_EQ(capture.lines(),
            (std::vector<std::string>{
                formatted("LS_COutbound(%p)::moveConfigProxy(2, 4294967295)\n", logAddressOf(face.get())),
                formatted("LS_COutbound(%p)::modifyConfigProxy(1, b, no)\n", logAddressOf(face.get())),
            }));
}

}  // namespace
