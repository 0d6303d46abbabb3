#include "LS_CAuthenticationService.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "faces/DumpRows.h"
#include "support/LogCapture.h"

namespace {

using Realms = std::vector<std::string>;

std::vector<std::string> textsOf(Vector<String> const& texts) {
  std::vector<std::string> result;
  for (String const& text : texts)
    result.push_back(text.str());
  return result;
}

Realms realmsOf(LS_IAuthenticationService const& service) {
  Realms realms;
  for (unsigned int index = 0; index < service.getNumberOfRealms(); ++index)
    realms.push_back(service.getRealm(index).str());
  return realms;
}

struct RealmEdit {
  char const* what;
  void (*edit)(LS_IAuthenticationService&);
  Realms expected;
};

void PrintTo(RealmEdit const& edit, std::ostream* os) {
  *os << edit.what;
}

class RealmEdits : public ::testing::TestWithParam<RealmEdit> {};

TEST_P(RealmEdits, KeepEachRealmOnceAndFollowTheIndexRules) {
  RefPtr<LS_CAuthenticationService> const service = adoptRef(new LS_CAuthenticationService);
  for (char const* realm : {"r1", "r2", "r3"})
    service->insertRealm(99, realm);
  GetParam().edit(*service);
  EXPECT_EQ(realmsOf(*service), GetParam().expected);
}

using S = LS_IAuthenticationService;

// Moves beyond either end follow the list rule shared with the proxies and
// pinned there; these rows keep the service's own rule: each realm once.
std::vector<RealmEdit> const REALM_EDITS = {
    {"insert existing in front", [](S& s) { s.insertRealm(0, "r3"); }, {"r3", "r1", "r2"}},
    {"insert existing past the end", [](S& s) { s.insertRealm(3, "r1"); }, {"r2", "r3", "r1"}},
    {"insert existing after itself", [](S& s) { s.insertRealm(2, "r1"); }, {"r2", "r1", "r3"}},
    {"insert new in the middle", [](S& s) { s.insertRealm(1, "n"); }, {"r1", "n", "r2", "r3"}},
    {"modify onto an existing realm", [](S& s) { s.modifyRealm(0, "r3"); }, {"r3", "r2"}},
    {"modify past the end appends", [](S& s) { s.modifyRealm(7, "n"); }, {"r1", "r2", "r3", "n"}},
    {"modify after an earlier equal realm", [](S& s) { s.modifyRealm(2, "r1"); }, {"r2", "r1"}},
    {"move one place", [](S& s) { s.moveRealm(0, 1); }, {"r2", "r1", "r3"}},
    {"remove", [](S& s) { s.removeRealm("r2"); }, {"r1", "r3"}},
    {"remove unknown", [](S& s) { s.removeRealm("R2"); }, {"r1", "r2", "r3"}},
};

INSTANTIATE_TEST_SUITE_P(Table, RealmEdits, ::testing::ValuesIn(REALM_EDITS));

struct Responsibility {
  LS_AuthenticationProtocol::Type protocol;
  Realms realms;
  char const* requested;
  bool responsible;
  bool exact;
};

class AuthenticationServiceResponsibility : public ::testing::TestWithParam<Responsibility> {};

TEST_P(AuthenticationServiceResponsibility, FollowsProtocolThenRealms) {
  RefPtr<LS_CAuthenticationService> const service = adoptRef(new LS_CAuthenticationService);
  for (std::string const& realm : GetParam().realms)
    service->insertRealm(99, realm.c_str());
  bool exact = !GetParam().exact;
  EXPECT_EQ(service->isResponsible(GetParam().protocol, GetParam().requested, exact), GetParam().responsible);
  EXPECT_EQ(exact, GetParam().exact);
}

constexpr auto HTTP = LS_AuthenticationProtocol::HTTP;
constexpr auto GPP = LS_AuthenticationProtocol::THREE_GPP;

INSTANTIATE_TEST_SUITE_P(Table,
                         AuthenticationServiceResponsibility,
                         ::testing::Values(Responsibility{HTTP, {}, "any", true, false},
                                           Responsibility{GPP, {}, "any", false, false},
                                           Responsibility{HTTP, {"a", "b"}, "b", true, true},
                                           Responsibility{HTTP, {"a"}, "A", false, false},
                                           Responsibility{GPP, {"a"}, "a", false, false}));

TEST(AuthenticationService, SettingAUserAgainMovesItLastAndLogsThePassword) {
  LogCapture log;
  RefPtr<LS_CAuthenticationService> service = adoptRef(new LS_CAuthenticationService);
  void const* const self = service.get();
  service->setCredentials("alice", "a1");
  service->setCredentials("bob", "b1");
  service->setCredentials("alice", "a2");
  service->removeCredentials("carol");

  Vector<String> users;
  service->getAllCredentials(users);
  EXPECT_EQ(textsOf(users), (std::vector<std::string>{"bob", "alice"}));
  String password("untouched");
  EXPECT_TRUE(service->getCredentials("alice", password).isSuccess());
  EXPECT_EQ(password, "a2");
  service->removeCredentials("alice");
  EXPECT_TRUE(service->getCredentials("alice", password).isFailure());
  EXPECT_EQ(password, "a2");
  service = nullptr;

  EXPECT_EQ(log.lines(), (std::vector<std::string>{
                             formatted("LS_CAuthenticationService(%p)::LS_CAuthenticationService()\n", self),
                             formatted("LS_CAuthenticationService(%p)::createCredentials(alice, a1)\n", self),
                             formatted("LS_CAuthenticationService(%p)::createCredentials(bob, b1)\n", self),
                             formatted("LS_CAuthenticationService(%p)::createCredentials(alice, a2)\n", self),
                             formatted("LS_CAuthenticationService(%p)::removeCredentials(carol)\n", self),
                             formatted("LS_CAuthenticationService(%p)::removeCredentials(alice)\n", self),
                             formatted("LS_CAuthenticationService(%p)::~LS_CAuthenticationService()\n", self),
                         }));
}

TEST(AuthenticationService, DumpShowsRealmsWithTheMasterFirstAndUsersWithoutPasswords) {
  RefPtr<LS_CAuthenticationService> const service = adoptRef(new LS_CAuthenticationService);
  service->setName("auth%d");
  InfoContainer empty;
  service->getInfo(empty, 9, 1, 0, 0, "> ");
  EXPECT_EQ(dumpRows(empty), (DumpRows{"1|> Authentication-Service|auth%d", "2|Protocol|HTTP", "2|Realms|(none)",
                                       "2|Credentials|(none)"}));

  service->setProtocol(LS_AuthenticationProtocol::THREE_GPP);
  service->insertRealm(0, "r1");
  service->insertRealm(1, "r2");
  service->setCredentials("bob", "secret-b");
  service->setCredentials("alice", "secret-a");
  InfoContainer full;
  service->getInfo(full, 9, 1, 0, 0, "");
  EXPECT_EQ(dumpRows(full), (DumpRows{"1|Authentication-Service|auth%d", "2|Protocol|3GPP", "2|Realms|", "3|r1|(master)",
                                      "3|r2|", "2|Credentials|", "3|bob|", "3|alice|"}));

  InfoContainer cut;
  service->getInfo(cut, 1, 1, 0, 0, "");
  EXPECT_EQ(dumpRows(cut), DumpRows{"1|Authentication-Service|auth%d"});
}

}  // namespace
