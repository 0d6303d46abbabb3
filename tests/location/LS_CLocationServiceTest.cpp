#include "LS_CLocationService.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "LocationFixture.h"
#include "faces/DumpRows.h"
#include "support/LogCapture.h"

namespace {

CHostPort host(char const* name, unsigned short port = 0) {
  return CHostPort(name, port);
}

Texts domainsOf(LS_ILocationServiceConfig const& service) {
  Texts domains;
  for (unsigned int index = 0; index < service.getNumberOfConfigDomains(); ++index) {
    CHostPort const domain = service.getConfigDomain(index);
    domains.push_back(domain.GetHost().c_str() +
                      (domain.GetPort() ? ":" + std::to_string(domain.GetPort()) : ""));
  }
  EXPECT_EQ(service.getConfigDomain(service.getNumberOfConfigDomains()), CHostPort());
  return domains;
}

// A configured identity "alice" with all three notifying faces, watched.
class LocationServiceTest : public LocationTest {
 protected:
  void SetUp() override {
    LocationTest::SetUp();
    RefPtr<LS_IIdentityConfig> const alice = identity("alice");
    for (auto kind : {LS_IdentityFace::REGISTRATION_OUTBOUND, LS_IdentityFace::REGISTRATION_INBOUND,
                      LS_IdentityFace::MESSAGE_SUBSCRIPTION}) {
      handedOut([&](UUID const& iid, void** out) { return alice->createConfigFaceIf(kind, iid, out); });
    }
    recorder.watch(runtime(alice).get());
    journal.clear();
  }

  Journal const allThreeNotices = {"rec:outbound:alice:face", "rec:inbound:alice:face", "rec:mwi:alice:face"};
  FaceRecorder recorder{journal, "rec"};
};

struct DomainEdit {
  char const* name;
  void (*edit)(LS_ILocationServiceConfig& service);
  Texts domains;
};

class DomainEditTest : public LocationServiceTest, public ::testing::WithParamInterface<DomainEdit> {};

TEST_P(DomainEditTest, FollowsTheIndexRulesAndSendsTheThreeChangeNoticesInOrder) {
  for (char const* name : {"a", "b", "c"})
    service->insertConfigDomain(9, host(name));
  journal.clear();

  GetParam().edit(*service);

  EXPECT_EQ(domainsOf(*service), GetParam().domains);
  EXPECT_EQ(journal, allThreeNotices);
}

using Service = LS_ILocationServiceConfig;

std::vector<DomainEdit> const DOMAIN_EDITS = {
    {"InsertPresent", [](Service& s) { s.insertConfigDomain(0, host("c")); }, {"c", "a", "b"}},
    {"InsertPastTheEnd", [](Service& s) { s.insertConfigDomain(7, host("a")); }, {"b", "c", "a"}},
    {"InsertWithPort",
     [](Service& s) { s.insertConfigDomain(1, host("a", 5060)); },
     {"a", "a:5060", "b", "c"}},
    {"ModifyWithPresent", [](Service& s) { s.modifyConfigDomain(0, host("c")); }, {"c", "b"}},
    {"ModifyWithPresentBefore", [](Service& s) { s.modifyConfigDomain(1, host("a")); }, {"a", "c"}},
    {"MovePastTheEnd", [](Service& s) { s.moveConfigDomain(0, 5); }, {"b", "c", "a"}},
    {"MoveBackOne", [](Service& s) { s.moveConfigDomain(2, -1); }, {"a", "c", "b"}},
    {"MovePastTheFront", [](Service& s) { s.moveConfigDomain(1, -5); }, {"b", "a", "c"}},
    {"MoveFromPastTheEnd", [](Service& s) { s.moveConfigDomain(3, -1); }, {"a", "b", "c"}},
    {"Remove", [](Service& s) { s.removeConfigDomain(host("b")); }, {"a", "c"}},
};

INSTANTIATE_TEST_SUITE_P(LocationService,
                         DomainEditTest,
                         ::testing::ValuesIn(DOMAIN_EDITS),
                         rowName<DomainEdit>);

TEST_F(LocationServiceTest, OnlyImperativeAndDomainEditsNoticeAndOnlyConfiguredIdentitiesHearIt) {
  RefPtr<LS_IIdentity> const bob = dynamicIdentity("bob");
  handedOut([&](UUID const& iid, void** out) {
    return bob->createDynamicFaceIf(LS_IdentityFace::REGISTRATION_OUTBOUND, iid, out);
  });
  recorder.watch(bob.get());
  journal.clear();

  service->setConfigDefaultDomain(true);
  EXPECT_TRUE(journal.empty());

  LogCapture log;
  service->setConfigImperative(service->getConfigImperative());
  EXPECT_EQ(journal, allThreeNotices);
  Texts notices;
  for (std::string const& line : log.lines()) {
    if (line.rfind("LS_CLocationService(", 0) == 0)
      notices.push_back(line);
  }
  void const* const address = static_cast<LS_CLocationService*>(service.get());
  EXPECT_EQ(notices,
            (Texts{formatted("LS_CLocationService(%p)::notifyRegistrationOutboundChange()\n", address),
                   formatted("LS_CLocationService(%p)::notifyRegistrationInboundChange()\n", address),
                   formatted("LS_CLocationService(%p)::notifyMwiSubscriptionChange()\n", address)}));
}

constexpr LS_Imperative::Type AUTHORITATIVE = LS_Imperative::AUTHORITATIVE;

// Host "h" with port 5060 asked of a service with one domain and at most
// one local host-port.
struct Responsibility {
  char const* name;
  CHostPort domain;
  CHostPort local;  // none when empty
  bool responsible;
  bool exact;
  LS_Imperative::Type asked = AUTHORITATIVE;
  LS_Imperative::Type own = AUTHORITATIVE;
};

class ResponsibilityTest : public LocationTest, public ::testing::WithParamInterface<Responsibility> {};

TEST_P(ResponsibilityTest, ForHostHWithPort5060) {
  Responsibility const& row = GetParam();
  service->setConfigImperative(row.own);
  service->insertConfigDomain(0, row.domain);
  Vector<CHostPort> local;
  if (row.local != CHostPort())
    local.add(row.local);
  bool exact = !row.exact;

  EXPECT_EQ(runtimeService->isResponsible(host("h", 5060), local, row.asked, exact), row.responsible);
  EXPECT_EQ(exact, row.exact);
}

CHostPort const NO_LOCAL;

std::vector<Responsibility> const RESPONSIBILITIES = {
    {"EqualDomain", host("h", 5060), NO_LOCAL, true, true},
    {"DomainWithoutPort", host("h"), NO_LOCAL, true, false},
    {"DomainInOtherCaseWithoutPort", host("H"), NO_LOCAL, true, false},
    {"DomainWithOtherPort", host("h", 5070), NO_LOCAL, false, false},
    {"OtherHostWithoutPort", host("g"), NO_LOCAL, false, false},
    {"PartialDomainThenEqualLocal", host("h"), host("h", 5060), true, true},
    {"LocalWithoutPort", host("g"), host("h"), true, false},
    {"BackupAskedForAuthoritative", host("h", 5060), NO_LOCAL, false, false, AUTHORITATIVE,
     LS_Imperative::BACKUP},
    {"AuthoritativeAskedForForeign", host("h", 5060), NO_LOCAL, true, true, LS_Imperative::FOREIGN},
};

INSTANTIATE_TEST_SUITE_P(LocationService,
                         ResponsibilityTest,
                         ::testing::ValuesIn(RESPONSIBILITIES),
                         rowName<Responsibility>);

TEST_F(LocationTest, AConfiguredIdentityTakesOverTheDynamicOneOfItsNameWithItsBaseOfDefaultIfAny) {
  IdentityRecorder recorder(journal);
  auto const subject = handedOut<LS_ILocationServiceSubject>(
      [&](UUID const& iid, void** out) { return service->queryInterface(iid, out); });
  subject->addLocationServiceObserver(&recorder, 0);
  EXPECT_EQ(baseNameOf(dynamicIdentity("bob").get()), "<none>");
  group("DEFAULT");
  RefPtr<LS_IIdentity> const alice = dynamicIdentity("alice");
  dynamicIdentity("zed");

  EXPECT_EQ(runtime(identity("alice")), alice);
  EXPECT_EQ(baseNameOf(alice.get()), "DEFAULT");
  EXPECT_EQ(identityNames(true), (Texts{"DEFAULT", "alice", "bob", "zed"}));
  EXPECT_EQ(journal, (Journal{"added:bob", "added:DEFAULT", "added:alice", "added:zed"}));
  subject->removeLocationServiceObserver(&recorder);
}

TEST_F(LocationTest, AGroupIsNeitherHandedOutAsDynamicIdentityNorRecreatedAsAnIdentity) {
  RefPtr<LS_IIdentityConfig> const team = group("team");
  RefPtr<LS_IIdentityConfig> again = team;
  int sentinel = 0;
  void* raw = &sentinel;

  EXPECT_TRUE(runtimeService->createDynamicIdentityIf("team", IID_Unknown(), &raw).isFailure());
  EXPECT_EQ(raw, nullptr);
  EXPECT_TRUE(createIdentity("team", "", LS_IdentityType::IDENTITY, again).isFailure());
  EXPECT_FALSE(again);
  EXPECT_EQ(team->getConfigIdentityType(), LS_IdentityType::IDENTITY_GROUP);
}

TEST_F(LocationTest, ABaseChainOfTenIsAcceptedElevenAreRefusedAndSoIsACycle) {
  identity("c1");
  for (int level = 2; level <= 10; ++level)
    identity(("c" + std::to_string(level)).c_str(), ("c" + std::to_string(level - 1)).c_str());
  RefPtr<LS_IIdentityConfig> created;
  EXPECT_TRUE(createIdentity("below-ten", "c10", LS_IdentityType::IDENTITY, created).isSuccess());

  identity("c11", "c10");
  EXPECT_TRUE(createIdentity("below-eleven", "c11", LS_IdentityType::IDENTITY, created).isFailure());
  EXPECT_TRUE(createIdentity("c1", "c3", LS_IdentityType::IDENTITY, created).isFailure());
  EXPECT_EQ(identityNames(false).size(), 12u);
  EXPECT_TRUE(LS_getConfigIdentityIf(service.get(), "c1", created).isSuccess());
  EXPECT_EQ(baseNameOf(runtime(created).get()), "<none>");
}

TEST_F(LocationTest, RemovingABaseIdentityLeavesTheDerivedOnesWithoutIt) {
  IdentityRecorder recorder(journal);
  auto const subject = handedOut<LS_ILocationServiceSubject>(
      [&](UUID const& iid, void** out) { return service->queryInterface(iid, out); });
  group("base")->setConfigDisplayName("Base");
  RefPtr<LS_IIdentity> const alice = runtime(identity("alice", "base"));
  subject->addLocationServiceObserver(&recorder, 0);

  service->removeConfigIdentity("base");
  runtimeService->removeDynamicIdentity("alice");

  EXPECT_EQ(journal, Journal{"removed:base"});
  EXPECT_EQ(baseNameOf(alice.get()), "<none>");
  EXPECT_EQ(alice->getDisplayName(), "");
  EXPECT_EQ(identityNames(true), Texts{"alice"});
  subject->removeLocationServiceObserver(&recorder);
}

DumpRows dumpOf(LS_ILocationServiceConfig* service, char const* prefix) {
  InfoContainer info;
  RefPtr<IInfo> dumped;
  service->queryIf(dumped);
  return dumpRows(dumped->getInfo(info, 9, 0, 9, 0, prefix));
}

TEST_F(LocationTest, DumpCountsIdentitiesByTheirDirectBaseLeavingGroupsAndDynamicOnesOut) {
  EXPECT_EQ(dumpOf(service.get(), "P "),
            (DumpRows{"0|P Location-Service|example", "1|Imperative|authoritative", "1|Match any domain|no",
                      "1|Domains|(none)", "1|Identities|", "2|Number of inherited identities|0",
                      "2|Number of no-inherited identities|0"}));
  service->setConfigImperative(LS_Imperative::BACKUP);
  service->setConfigDefaultDomain(true);
  service->insertConfigDomain(0, host("a"));
  service->insertConfigDomain(1, host("b", 5070));
  group("g1");
  group("g2");
  group("g3", "g1");
  identity("x");
  identity("y", "g1");
  identity("z", "g1");
  identity("w", "x");
  dynamicIdentity("d");

  EXPECT_EQ(dumpOf(service.get(), ""),
            (DumpRows{"0|Location-Service|example", "1|Imperative|backup", "1|Match any domain|yes",
                      "1|Domains|", "2|a|(master)", "2|b:5070|", "1|Identity-Groups|", "2|Identity-Group|g1",
                      "3|Number of identities|2", "2|Identity-Group|g2", "3|Number of identities|0",
                      "2|Identity-Group|g3", "3|Number of identities|0", "1|Identities|",
                      "2|Number of inherited identities|3", "2|Number of no-inherited identities|1"}));
}

}  // namespace
