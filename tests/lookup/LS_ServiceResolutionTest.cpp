#include "LS_ServiceResolution.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

#include "CDriverRepository.h"
#include "LS_IdentityResolution.h"
#include "LookupFixture.h"
#include "SystemRepository.h"

namespace {

// Both masters, registered in a repository that a test installs when it
// wants the lookups to find them, with location services of every kind.
class ServiceResolutionTest : public LookupTest {
 protected:
  void SetUp() override {
    repository->registerDriver(locationMaster.get());
    repository->registerDriver(authenticationMaster.get());
    locationService("partial1")->insertConfigDomain(0, hostPort("example.com"));
    locationService("partial2")->insertConfigDomain(0, hostPort("example.com"));
    locationService("exact")->insertConfigDomain(0, hostPort("example.com:5060"));
    RefPtr<LS_ILocationServiceConfig> const backup = locationService("backup");
    backup->setConfigImperative(LS_Imperative::BACKUP);
    backup->insertConfigDomain(0, hostPort("backup.org"));
    RefPtr<LS_ILocationServiceConfig> const fallback = locationService("default");
    fallback->setConfigImperative(LS_Imperative::BACKUP);
    fallback->setConfigDefaultDomain(true);
    locationService("local");
  }
  void TearDown() override { SYSTEM::SET_DRIVER_REPOSITORY(nullptr); }

  RefPtr<CDriverRepository> repository = adoptRef(new CDriverRepository);
};

constexpr auto AUTHORITATIVE = LS_Imperative::AUTHORITATIVE;
constexpr char const* NONE_FOR = "NO LOCATION-SERVICE IS RESPONSIBLE FOR DOMAIN ";

struct HostCase {
  char const* what;
  char const* host;
  Vector<String> names;
  std::string expected;  // the service's name, or the error text
  char const* localHostPort = "gw";
  LS_Imperative::Type imperative = AUTHORITATIVE;
};

void PrintTo(HostCase const& c, std::ostream* os) {
  *os << c.what;
}

class HostResolution : public ServiceResolutionTest, public ::testing::WithParamInterface<HostCase> {};

TEST_P(HostResolution, ChoosesByDomainThenDefaultThenLocalHostPorts) {
  HostCase const& c = GetParam();
  RefPtr<LS_ILocationService> found;
  XCode const result = LS_getLocationService(error, found, hostPort(c.host), c.names,
                                             hostPortsOf({c.localHostPort}), c.imperative, locationMaster.get());
  EXPECT_EQ(result.isSuccess() ? found->getName().str() : error.str(), c.expected);
  EXPECT_TRUE(result.isSuccess() ? error == "untouched" : !found);
}

INSTANTIATE_TEST_SUITE_P(
    Table,
    HostResolution,
    ::testing::Values(
        HostCase{"exact beats an earlier partial", "example.com:5060", namesOf({"partial1", "exact"}), "exact"},
        HostCase{"first of two partials", "example.com:5060", namesOf({"partial2", "partial1"}), "partial2"},
        HostCase{"host case ignored", "EXAMPLE.com:5070", namesOf({"exact", "partial1"}), "partial1"},
        HostCase{"other port is no match", "example.com:5061", namesOf({"exact"}),
                 std::string(NONE_FOR) + "'example.com:5061'"},
        HostCase{"default beats a local host-port", "gw:5060", namesOf({"local", "default"}), "default",
                 "gw:5060"},
        HostCase{"configured domain beats default", "example.com", namesOf({"default", "partial1"}), "partial1"},
        HostCase{"local host-port in the last pass", "gw:5060", namesOf({"local"}), "local"},
        HostCase{"backup invisible to authoritative", "backup.org", namesOf({"backup"}),
                 std::string(NONE_FOR) + "'backup.org'"},
        HostCase{"backup seen by backup", "backup.org", namesOf({"backup"}), "backup", "gw",
                 LS_Imperative::BACKUP},
        HostCase{"missing name skipped silently", "example.com", namesOf({"gone", "partial1"}), "partial1"},
        HostCase{"no names", "example.com", Vector<String>(), std::string(NONE_FOR) + "'example.com'"}));

TEST_F(ServiceResolutionTest, WithoutNamesEveryServiceIsTriedInCreationOrderThroughTheRepository) {
  SYSTEM::SET_DRIVER_REPOSITORY(repository.get());
  RefPtr<LS_ILocationService> found;
  ASSERT_TRUE(LS_getLocationService(error, found, hostPort("example.com:5060"), Vector<CHostPort>(), AUTHORITATIVE,
                                    nullptr)
                  .isSuccess());
  EXPECT_EQ(found->getName(), "exact");
  ASSERT_TRUE(
      LS_getLocationService(error, found, hostPort("nowhere"), Vector<CHostPort>(), AUTHORITATIVE, nullptr).isSuccess());
  EXPECT_EQ(found->getName(), "default");
  EXPECT_EQ(error, "untouched");
}

TEST_F(ServiceResolutionTest, MissingNamesSayWhatIsMissing) {
  RefPtr<LS_ILocationService> location;
  RefPtr<LS_IAuthenticationService> authentication;
  EXPECT_TRUE(LS_getLocationService(error, location, "exact", locationMaster.get()).isSuccess())
      << "a given master needs no repository";

  SYSTEM::SET_DRIVER_REPOSITORY(repository.get());
  EXPECT_TRUE(LS_getLocationService(error, location, "Exact", nullptr).isFailure());
  EXPECT_EQ(error, "LOCATION-SERVICE 'Exact' DOES NOT EXIST");
  EXPECT_EQ(location.get(), nullptr);
  EXPECT_TRUE(LS_getAuthenticationService(error, authentication, "a%s", nullptr).isFailure());
  EXPECT_EQ(error, "AUTHENTICATION-SERVICE 'a%s' DOES NOT EXIST");

  adoptInterface(authentication, [&](UUID const& iid, void** raw) {
    return authenticationMaster->createAuthenticationServiceIf("a", iid, raw);
  });
  error = "untouched";
  EXPECT_TRUE(LS_getAuthenticationService(error, authentication, "a", nullptr).isSuccess());
  EXPECT_TRUE(LS_getLocationService(error, location, "exact", nullptr).isSuccess());
  EXPECT_EQ(error, "untouched");
}

// A gateway's two masters with what each question asks for: location
// service "ls" for example.com holding identity "alice", and
// authentication service "auth".
struct Gateway {
  Gateway() {
    RefPtr<LS_ILocationServiceConfig> config;
    adoptInterface(config, [&](UUID const& iid, void** raw) {
      return location->createLocationServiceIf("ls", iid, raw);
    });
    config->insertConfigDomain(0, hostPort("example.com"));
    adoptInterface(alice, [&](UUID const& iid, void** raw) {
      return config->createConfigIdentityIf("alice", "", LS_IdentityType::IDENTITY, iid, raw);
    });
    adoptInterface(auth, [&](UUID const& iid, void** raw) {
      return authentication->createAuthenticationServiceIf("auth", iid, raw);
    });
    LS_getLocationServiceIf(location.get(), "ls", service);
  }
  void registerIn(CDriverRepository& repository) {
    repository.registerDriver(location.get());
    repository.registerDriver(authentication.get());
  }
  void unregisterFrom(CDriverRepository& repository) {
    repository.unregisterDriver(location->getDriverName());
    repository.unregisterDriver(authentication->getDriverName());
  }

  RefPtr<LS_CMasterLocationService> location = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_CMasterAuthenticationService> authentication = adoptRef(new LS_CMasterAuthenticationService);
  RefPtr<LS_ILocationService> service;
  RefPtr<LS_IIdentity> alice;
  RefPtr<LS_IAuthenticationService> auth;
};

// Masters registered, replaced and removed between questions: every
// question asked without a master finds the masters registered at that
// moment, whatever it found before.
class RepositoryChanges : public ::testing::Test {
 protected:
  void TearDown() override { SYSTEM::SET_DRIVER_REPOSITORY(nullptr); }

  // Which gateway answers the location service by name, by host, the
  // identity and the authentication service, or the error text.
  std::string answers() {
    std::string text;
    String error;
    auto const note = [&](XCode result, void const* found, void const* fromFirst, void const* fromSecond) {
      text += result.isFailure() ? error.str() : found == fromFirst ? "first" : found == fromSecond ? "second" : "?";
      text += "; ";
    };
    RefPtr<LS_ILocationService> service;
    XCode result = LS_getLocationService(error, service, "ls", nullptr);
    note(result, service.get(), first.service.get(), second.service.get());
    result = LS_getLocationService(error, service, hostPort("example.com"), Vector<CHostPort>(),
                                   LS_Imperative::AUTHORITATIVE, nullptr);
    note(result, service.get(), first.service.get(), second.service.get());
    RefPtr<LS_IIdentity> identity;
    result = LS_getIdentity(error, identity, nameAddr("sip:alice@example.com"), false, Vector<CHostPort>(),
                            LS_Imperative::AUTHORITATIVE, nullptr);
    note(result, identity.get(), first.alice.get(), second.alice.get());
    RefPtr<LS_IAuthenticationService> auth;
    result = LS_getAuthenticationService(error, auth, "auth", nullptr);
    note(result, auth.get(), first.auth.get(), second.auth.get());
    return text;
  }

  Gateway first;
  Gateway second;
  RefPtr<CDriverRepository> const repository = adoptRef(new CDriverRepository);
  RefPtr<CDriverRepository> const other = adoptRef(new CDriverRepository);
};

TEST_F(RepositoryChanges, EveryQuestionFindsTheMastersRegisteredAtTheTime) {
  auto const everyQuestion = [](std::string const& answer) { return answer + answer + answer + answer; };
  struct Step {
    char const* what;
    std::function<void()> change;
    std::string expected;
  };
  Step const steps[] = {
      {"first registered",
       [&] {
         first.registerIn(*repository);
         SYSTEM::SET_DRIVER_REPOSITORY(repository.get());
       },
       everyQuestion("first; ")},
      {"replaced by the second",
       [&] {
         first.unregisterFrom(*repository);
         second.registerIn(*repository);
       },
       everyQuestion("second; ")},
      {"removed", [&] { second.unregisterFrom(*repository); },
       "MASTER LOCATION-SERVICE DOES NOT EXIST; MASTER LOCATION-SERVICE DOES NOT EXIST; "
       "MASTER LOCATION-SERVICE DOES NOT EXIST; MASTER AUTHENTICATION-SERVICE DOES NOT EXIST; "},
      {"first in another repository",
       [&] {
         first.registerIn(*other);
         SYSTEM::SET_DRIVER_REPOSITORY(other.get());
       },
       everyQuestion("first; ")},
      {"no repository", [&] { SYSTEM::SET_DRIVER_REPOSITORY(nullptr); },
       everyQuestion("DRIVER REPOSITORY DOES NOT EXIST; ")},
  };
  for (Step const& step : steps) {
    step.change();
    EXPECT_EQ(answers(), step.expected) << step.what;
  }
}

}  // namespace
