#include "LS_CMasterLocationService.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "IDriver.h"
#include "LS_ClassIdentifiers.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LocationFixture.h"
#include "faces/DumpRows.h"
#include "support/LogCapture.h"

namespace {

// Records "added:<service>" and "removed:<service>", the latter followed by
// ":linked" or ":cut" for the link of the watched identity to its service.
class MasterRecorder : public LS_IMasterLocationServiceObserver {
 public:
  explicit MasterRecorder(Journal& journal) : m_journal(journal) {}
  void onLocationServiceAdded(ObserverEvent<LS_IMasterLocationService>& event) override {
    m_journal.push_back("added:" + serviceOf(event)->getName().str());
  }
  void onLocationServiceRemoved(ObserverEvent<LS_IMasterLocationService>& event) override {
    std::string entry = "removed:" + serviceOf(event)->getName().str();
    if (watched)
      entry += handedOut([&](UUID const& iid, void** out) { return watched->getLocationServiceIf(iid, out); })
                   ? ":linked"
                   : ":cut";
    m_journal.push_back(entry);
  }

  LS_IIdentity* watched = nullptr;

 private:
  static LS_ILocationService* serviceOf(ObserverEvent<LS_IMasterLocationService>& event) {
    return static_cast<LS_IMasterLocationServiceSubject::EvLocationService&>(event).locationService.get();
  }

  Journal& m_journal;
};

class MasterTest : public ::testing::Test {
 protected:
  void SetUp() override { master->addMasterLocationServiceObserver(&recorder, 0); }
  void TearDown() override { master->removeMasterLocationServiceObserver(&recorder); }

  RefPtr<LS_ILocationServiceConfig> create(char const* name) {
    return handedOut<LS_ILocationServiceConfig>(
        [&](UUID const& iid, void** out) { return master->createLocationServiceIf(name, iid, out); });
  }

  RefPtr<LS_CMasterLocationService> master = adoptRef(new LS_CMasterLocationService);
  Journal journal;
  MasterRecorder recorder{journal};
};

TEST_F(MasterTest, NamesServicesOnceCaseSensitivelyAndListsThemInCreationOrder) {
  RefPtr<LS_ILocationServiceConfig> const first = create("a");
  EXPECT_EQ(create("a"), first);
  EXPECT_NE(create("A"), first);
  EXPECT_EQ(first->getConfigName(), "a");
  create("y");
  create("z");

  master->removeLocationService("y");
  master->removeLocationService("nope");

  Vector<String> names;
  master->getLocationServices(names);
  EXPECT_EQ(textsOf(names), (Texts{"a", "A", "z"}));
  EXPECT_EQ(journal, (Journal{"added:a", "added:A", "added:y", "added:z", "removed:y"}));
  int sentinel = 0;
  void* raw = &sentinel;
  EXPECT_TRUE(master->getLocationServiceIf("y", IID_Unknown(), &raw).isFailure());
  EXPECT_EQ(raw, nullptr);
}

TEST_F(MasterTest, RemovalIsAnnouncedOnceTheIdentitiesNoLongerPointBackAtTheService) {
  RefPtr<LS_ILocationService> service;
  create("example")->queryIf(service);
  RefPtr<LS_IIdentity> const alice = handedOut<LS_IIdentity>(
      [&](UUID const& iid, void** out) { return service->createDynamicIdentityIf("alice", iid, out); });
  recorder.watched = alice.get();
  journal.clear();

  master->removeLocationService("example");

  EXPECT_EQ(journal, Journal{"removed:example:cut"});
}

TEST_F(MasterTest, DumpListsTheServicesByNameWithinTheLevelAndDetailItIsGiven) {
  auto const dump = [this](unsigned int maxLevel, unsigned int level, unsigned int detail,
                           char const* prefix) {
    InfoContainer info;
    return dumpRows(master->getInfo(info, maxLevel, level, 5, detail, prefix));
  };
  EXPECT_EQ(dump(5, 0, 0, ""), (DumpRows{"0|Location-Services|", "1|Location-Services|(none)"}));
  create("b");
  create("a");
  EXPECT_EQ(dump(5, 1, 0, "P "), (DumpRows{"1|P Location-Services|", "2|b|", "2|a|"}));
  EXPECT_EQ(dump(2, 2, 0, ""), DumpRows{"2|Location-Services|"});
  EXPECT_TRUE(dump(5, 0, 6, "").empty());
}

TEST(MasterDriver, IsFoundUnderItsDriverIdentifierAndTheNameTheLookupsBuild) {
  RefPtr<LS_CMasterLocationService> const master = adoptRef(new LS_CMasterLocationService);
  String expected;
  IDriver::BUILD_DRIVER_NAME(expected, "master-location-service", 0, 0, 0xFFFFFFFFu, "", "", "", "");

  EXPECT_EQ(master->getDID(), DID_MasterLocationService());
  EXPECT_EQ(master->getDriverName(), expected);
}

size_t countLinesEndingIn(LogCapture const& log, std::string const& ending) {
  return static_cast<size_t>(
      std::count_if(log.lines().begin(), log.lines().end(), [&](std::string const& line) {
        return line.size() >= ending.size() &&
               line.compare(line.size() - ending.size(), ending.size(), ending) == 0;
      }));
}

// Services, configured and dynamic identities, base links and faces with
// values: all of it goes with the last reference to the master.
TEST_F(LocationTest, TearingDownTheMasterLeavesNothingBehind) {
  LogCapture log;
  {
    RefPtr<LS_IIdentityConfig> const defaults = group("DEFAULT");
    handedOut<LS_IRegistrationInboundConfig>([&](UUID const& iid, void** out) {
      return defaults->createConfigFaceIf(LS_IdentityFace::REGISTRATION_INBOUND, iid, out);
    })->setConfigLifetimeRange(60, 3600, 600);
    identity("alice", "DEFAULT")->setConfigDisplayName("Alice");
    dynamicIdentity("bob");
    handedOut(
        [&](UUID const& iid, void** out) { return master->createLocationServiceIf("other", iid, out); });
  }
  service = nullptr;
  runtimeService = nullptr;
  master = nullptr;

  EXPECT_EQ(countLinesEndingIn(log, "::LS_Identity()\n"), 3u);
  EXPECT_EQ(countLinesEndingIn(log, "::~LS_Identity()\n"), 3u);
  EXPECT_EQ(countLinesEndingIn(log, "::~LS_CLocationService()\n"), 2u);
  EXPECT_EQ(countLinesEndingIn(log, "::LS_CData()\n") + countLinesEndingIn(log, "::LS_CData(data)\n"),
            countLinesEndingIn(log, "::~LS_CData()\n"));
}

// What a caller may still hold of a service its master has let go keeps no
// cycle alive: once every outside reference is dropped, every identity and
// the service are gone while the master itself lives on.
struct Leftover {
  char const* name;
  void (*keep)(LS_ILocationServiceConfig* service, LS_CMasterLocationService* master);
};

RefPtr<LS_IIdentityConfig> configured(LS_ILocationServiceConfig* service, char const* name) {
  return handedOut<LS_IIdentityConfig>([&](UUID const& iid, void** out) {
    return service->createConfigIdentityIf(name, "", LS_IdentityType::IDENTITY, iid, out);
  });
}

bool linksBack(LS_IIdentityConfig* identity) {
  return handedOut([&](UUID const& iid, void** out) {
           return identity->getConfigLocationServiceIf(iid, out);
         }) != nullptr;
}

Leftover const LEFTOVERS[] = {
    {"ARemovedIdentityMadeTheBaseOfOneStillListed",
     [](LS_ILocationServiceConfig* service, LS_CMasterLocationService* master) {
       RefPtr<LS_IIdentityConfig> const a = configured(service, "a");
       RefPtr<LS_IIdentityConfig> const b = configured(service, "b");
       service->removeConfigIdentity("a");
       ASSERT_TRUE(b->setConfigBaseIdentity(a.get()).isSuccess());
       EXPECT_TRUE(linksBack(a.get()));
       master->removeLocationService("s");
       EXPECT_FALSE(linksBack(a.get()));
     }},
    {"AnIdentityMadeInTheServiceAfterItsRemoval",
     [](LS_ILocationServiceConfig* service, LS_CMasterLocationService* master) {
       master->removeLocationService("s");
       EXPECT_FALSE(linksBack(configured(service, "late").get()));
     }},
};

class LeftoverTest : public ::testing::TestWithParam<Leftover> {};

TEST_P(LeftoverTest, GoesWithTheLastOutsideReference) {
  LogCapture log;
  RefPtr<LS_CMasterLocationService> const master = adoptRef(new LS_CMasterLocationService);
  {
    RefPtr<LS_ILocationServiceConfig> const service = handedOut<LS_ILocationServiceConfig>(
        [&](UUID const& iid, void** out) { return master->createLocationServiceIf("s", iid, out); });
    GetParam().keep(service.get(), master.get());
  }

  EXPECT_EQ(countLinesEndingIn(log, "::LS_Identity()\n"), countLinesEndingIn(log, "::~LS_Identity()\n"));
  EXPECT_EQ(countLinesEndingIn(log, "::~LS_CLocationService()\n"), 1u);
}

INSTANTIATE_TEST_SUITE_P(Service, LeftoverTest, ::testing::ValuesIn(LEFTOVERS), rowName<Leftover>);

}  // namespace
