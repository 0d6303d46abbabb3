#include "LS_CAliasIndex.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <vector>

#include "LS_CLocationService.h"
#include "LS_IdentityResolution.h"
#include "LookupFixture.h"
#include "support/ScanOnlyService.h"

namespace {

// Identity names and users overlap on purpose: own names, renames and the
// "DEFAULT" group compete with aliases. Users sit inside, on the ends of and
// just outside the ranges built from the same pool ("1000" and "10a" lie
// between "100" and "199").
char const* const NAMES[] = {"a", "b", "c", "g", "h", "DEFAULT", "150", "x1"};
char const* const USERS[] = {"",  "1",  "10", "100", "1000", "10a", "150", "199", "2",       "099",
                             "a", "a1", "ab", "abc", "b",    "x",   "x1",  "x12", "DEFAULT", "g"};
// With and without a literal prefix, with alternation, options, classes,
// quantifiers on the prefix, and two that do not compile.
char const* const EXPRESSIONS[] = {"1[0-9]*", "^1.*", "a|1",  "(?i)A.*", "x?1",  "10+", "1{2}", "[ab]1", ".*",
                                   "1\\d",    "abc",  "x1.*", "^x",      "",     "9",   "ab*",  "(",      "a[",
                                   "^1|x"};

template <size_t N>
char const* pick(std::mt19937& random, char const* const (&pool)[N]) {
  return pool[std::uniform_int_distribution<size_t>(0, N - 1)(random)];
}

int below(std::mt19937& random, int bound) {
  return std::uniform_int_distribution<int>(0, bound - 1)(random);
}

// Empty when service answers user as asking every identity in turn does;
// else both answers.
std::string disagreementOn(RefPtr<LS_ILocationService> const& service, String const& user, bool useDefault) {
  RefPtr<LS_IIdentity> fromIndex;
  RefPtr<LS_IIdentity> fromScan;
  if (answersAsTheScan(service, user, useDefault, fromIndex, fromScan))
    return std::string();
  return "user '" + user.str() + "': index " + whereIs(fromIndex) + ", scan " + whereIs(fromScan);
}

// One random model of three location services, edited step by step; after
// every step each service answers random users through its index and
// through the scan-only view, and the two answers must be the same identity.
class AliasModel {
 public:
  explicit AliasModel(unsigned int run) : m_random(run) {
    for (char const* name : {"s0", "s1", "s2"}) {
      RefPtr<LS_ILocationServiceConfig> config;
      adoptInterface(config,
                     [&](UUID const& iid, void** raw) { return m_master->createLocationServiceIf(name, iid, raw); });
      RefPtr<LS_ILocationService> runtime;
      config->queryIf(runtime);
      m_configs.push_back(config);
      m_indexed.push_back(runtime);
    }
  }

  AliasModel(AliasModel const&) = delete;
  AliasModel& operator=(AliasModel const&) = delete;

  bool indexesEveryService() const {
    for (RefPtr<LS_ILocationService> const& service : m_indexed) {
      if (!dynamic_cast<LS_CLocationService*>(service.get()))
        return false;
    }
    return true;
  }

  // A description of the step, for the failure message.
  std::string edit() {
    size_t const service = static_cast<size_t>(below(m_random, 3));
    switch (below(m_random, 12)) {
      case 0:
      case 1:
        return createConfigured(service);
      case 2:
        return createDynamic(service);
      case 3: {
        char const* const name = pick(m_random, NAMES);
        m_configs[service]->removeConfigIdentity(name);
        return "remove configured " + std::string(name);
      }
      case 4: {
        char const* const name = pick(m_random, NAMES);
        m_indexed[service]->removeDynamicIdentity(name);
        return "remove dynamic " + std::string(name);
      }
      case 5:
        return rebase();
      case 6: {
        if (m_held.empty())
          return "nothing";
        char const* const name = pick(m_random, NAMES);
        held()->setConfigName(name);
        return "rename to " + std::string(name);
      }
      case 7: {
        if (m_held.empty())
          return "nothing";
        LS_IdentityType::Type const type = below(m_random, 3) == 0 ? LS_IdentityType::IDENTITY_GROUP
                                                                   : LS_IdentityType::IDENTITY;
        held()->setConfigIdentityType(type);
        return "type " + std::to_string(type);
      }
      default:
        return editAliases();
    }
  }

  // Empty when the index and the scan agree for every service and user.
  std::string disagreement() {
    for (size_t service = 0; service < m_indexed.size(); ++service) {
      for (int query = 0; query < 3; ++query) {
        std::string const difference =
            disagreementOn(m_indexed[service], pick(m_random, USERS), below(m_random, 2) == 0);
        if (!difference.empty())
          return "s" + std::to_string(service) + " " + difference;
      }
    }
    return std::string();
  }

 private:
  std::string createConfigured(size_t service) {
    char const* const name = pick(m_random, NAMES);
    char const* const base = below(m_random, 2) == 0 ? "" : pick(m_random, NAMES);
    LS_IdentityType::Type const type =
        below(m_random, 4) == 0 ? LS_IdentityType::IDENTITY_GROUP : LS_IdentityType::IDENTITY;
    RefPtr<LS_IIdentityConfig> created;
    adoptInterface(created, [&](UUID const& iid, void** raw) {
      return m_configs[service]->createConfigIdentityIf(name, base, type, iid, raw);
    });
    keep(created);
    return "configure " + std::string(name) + " on '" + base + "' type " + std::to_string(type);
  }

  std::string createDynamic(size_t service) {
    char const* const name = pick(m_random, NAMES);
    RefPtr<LS_IIdentityConfig> created;
    adoptInterface(created, [&](UUID const& iid, void** raw) {
      return m_indexed[service]->createDynamicIdentityIf(name, iid, raw);
    });
    keep(created);
    return "dynamic " + std::string(name);
  }

  // Any identity ever made, even one removed since or of another service,
  // becomes the base, unless that would close a loop.
  std::string rebase() {
    if (m_held.empty())
      return "nothing";
    RefPtr<LS_IIdentityConfig> const identity = held();
    if (below(m_random, 4) == 0) {
      identity->setConfigBaseIdentity(nullptr);
      return "base cleared";
    }
    RefPtr<LS_IIdentityConfig> const base = held();
    if (base->isNoIdentityConfigLoop(identity.get(), 10).isFailure())
      return "base refused";
    identity->setConfigBaseIdentity(base.get());
    return "base set";
  }

  std::string editAliases() {
    if (m_held.empty())
      return "nothing";
    RefPtr<LS_IIdentityConfig> const identity = held();
    char const* const first = pick(m_random, USERS);
    char const* const last = pick(m_random, USERS);
    char const* const expression = pick(m_random, EXPRESSIONS);
    switch (below(m_random, 8)) {
      case 0:
        identity->addConfigAliasName(first);
        return "add name " + std::string(first);
      case 1:
        identity->removeConfigAliasName(first);
        return "remove name " + std::string(first);
      case 2:
        identity->addConfigAliasRange(first, last);
        return "add range " + std::string(first) + ".." + last;
      case 3:
        identity->removeConfigAliasRange(first, last);
        return "remove range " + std::string(first) + ".." + last;
      case 4:
        identity->addConfigAliasExpression(expression);
        return "add expression " + std::string(expression);
      case 5:
        identity->removeConfigAliasExpression(expression);
        return "remove expression " + std::string(expression);
      case 6:
        identity->clearConfigAlias();
        return "clear aliases";
      default:
        identity->destroyConfigAlias();
        return "destroy aliases";
    }
  }

  void keep(RefPtr<LS_IIdentityConfig> const& identity) {
    if (identity)
      m_held.push_back(identity);
  }

  RefPtr<LS_IIdentityConfig> held() { return m_held[static_cast<size_t>(below(m_random, int(m_held.size())))]; }

  std::mt19937 m_random;
  // Declared before the services and identities so that it goes last,
  // cutting every identity's link back to its service.
  RefPtr<LS_CMasterLocationService> const m_master = adoptRef(new LS_CMasterLocationService);
  std::vector<RefPtr<LS_ILocationServiceConfig>> m_configs;
  std::vector<RefPtr<LS_ILocationService>> m_indexed;
  std::vector<RefPtr<LS_IIdentityConfig>> m_held;
};

TEST(AliasIndex, AnswersAsAskingEveryIdentityDoesThroughRandomEdits) {
  constexpr unsigned int RUNS = 300;
  constexpr int STEPS = 60;
  for (unsigned int run = 1; run <= RUNS; ++run) {
    AliasModel model(run);
    ASSERT_TRUE(model.indexesEveryService());
    std::string history;
    for (int step = 0; step < STEPS; ++step) {
      history += model.edit() + "; ";
      std::string const difference = model.disagreement();
      ASSERT_EQ(difference, "") << "run " << run << ", step " << step << " after: " << history;
    }
  }
}

class AliasIndexTest : public LookupTest {};

// Every range below lies under the prefix "1", so all are nodes of one
// tree; the one reaching highest goes first each time, so the bounds that
// the tree keeps above it must come down with it.
TEST_F(AliasIndexTest, RangesLeavingOneBucketWidestFirstLeaveItsBoundsRight) {
  // In byte order, so the last reaches highest.
  char const* const lasts[] = {"11", "110", "111", "112", "12", "13", "14", "15", "16", "17", "18", "19"};
  std::vector<RefPtr<LS_IIdentityConfig>> members;
  for (char const* last : lasts) {
    members.push_back(identity("s", (std::string("m") + last).c_str()));
    members.back()->addConfigAliasRange("10", last);
  }
  for (auto member = members.rbegin(); member != members.rend(); ++member) {
    (*member)->clearConfigAlias();
    for (char const* user : {"1", "10", "105", "11", "110", "112", "15", "19", "2"})
      ASSERT_EQ(disagreementOn(runtimeService("s"), user, false), "") << (*member)->getConfigName().str();
  }
}

// The index forgets, now and then, the identities that left it since the
// last lookup; an edit it noted before must survive that.
TEST_F(AliasIndexTest, AnEditNotedBeforeManyIdentitiesComeAndGoStillCounts) {
  RefPtr<LS_IIdentityConfig> const kept = identity("s", "kept");
  RefPtr<LS_IIdentity> found;
  ASSERT_TRUE(LS_getIdentityOrAliasIf(runtimeService("s"), "x", false, found).isFailure());
  kept->addConfigAliasName("x");
  for (int passing = 0; passing < 100; ++passing) {
    identity("s", "passing");
    locationService("s")->removeConfigIdentity("passing");
  }

  ASSERT_TRUE(LS_getIdentityOrAliasIf(runtimeService("s"), "x", false, found).isSuccess());
  EXPECT_EQ(found->getName(), "kept");
}

}  // namespace
