#include "LS_IdentityResolution.h"

#include <gtest/gtest.h>

#include <string>

#include "CDriverRepository.h"
#include "LS_AddressText.h"
#include "LookupFixture.h"
#include "SystemRepository.h"

namespace {

struct SplitCase {
  char const* nameAddr;  // null: no URI
  bool succeeds;
  char const* user;
  char const* host;
  char const* error;
};

void PrintTo(SplitCase const& c, std::ostream* os) {
  *os << (c.nameAddr ? c.nameAddr : "<no URI>");
}

class SplitNameAddr : public ::testing::TestWithParam<SplitCase> {};

TEST_P(SplitNameAddr, GivesUserAndHostOfSipSipsAndTelOnly) {
  SplitCase const& c = GetParam();
  CNameAddr const parsed = c.nameAddr ? nameAddr(c.nameAddr) : CNameAddr();
  String error("untouched");
  String user("stale");
  CHostPort host = hostPort("stale:1");
  EXPECT_EQ(LS_splitNameAddr(error, user, host, parsed).isSuccess(), c.succeeds);
  EXPECT_EQ(user.str(), c.user);
  EXPECT_EQ(LS_hostPortToString(host).str(), c.host);
  EXPECT_EQ(error.str(), c.error);
}

INSTANTIATE_TEST_SUITE_P(
    Table,
    SplitNameAddr,
    ::testing::Values(
        SplitCase{"\"Al\" <sip:alice@example.com:5070>", true, "alice", "example.com:5070", "untouched"},
        SplitCase{"sip:+4930;phone-context=example.com@gw", true, "+4930", "gw", "untouched"},
        SplitCase{"sips:bob@[::1]", true, "bob", "[::1]", "untouched"},
        SplitCase{"sip:example.com", true, "", "example.com", "untouched"},
        SplitCase{"sip:;x=1;y@gw", true, "x=1", "gw", "untouched"},
        SplitCase{"sip:;;@gw", true, "", "gw", "untouched"},
        SplitCase{"tel:+49-30;phone-context=Example.com", true, "+49-30", "Example.com", "untouched"},
        SplitCase{"tel:+4930", true, "+4930", "", "untouched"},
        SplitCase{"tel:1234;phone-context=+49-30", true, "1234", "", "untouched"},
        SplitCase{nullptr, false, "", "", "untouched"},
        SplitCase{"<mailto:alice@example.com>", false, "", "",
                  "CANNOT PROCESS UNKNOWN URI; MUST BE A SIP, SIPS OR TEL URI"}));

// Location services "alpha" and "beta" both answer example.com partially,
// "exact" answers exact.org:5060 and example.com:5060 exactly, "defA" and
// "defB" are default-domain services, "own" has no domain, and "backup"
// answers backup.org as a backup only.
class IdentityResolutionTest : public LookupTest {
 protected:
  void SetUp() override {
    locationService("alpha")->insertConfigDomain(0, hostPort("example.com"));
    identity("alpha", "alice");
    identity("alpha", "DEFAULT", LS_IdentityType::IDENTITY_GROUP);

    locationService("beta")->insertConfigDomain(0, hostPort("example.com"));
    RefPtr<LS_IIdentityConfig> const alice = identity("beta", "alice");
    alice->addConfigAliasName("al");
    alice->addConfigAliasRange("100", "199");
    alice->addConfigAliasExpression("9[0-9]*");
    identity("beta", "grp", LS_IdentityType::IDENTITY_GROUP)->addConfigAliasName("g");
    identity("beta", "DEFAULT");

    RefPtr<LS_ILocationServiceConfig> const exact = locationService("exact");
    exact->insertConfigDomain(0, hostPort("exact.org:5060"));
    exact->insertConfigDomain(1, hostPort("example.com:5060"));
    identity("exact", "bob")->addConfigAliasName("+4930");
    identity("exact", "tmpl", LS_IdentityType::IDENTITY_GROUP)->addConfigAliasName("inh");
    identity("exact", "derived", LS_IdentityType::IDENTITY, "tmpl");

    locationService("defA")->setConfigDefaultDomain(true);
    identity("defA", "x");
    locationService("defB")->setConfigDefaultDomain(true);
    identity("defB", "carol");
    identity("defB", "DEFAULT", LS_IdentityType::IDENTITY_GROUP);

    identity("own", "dave");

    RefPtr<LS_ILocationServiceConfig> const backup = locationService("backup");
    backup->setConfigImperative(LS_Imperative::BACKUP);
    backup->insertConfigDomain(0, hostPort("backup.org"));
    identity("backup", "eve");
  }
};

Vector<String> const ALL = namesOf({"alpha", "beta", "exact", "defA", "defB", "own", "backup"});
Vector<CHostPort> const GW = hostPortsOf({"gw:5060"});
Vector<String> const BETA = namesOf({"beta"});
constexpr bool USE_DEFAULT = true;

struct IdentityCase {
  char const* what;
  char const* nameAddr;
  Vector<String> names;
  char const* expected;  // "service/identity", or "-" for failure
  bool useDefault = false;
  Vector<CHostPort> localHostPorts = GW;
  char const* error = "untouched";
};

void PrintTo(IdentityCase const& c, std::ostream* os) {
  *os << c.what;
}

class IdentityResolution : public IdentityResolutionTest, public ::testing::WithParamInterface<IdentityCase> {};

TEST_P(IdentityResolution, FindsTheIdentityThroughTheThreePasses) {
  IdentityCase const& c = GetParam();
  // A failed lookup must leave what the caller held.
  RefPtr<LS_IIdentity> found;
  LS_getIdentityIf(runtimeService("own").get(), "dave", found);
  XCode const result = LS_getIdentity(error, found, nameAddr(c.nameAddr), c.names, c.useDefault, c.localHostPorts,
                                      LS_Imperative::AUTHORITATIVE, locationMaster.get());
  EXPECT_EQ(result.isSuccess() ? whereIs(found) : "-", c.expected);
  if (result.isFailure()) {
    EXPECT_EQ(whereIs(found), "own/dave");
  }
  EXPECT_EQ(error.str(), c.error);
}

INSTANTIATE_TEST_SUITE_P(
    Table,
    IdentityResolution,
    ::testing::Values(
        IdentityCase{"direct", "sip:bob@exact.org:5060", ALL, "exact/bob"},
        IdentityCase{"last partial wins", "sip:alice@example.com:5070", namesOf({"alpha", "beta"}), "beta/alice"},
        IdentityCase{"exact beats partial", "sip:bob@example.com:5060", namesOf({"alpha", "exact", "beta"}),
                     "exact/bob"},
        IdentityCase{"alias name", "sip:al@example.com:5070", BETA, "beta/alice"},
        IdentityCase{"alias range", "sip:150@example.com:5070", BETA, "beta/alice"},
        IdentityCase{"alias expression", "sip:9123@example.com:5070", BETA, "beta/alice"},
        IdentityCase{"inherited alias", "sip:inh@exact.org:5060", ALL, "exact/derived"},
        IdentityCase{"group name is no user", "sip:grp@example.com:5070", BETA, "-", USE_DEFAULT},
        IdentityCase{"group alias is no user", "sip:g@example.com:5070", BETA, "-"},
        IdentityCase{"DEFAULT of type identity unused", "sip:nobody@example.com:5070", BETA, "-", USE_DEFAULT},
        IdentityCase{"DEFAULT group", "sip:nobody@example.com:5070", namesOf({"alpha"}), "alpha/DEFAULT",
                     USE_DEFAULT},
        IdentityCase{"DEFAULT group only when asked", "sip:nobody@example.com:5070", namesOf({"alpha"}), "-"},
        IdentityCase{"responsible service decides alone", "sip:carol@example.com", namesOf({"alpha", "defB"}), "-",
                     false, hostPortsOf({"example.com"})},
        IdentityCase{"every default-domain service", "sip:carol@nowhere.net", ALL, "defB/carol"},
        IdentityCase{"DEFAULT group of a default-domain service", "sip:zed@nowhere.net", ALL, "defB/DEFAULT",
                     USE_DEFAULT},
        IdentityCase{"own host, other port, other case", "sip:dave@GW:7", ALL, "own/dave"},
        IdentityCase{"own host without the user", "sip:nobody@gw", ALL, "-"},
        IdentityCase{"own host only for local hosts", "sip:dave@nowhere.net", ALL, "-"},
        IdentityCase{"backup invisible to authoritative", "sip:eve@backup.org", ALL, "-"},
        IdentityCase{"local-host in any case is the first local host-port", "sip:bob@Local-Host",
                     namesOf({"alpha", "exact"}), "exact/bob", false, hostPortsOf({"example.com:5060", "gw"})},
        IdentityCase{"local-host without local host-ports", "sip:bob@local-host", ALL, "-", false,
                     Vector<CHostPort>(), "NO LOCAL DOMAINS"},
        IdentityCase{"TEL phone-context as host", "tel:+4930;phone-context=exact.org", ALL, "exact/bob"},
        IdentityCase{"TEL without host reaches own host only if local host is empty", "tel:+4930", ALL, "-"},
        IdentityCase{"missing name leaves its message", "sip:bob@exact.org:5060", namesOf({"gone", "exact"}),
                     "exact/bob", false, GW, "LOCATION-SERVICE 'gone' DOES NOT EXIST"},
        IdentityCase{"unknown scheme", "<http://example.com/>", ALL, "-", false, GW,
                     "CANNOT PROCESS UNKNOWN URI; MUST BE A SIP, SIPS OR TEL URI"}));

TEST_F(IdentityResolutionTest, WithoutNamesEveryServiceIsTriedInCreationOrderThroughTheRepository) {
  RefPtr<LS_IIdentity> found;
  EXPECT_TRUE(
      LS_getIdentity(error, found, nameAddr("sip:carol@nowhere.net"), false, GW, LS_Imperative::AUTHORITATIVE, nullptr)
          .isFailure());
  EXPECT_EQ(error, "DRIVER REPOSITORY DOES NOT EXIST");

  RefPtr<CDriverRepository> const repository = adoptRef(new CDriverRepository);
  repository->registerDriver(locationMaster.get());
  SYSTEM::SET_DRIVER_REPOSITORY(repository.get());
  error = "untouched";
  XCode const result =
      LS_getIdentity(error, found, nameAddr("sip:carol@nowhere.net"), false, GW, LS_Imperative::AUTHORITATIVE, nullptr);
  SYSTEM::SET_DRIVER_REPOSITORY(nullptr);
  ASSERT_TRUE(result.isSuccess());
  EXPECT_EQ(whereIs(found), "defB/carol");
  EXPECT_EQ(error, "untouched");
}

TEST(IdentityOrAlias, NullLocationServiceFindsNothing) {
  RefPtr<LS_IIdentity> found;
  EXPECT_TRUE(LS_getIdentityOrAliasIf(nullptr, "DEFAULT", true, found).isFailure());
  EXPECT_EQ(found.get(), nullptr);
}

struct PlainDomainCase {
  std::initializer_list<char const*> domains;
  char const* expected;  // "-" for failure
};

TEST_F(IdentityResolutionTest, FirstPlainDomainSkipsEmptyAndWildcardHosts) {
  PlainDomainCase const cases[] = {
      {{"*.example.com", "a*b.org", "plain.org:5070", "later.org"}, "plain.org:5070"},
      {{"gw*"}, "-"},
      {{}, "-"},
  };
  for (PlainDomainCase const& c : cases) {
    RefPtr<LS_ILocationServiceConfig> const service = locationService("plain");
    while (service->getNumberOfConfigDomains() > 0)
      service->removeConfigDomain(service->getConfigDomain(0));
    for (char const* domain : c.domains)
      service->insertConfigDomain(service->getNumberOfConfigDomains(), hostPort(domain));
    RefPtr<LS_IIdentity> identity;
    adoptInterface(identity, [&](UUID const& iid, void** raw) {
      return service->createConfigIdentityIf("id", "", LS_IdentityType::IDENTITY, iid, raw);
    });
    CHostPort out = hostPort("untouched");
    XCode const result = LS_getFristPlainDomanin(out, identity.get());
    EXPECT_EQ(result.isSuccess() ? LS_hostPortToString(out).str() : "-", c.expected);
    if (result.isFailure()) {
      EXPECT_EQ(LS_hostPortToString(out), "untouched");
    }
  }
  CHostPort out;
  EXPECT_TRUE(LS_getFristPlainDomanin(out, nullptr).isFailure());
}

}  // namespace
