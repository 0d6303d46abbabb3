#include "LS_CredentialLookup.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

#include "LS_IdentityResolution.h"
#include "LookupFixture.h"

namespace {

using Entries = std::initializer_list<std::pair<char const*, char const*>>;
constexpr auto HTTP = LS_AuthenticationProtocol::HTTP;
constexpr auto GPP = LS_AuthenticationProtocol::THREE_GPP;
constexpr auto INBOUND = LS_IdentityFace::AUTHENTICATION_INBOUND;
constexpr auto OUTBOUND = LS_IdentityFace::AUTHENTICATION_OUTBOUND;
constexpr auto AUTHORITATIVE = LS_Imperative::AUTHORITATIVE;

// Identity "alice" (alias "al") in location service "ls" inherits every
// authentication entry from the group "tmpl"; the requests address her as
// "al", so the URI user differs from her name. Authentication services:
// httpA (HTTP, r1 r2; alice, DEFAULT), httpB (HTTP, r2 r3; bob), gpp (3GPP,
// r1; alice), open and open2 (HTTP, no realms; alice), nodefault (HTTP, r9;
// x only).
class CredentialLookupTest : public LookupTest {
 protected:
  void SetUp() override {
    locationService("ls")->insertConfigDomain(0, hostPort("example.com"));
    tmpl = identity("ls", "tmpl", LS_IdentityType::IDENTITY_GROUP);
    identity("ls", "alice", LS_IdentityType::IDENTITY, "tmpl")->addConfigAliasName("al");
    LS_getIdentityIf(runtimeService("ls").get(), "alice", alice);
    asked = alice.get();

    RefPtr<LS_IAuthenticationService> const httpA = authenticationService("httpA", HTTP, {"r1", "r2"});
    httpA->setCredentials("alice", "pa");
    httpA->setCredentials("DEFAULT", "pd");
    authenticationService("httpB", HTTP, {"r2", "r3"})->setCredentials("bob", "pb");
    authenticationService("gpp", GPP, {"r1"})->setCredentials("alice", "pg");
    authenticationService("open", HTTP, {})->setCredentials("alice", "po");
    authenticationService("open2", HTTP, {})->setCredentials("alice", "po2");
    authenticationService("nodefault", HTTP, {"r9"})->setCredentials("x", "y");
  }

  // The three forms of a question give one answer; returns it.
  template <class Ask>
  std::string sameForEveryForm(Ask ask) {
    std::string const forIdentity = ask(Form::IDENTITY);
    EXPECT_EQ(ask(Form::ALL_SERVICES), forIdentity);
    EXPECT_EQ(ask(Form::NAMES), forIdentity);
    return forIdentity;
  }
  enum class Form { IDENTITY, ALL_SERVICES, NAMES };

  // Each question in one of its forms: the identity form asks asked, the
  // name-addr forms resolve address over all services or over among.
  XCode challenge(Form form, Vector<LS_ProtocolRealm>& out) {
    if (form == Form::IDENTITY)
      return LS_getInboundAuthenticationChallenge(error, out, asked, authenticationMaster.get());
    if (form == Form::NAMES)
      return LS_getInboundAuthenticationChallenge(error, out, address, among, useDefault, local, AUTHORITATIVE,
                                                  locationMaster.get(), authenticationMaster.get());
    return LS_getInboundAuthenticationChallenge(error, out, address, useDefault, local, AUTHORITATIVE,
                                                locationMaster.get(), authenticationMaster.get());
  }
  XCode response(Form form,
                 Vector<String>& passwords,
                 LS_AuthenticationProtocol::Type protocol,
                 char const* realm,
                 char const* claimed) {
    if (form == Form::IDENTITY)
      return LS_getInboundAuthenticationResponse(error, passwords, asked, address, protocol, realm, claimed,
                                                 authenticationMaster.get());
    if (form == Form::NAMES)
      return LS_getInboundAuthenticationResponse(error, passwords, address, protocol, realm, claimed, among,
                                                 useDefault, local, AUTHORITATIVE, locationMaster.get(),
                                                 authenticationMaster.get());
    return LS_getInboundAuthenticationResponse(error, passwords, address, protocol, realm, claimed, useDefault,
                                               local, AUTHORITATIVE, locationMaster.get(),
                                               authenticationMaster.get());
  }
  XCode outbound(Form form,
                 String& userName,
                 String& password,
                 LS_AuthenticationProtocol::Type protocol,
                 char const* realm) {
    if (form == Form::IDENTITY)
      return LS_getOutboundAuthenticationCredentials(error, userName, password, asked, address, protocol, realm,
                                                     authenticationMaster.get());
    if (form == Form::NAMES)
      return LS_getOutboundAuthenticationCredentials(error, userName, password, address, protocol, realm, among,
                                                     useDefault, local, AUTHORITATIVE, locationMaster.get(),
                                                     authenticationMaster.get());
    return LS_getOutboundAuthenticationCredentials(error, userName, password, address, protocol, realm,
                                                   useDefault, local, AUTHORITATIVE, locationMaster.get(),
                                                   authenticationMaster.get());
  }

  RefPtr<LS_IIdentityConfig> tmpl;
  RefPtr<LS_IIdentity> alice;
  // What the questions ask about, unless a test says otherwise.
  LS_IIdentity* asked = nullptr;
  CNameAddr address = nameAddr("sip:al@example.com");
  Vector<String> among = namesOf({"gone", "ls"});
  bool useDefault = false;
  Vector<CHostPort> const local = hostPortsOf({"gw"});
};

struct CredentialsCase {
  char const* service;
  char const* user;
  char const* expected;  // "user:password" or the error text
};

TEST_F(CredentialLookupTest, CredentialsFallBackToDefaultAndNameTheMissingPiece) {
  CredentialsCase const cases[] = {
      {"httpA", "alice", "alice:pa"},
      {"httpA", "zed", "DEFAULT:pd"},
      {"nodefault", "zed", "NO CREDENTIALS FOUND FOR USERNAME 'zed' or 'default' IN AUTHENTICATION-SERVICE 'nodefault'"},
      {"missing", "alice", "AUTHENTICATION-SERVICE 'missing' DOES NOT EXIST"},
  };
  for (CredentialsCase const& c : cases) {
    LS_Credentials out;
    out.password = "untouched";
    XCode const result = LS_getCredentials(error, out, c.service, c.user, authenticationMaster.get());
    if (result.isFailure()) {
      EXPECT_EQ(error.str(), c.expected);
      EXPECT_EQ(out.password, "untouched");
      EXPECT_EQ(out.authenticationService.get(), nullptr);
      continue;
    }
    EXPECT_EQ(out.userName.str() + ":" + out.password.str(), c.expected);
    EXPECT_EQ(out.authenticationService->getName().str(), c.service);
  }
}

TEST_F(CredentialLookupTest, EntriesAppendOutboundThenInboundWithoutEmptyingTheOutput) {
  setEntries(tmpl.get(), OUTBOUND, {{"o", "u1"}});
  auto entries = [&](unsigned int type) {
    Vector<LS_Authenticate> out;
    out.add(LS_Authenticate{"kept", ""});
    EXPECT_TRUE(LS_getIdentityAuthenticates(error, out, alice.get(), LS_AuthenticationType::Type(type)).isSuccess());
    std::string text;
    for (LS_Authenticate const& entry : out)
      text += entry.authenticationService.str() + "/" + entry.userName.str() + " ";
    return text;
  };
  EXPECT_EQ(entries(1), "kept/ ") << "no inbound face";
  setEntries(tmpl.get(), INBOUND, {{"i", ""}, {"j", "u2"}});
  EXPECT_EQ(entries(0), "kept/ o/u1 ");
  EXPECT_EQ(entries(1), "kept/ i/ j/u2 ");
  EXPECT_EQ(entries(7), "kept/ o/u1 i/ j/u2 ");
  Vector<LS_Authenticate> out;
  EXPECT_TRUE(LS_getIdentityOutboundAuthenticates(error, out, nullptr).isFailure());
  EXPECT_EQ(error, "INVALID IDENTITY");
}

struct ChallengeCase {
  char const* what;
  Entries entries;
  char const* expected;  // "PROTOCOL:realm " for each pair
  char const* error;
};

TEST_F(CredentialLookupTest, ChallengeListsEachProtocolRealmPairOnce) {
  ChallengeCase const cases[] = {
      {"equal realm of one protocol once", {{"httpA", ""}, {"httpB", "bob"}}, "HTTP:r1 HTTP:r2 HTTP:r3 ", "untouched"},
      {"same realm of another protocol", {{"httpA", ""}, {"gpp", ""}}, "HTTP:r1 HTTP:r2 3GPP:r1 ", "untouched"},
      {"unknown user falls back to DEFAULT", {{"httpA", "carl"}}, "HTTP:r1 HTTP:r2 ", "untouched"},
      {"all entries fail",
       {{"missing", ""}, {"nodefault", ""}},
       "",
       "NO CREDENTIALS FOUND FOR USERNAME 'alice' or 'default' IN AUTHENTICATION-SERVICE 'nodefault'"},
      {"service without realms", {{"open", ""}}, "", "untouched"},
  };
  for (ChallengeCase const& c : cases) {
    SCOPED_TRACE(c.what);
    setEntries(tmpl.get(), INBOUND, c.entries);
    std::string const answer = sameForEveryForm([&](Form form) {
      error = "untouched";
      Vector<LS_ProtocolRealm> out;
      out.add(LS_ProtocolRealm{HTTP, "stale"});
      XCode const result = challenge(form, out);
      EXPECT_TRUE(result.isSuccess());
      std::string text;
      for (LS_ProtocolRealm const& pair : out)
        text += std::string(LS_AuthenticationProtocol::NAME(pair.protocol)) + ":" + pair.realm.str() + " ";
      // The names form first skips "gone", whose message stays unless an
      // entry writes a later one.
      bool const skipsGone = form == Form::NAMES && std::string(c.error) == "untouched";
      EXPECT_EQ(error.str(), skipsGone ? "LOCATION-SERVICE 'gone' DOES NOT EXIST" : c.error);
      return text;
    });
    EXPECT_EQ(answer, c.expected);
  }
}

struct ResponseCase {
  char const* what;
  Entries entries;
  LS_AuthenticationProtocol::Type protocol;
  char const* realm;
  char const* claimed;
  char const* expected;  // "password " for each password
};

TEST_F(CredentialLookupTest, ResponseChecksAgainstResponsibleCredentialsOfTheClaimedUser) {
  ResponseCase const cases[] = {
      {"own name", {{"httpA", ""}}, HTTP, "r1", "alice", "pa "},
      {"realm not answered", {{"httpA", ""}}, HTTP, "r3", "alice", ""},
      {"protocol chooses", {{"httpA", ""}, {"gpp", ""}}, GPP, "r1", "alice", "pg "},
      {"DEFAULT for the URI user", {{"httpA", "carl"}}, HTTP, "r1", "al", "pd "},
      {"DEFAULT not for another user", {{"httpA", "carl"}}, HTTP, "r1", "carl", ""},
      {"equal passwords all count", {{"httpA", ""}, {"open", ""}, {"httpA", ""}}, HTTP, "r2", "alice", "pa po pa "},
  };
  for (ResponseCase const& c : cases) {
    SCOPED_TRACE(c.what);
    setEntries(tmpl.get(), INBOUND, c.entries);
    std::string const answer = sameForEveryForm([&](Form form) {
      Vector<String> passwords;
      passwords.add("stale");
      XCode const result = response(form, passwords, c.protocol, c.realm, c.claimed);
      EXPECT_TRUE(result.isSuccess());
      std::string text;
      for (String const& password : passwords)
        text += password.str() + " ";
      return text;
    });
    EXPECT_EQ(answer, c.expected);
  }
}

struct OutboundCase {
  char const* what;
  Entries entries;
  LS_AuthenticationProtocol::Type protocol;
  char const* realm;
  char const* expected;  // "user:password" or the error text
};

TEST_F(CredentialLookupTest, OutboundTakesTheFirstAnswerUnlessALaterOneListsTheRealm) {
  OutboundCase const cases[] = {
      {"exact beats an earlier match", {{"open", ""}, {"httpA", ""}}, HTTP, "r1", "alice:pa"},
      {"first of two without realms", {{"open", ""}, {"open2", ""}}, HTTP, "r1", "alice:po"},
      {"first exact ends the search", {{"httpA", ""}, {"httpB", "bob"}}, HTTP, "r2", "alice:pa"},
      {"DEFAULT presents the URI user", {{"httpA", "carl"}}, HTTP, "r2", "al:pd"},
      {"entry user name", {{"httpB", "bob"}}, HTTP, "r3", "bob:pb"},
      {"no responsible service", {{"httpA", ""}}, GPP, "r1",
       "NO CREDENTIALS ON IDENTITY 'alice' FOR PROTOCOL '3GPP', AND REALM 'r1'"},
      {"realm nobody lists", {{"gpp", ""}, {"httpB", "bob"}}, HTTP, "r1",
       "NO CREDENTIALS ON IDENTITY 'alice' FOR PROTOCOL 'HTTP', AND REALM 'r1'"},
  };
  for (OutboundCase const& c : cases) {
    SCOPED_TRACE(c.what);
    setEntries(tmpl.get(), OUTBOUND, c.entries);
    std::string const answer = sameForEveryForm([&](Form form) {
      String userName("stale");
      String password("stale");
      XCode const result = outbound(form, userName, password, c.protocol, c.realm);
      if (result.isSuccess())
        return userName.str() + ":" + password.str();
      EXPECT_EQ(userName.str() + password.str(), "");
      return error.str();
    });
    EXPECT_EQ(answer, c.expected);
  }
}

TEST_F(CredentialLookupTest, DefaultGroupAuthenticatesWithTheDefaultCredentialsForTheUriUser) {
  RefPtr<LS_IIdentityConfig> const group = identity("ls", "DEFAULT", LS_IdentityType::IDENTITY_GROUP);
  setEntries(group.get(), INBOUND, {{"httpA", ""}});
  setEntries(group.get(), OUTBOUND, {{"httpA", ""}});
  address = nameAddr("sip:zed@example.com");
  useDefault = true;

  Vector<LS_ProtocolRealm> realms;
  ASSERT_TRUE(challenge(Form::ALL_SERVICES, realms).isSuccess());
  EXPECT_EQ(realms.size(), 2u);
  Vector<String> passwords;
  ASSERT_TRUE(response(Form::ALL_SERVICES, passwords, HTTP, "r1", "zed").isSuccess());
  EXPECT_EQ(passwords, namesOf({"pd"}));
  String userName;
  String password;
  ASSERT_TRUE(outbound(Form::ALL_SERVICES, userName, password, HTTP, "r1").isSuccess());
  EXPECT_EQ(userName.str() + ":" + password.str(), "zed:pd");
  EXPECT_EQ(error, "untouched");
}

struct FailureCase {
  char const* what;
  bool nullIdentity;  // asks the identity forms, else the name-addr forms
  char const* nameAddr;
  char const* error;
};

TEST_F(CredentialLookupTest, EveryQuestionEmptiesItsOutputsOnFailure) {
  setEntries(tmpl.get(), INBOUND, {{"httpA", ""}});
  setEntries(tmpl.get(), OUTBOUND, {{"httpA", ""}});
  FailureCase const cases[] = {
      {"null identity", true, "sip:al@example.com", "INVALID IDENTITY"},
      {"no identity for the user", false, "sip:zed@example.com", "untouched"},
      {"unknown scheme", false, "<mailto:al@example.com>", "CANNOT PROCESS UNKNOWN URI; MUST BE A SIP, SIPS OR TEL URI"},
  };
  among = namesOf({"ls"});
  for (FailureCase const& c : cases) {
    for (Form form : {Form::IDENTITY, Form::ALL_SERVICES, Form::NAMES}) {
      if ((form == Form::IDENTITY) != c.nullIdentity)
        continue;
      SCOPED_TRACE(std::string(c.what) + " form " + std::to_string(int(form)));
      address = nameAddr(c.nameAddr);
      asked = c.nullIdentity ? nullptr : alice.get();

      error = "untouched";
      Vector<LS_ProtocolRealm> realms;
      realms.add(LS_ProtocolRealm{HTTP, "stale"});
      EXPECT_TRUE(challenge(form, realms).isFailure() && realms.isEmpty());
      EXPECT_EQ(error.str(), c.error);

      error = "untouched";
      Vector<String> passwords;
      passwords.add("stale");
      EXPECT_TRUE(response(form, passwords, HTTP, "r1", "al").isFailure() &&
                  passwords.isEmpty());
      EXPECT_EQ(error.str(), c.error);

      error = "untouched";
      String userName("stale");
      String password("stale");
      EXPECT_TRUE(outbound(form, userName, password, HTTP, "r1").isFailure() &&
                  userName.isEmpty() && password.isEmpty());
      EXPECT_EQ(error.str(), c.error);
    }
  }
}

}  // namespace
