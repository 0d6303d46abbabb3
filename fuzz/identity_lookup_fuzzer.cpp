// Feeds arbitrary bytes, as the name-addr of a request, to the identity
// resolution and the three authentication questions, against one fixed
// model: location services with domains, a default-domain service and a
// backup one; identities with alias names, ranges and expressions, some
// inheriting from a group; "DEFAULT" groups; authentication services with
// and without realms and "DEFAULT" credentials. The first byte chooses the
// use-default flag, the protocol and the realm; the rest is the name-addr.
// Besides not crashing, every answer must keep the lookups' contracts:
// failures leave the outputs empty, and the name-addr forms agree with the
// identity forms.
#include <cstddef>
#include <cstdint>
#include <cstdlib>

#include "CNameAddr.h"
#include "LS_CMasterAuthenticationService.h"
#include "LS_CMasterLocationService.h"
#include "LS_CredentialLookup.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_IdentityResolution.h"

namespace {

void check(bool condition) {
  if (!condition)
    std::abort();
}

CHostPort hostPort(char const* text) {
  CHostPort parsed;
  parsed = CString(text);
  return parsed;
}

// Built on the first input and kept until the process ends; the lookups
// change nothing in it.
struct Model {
  Model() {
    RefPtr<LS_ILocationServiceConfig> const alpha = service("alpha");
    alpha->insertConfigDomain(0, hostPort("example.com"));
    alpha->insertConfigDomain(1, hostPort("*.example.com:5060"));
    RefPtr<LS_IIdentityConfig> const group = identity(alpha, "staff", "", LS_IdentityType::IDENTITY_GROUP);
    group->addConfigAliasRange("200", "299");
    entries(group, LS_IdentityFace::AUTHENTICATION_INBOUND, "http", "");
    entries(group, LS_IdentityFace::AUTHENTICATION_OUTBOUND, "open", "");
    RefPtr<LS_IIdentityConfig> const alice = identity(alpha, "alice", "staff", LS_IdentityType::IDENTITY);
    alice->addConfigAliasName("al");
    alice->addConfigAliasRange("100", "199");
    alice->addConfigAliasExpression("9[0-9]*");
    entries(alice, LS_IdentityFace::AUTHENTICATION_OUTBOUND, "http", "al");
    identity(alpha, "bob", "staff", LS_IdentityType::IDENTITY);
    RefPtr<LS_IIdentityConfig> const fallback = identity(alpha, "DEFAULT", "", LS_IdentityType::IDENTITY_GROUP);
    entries(fallback, LS_IdentityFace::AUTHENTICATION_INBOUND, "gpp", "");
    entries(fallback, LS_IdentityFace::AUTHENTICATION_INBOUND, "missing", "");

    RefPtr<LS_ILocationServiceConfig> const beta = service("beta");
    beta->insertConfigDomain(0, hostPort("example.com:5060"));
    beta->setConfigImperative(LS_Imperative::BACKUP);
    identity(beta, "carol", "", LS_IdentityType::IDENTITY)->addConfigAliasExpression("+49.*");

    RefPtr<LS_ILocationServiceConfig> const anywhere = service("anywhere");
    anywhere->setConfigDefaultDomain(true);
    identity(anywhere, "dave", "", LS_IdentityType::IDENTITY)->addConfigAliasName("");
    RefPtr<LS_IIdentityConfig> const open = identity(anywhere, "DEFAULT", "", LS_IdentityType::IDENTITY_GROUP);
    entries(open, LS_IdentityFace::AUTHENTICATION_INBOUND, "http", "DEFAULT");
    entries(open, LS_IdentityFace::AUTHENTICATION_OUTBOUND, "http", "");

    RefPtr<LS_IAuthenticationService> const http = authenticationService("http", LS_AuthenticationProtocol::HTTP);
    http->insertRealm(0, "r1");
    http->insertRealm(1, "r2");
    http->setCredentials("alice", "pa");
    http->setCredentials("DEFAULT", "pd");
    RefPtr<LS_IAuthenticationService> const gpp = authenticationService("gpp", LS_AuthenticationProtocol::THREE_GPP);
    gpp->insertRealm(0, "r1");
    gpp->setCredentials("DEFAULT", "pg");
    authenticationService("open", LS_AuthenticationProtocol::HTTP)->setCredentials("bob", "pb");

    names.add("gone");
    names.add("alpha");
    names.add("beta");
    names.add("anywhere");
    localHostPorts.add(hostPort("gw:5060"));
    localHostPorts.add(hostPort("10.0.0.1"));
  }

  RefPtr<LS_ILocationServiceConfig> service(char const* name) {
    RefPtr<LS_ILocationServiceConfig> created;
    adoptInterface(created,
                   [&](UUID const& iid, void** raw) { return locationMaster->createLocationServiceIf(name, iid, raw); });
    return created;
  }
  static RefPtr<LS_IIdentityConfig> identity(RefPtr<LS_ILocationServiceConfig> const& owner,
                                             char const* name,
                                             char const* base,
                                             LS_IdentityType::Type type) {
    RefPtr<LS_IIdentityConfig> created;
    adoptInterface(created, [&](UUID const& iid, void** raw) {
      return owner->createConfigIdentityIf(name, base, type, iid, raw);
    });
    return created;
  }
  static void entries(RefPtr<LS_IIdentityConfig> const& identity,
                      LS_IdentityFace::Type face,
                      char const* service,
                      char const* user) {
    RefPtr<LS_IAuthenticationConfig> config;
    adoptInterface(config, [&](UUID const& iid, void** raw) { return identity->createConfigFaceIf(face, iid, raw); });
    config->insertConfigAuthenticate(~0u, service, user);
  }
  RefPtr<LS_IAuthenticationService> authenticationService(char const* name, LS_AuthenticationProtocol::Type protocol) {
    RefPtr<LS_IAuthenticationService> created;
    adoptInterface(created, [&](UUID const& iid, void** raw) {
      return authenticationMaster->createAuthenticationServiceIf(name, iid, raw);
    });
    created->setProtocol(protocol);
    return created;
  }

  // Declared first so that they go last, cutting the identities' links back
  // to their services.
  RefPtr<LS_CMasterLocationService> locationMaster = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_CMasterAuthenticationService> authenticationMaster = adoptRef(new LS_CMasterAuthenticationService);
  Vector<String> names;
  Vector<CHostPort> localHostPorts;
};

bool sameRealms(Vector<LS_ProtocolRealm> const& a, Vector<LS_ProtocolRealm> const& b) {
  if (a.size() != b.size())
    return false;
  for (size_t index = 0; index < a.size(); ++index) {
    if (a[index].protocol != b[index].protocol || a[index].realm != b[index].realm)
      return false;
  }
  return true;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
  static Model model;
  if (size == 0)
    return 0;
  unsigned int const choice = data[0];
  bool const useDefault = choice & 1;
  auto const protocol = (choice & 2) ? LS_AuthenticationProtocol::THREE_GPP : LS_AuthenticationProtocol::HTTP;
  String const realm = (choice & 4) ? "r2" : "r1";
  auto const imperative = (choice & 8) ? LS_Imperative::BACKUP : LS_Imperative::AUTHORITATIVE;
  Vector<String> const& names = model.names;
  Vector<CHostPort> const& local = model.localHostPorts;
  LS_CMasterLocationService* const master = model.locationMaster.get();
  LS_CMasterAuthenticationService* const authentication = model.authenticationMaster.get();

  CNameAddr nameAddr;
  nameAddr.Parse(reinterpret_cast<char const*>(data + 1), size - 1);

  String error;
  String user;
  CHostPort host;
  if (LS_splitNameAddr(error, user, host, nameAddr).isFailure())
    check(user.isEmpty() && host == CHostPort());

  RefPtr<LS_IIdentity> identity;
  XCode const found = LS_getIdentity(error, identity, nameAddr, names, useDefault, local, imperative, master);
  check(found.isSuccess() == bool(identity));
  RefPtr<LS_IIdentity> overAll;
  XCode const foundOverAll = LS_getIdentity(error, overAll, nameAddr, useDefault, local, imperative, master);
  check(foundOverAll.isSuccess() == bool(overAll));

  Vector<LS_ProtocolRealm> realms;
  XCode result =
      LS_getInboundAuthenticationChallenge(error, realms, nameAddr, names, useDefault, local, imperative, master,
                                           authentication);
  check(result.isSuccess() == found.isSuccess() && (result.isSuccess() || realms.isEmpty()));
  if (identity) {
    Vector<LS_ProtocolRealm> direct;
    check(LS_getInboundAuthenticationChallenge(error, direct, identity.get(), authentication).isSuccess());
    check(sameRealms(realms, direct));
  }

  Vector<String> passwords;
  result = LS_getInboundAuthenticationResponse(error, passwords, nameAddr, protocol, realm, user, names, useDefault,
                                               local, imperative, master, authentication);
  check(result.isSuccess() || passwords.isEmpty());
  result = LS_getInboundAuthenticationResponse(error, passwords, nameAddr, protocol, realm, user, useDefault, local,
                                               imperative, master, authentication);
  check(result.isSuccess() || passwords.isEmpty());

  String userName;
  String password;
  result = LS_getOutboundAuthenticationCredentials(error, userName, password, nameAddr, protocol, realm, names,
                                                   useDefault, local, imperative, master, authentication);
  check(result.isSuccess() ? !password.isEmpty() : userName.isEmpty() && password.isEmpty());
  result = LS_getOutboundAuthenticationCredentials(error, userName, password, nameAddr, protocol, realm, useDefault,
                                                   local, imperative, master, authentication);
  check(result.isSuccess() ? !password.isEmpty() : userName.isEmpty() && password.isEmpty());
  return 0;
}
