#include "LS_CredentialLookup.h"

#include "LS_IdentityResolution.h"
#include "LS_ServiceResolution.h"
#include "LockedPtr.h"

namespace {

// The user name of a service's fallback credentials.
char const DEFAULT_USER_NAME[] = "DEFAULT";

String effectiveUserName(LS_Authenticate const& entry, LS_IIdentity* identity) {
  if (!entry.userName.isEmpty())
    return entry.userName;
  return LockedPtr<LS_IIdentity>(identity)->getName();
}

bool containsPair(Vector<LS_ProtocolRealm> const& pairs,
                  LS_AuthenticationProtocol::Type protocol,
                  String const& realm) {
  for (LS_ProtocolRealm const& pair : pairs) {
    if (pair.protocol == protocol && pair.realm == realm)
      return true;
  }
  return false;
}

void appendFace(Vector<LS_Authenticate>& out, LS_IIdentity* identity, LS_IdentityFace::Type face) {
  RefPtr<LS_IAuthentication> authentication;
  if (LS_getFaceIf(LockedPtr<LS_IIdentity>(identity).get(), face, authentication).isSuccess())
    LS_getIdentityAuthenticates(out, authentication.get());
}

// How the name-addr forms find their identity: among names, or among all
// location services when names is null.
struct IdentityQuery {
  Vector<String> const* names;
  bool useDefault;
  Vector<CHostPort> const& localHostPorts;
  LS_Imperative::Type imperative;
  LS_IMasterLocationService* master;

  XCode resolve(String& error, RefPtr<LS_IIdentity>& identity, CNameAddr const& nameAddr) const {
    if (names)
      return LS_getIdentity(error, identity, nameAddr, *names, useDefault, localHostPorts, imperative,
                            master);
    return LS_getIdentity(error, identity, nameAddr, useDefault, localHostPorts, imperative, master);
  }
};

XCode challengeForNameAddr(String& error,
                           Vector<LS_ProtocolRealm>& out,
                           CNameAddr const& nameAddr,
                           IdentityQuery const& query,
                           LS_IMasterAuthenticationService* authenticationMaster) {
  RefPtr<LS_IIdentity> identity;
  XCode const result = query.resolve(error, identity, nameAddr);
  if (result.isFailure()) {
    out.clear();
    return result;
  }
  return LS_getInboundAuthenticationChallenge(error, out, identity.get(), authenticationMaster);
}

XCode responseForNameAddr(String& error,
                          Vector<String>& passwords,
                          CNameAddr const& nameAddr,
                          LS_AuthenticationProtocol::Type protocol,
                          String const& realm,
                          String const& userName,
                          IdentityQuery const& query,
                          LS_IMasterAuthenticationService* authenticationMaster) {
  RefPtr<LS_IIdentity> identity;
  XCode const result = query.resolve(error, identity, nameAddr);
  if (result.isFailure()) {
    passwords.clear();
    return result;
  }
  return LS_getInboundAuthenticationResponse(error, passwords, identity.get(), nameAddr, protocol, realm,
                                             userName, authenticationMaster);
}

XCode outboundForNameAddr(String& error,
                          String& userName,
                          String& password,
                          CNameAddr const& nameAddr,
                          LS_AuthenticationProtocol::Type protocol,
                          String const& realm,
                          IdentityQuery const& query,
                          LS_IMasterAuthenticationService* authenticationMaster) {
  RefPtr<LS_IIdentity> identity;
  XCode const result = query.resolve(error, identity, nameAddr);
  if (result.isFailure()) {
    userName = String();
    password = String();
    return result;
  }
  return LS_getOutboundAuthenticationCredentials(error, userName, password, identity.get(), nameAddr,
                                                 protocol, realm, authenticationMaster);
}

}  // namespace

XCode LS_getCredentials(String& error,
                        LS_Credentials& out,
                        String const& authenticationService,
                        String const& userName,
                        LS_IMasterAuthenticationService* master) {
  RefPtr<LS_IAuthenticationService> service;
  XCode const result = LS_getAuthenticationService(error, service, authenticationService, master);
  if (result.isFailure())
    return result;
  String password;
  String heldUnder = userName;
  if (LockedPtr<LS_IAuthenticationService>(service)->getCredentials(heldUnder, password).isFailure()) {
    heldUnder = DEFAULT_USER_NAME;
    if (LockedPtr<LS_IAuthenticationService>(service)->getCredentials(heldUnder, password).isFailure()) {
      error.format("NO CREDENTIALS FOUND FOR USERNAME '%s' or 'default' IN AUTHENTICATION-SERVICE '%s'",
                   userName.c_str(), authenticationService.c_str());
      return XCode::failure();
    }
  }
  out.authenticationService = service;
  out.userName = heldUnder;
  out.password = password;
  return XCode::success();
}

void LS_getIdentityAuthenticates(Vector<LS_Authenticate>& out, LS_IAuthentication* face) {
  if (!face)
    return;
  unsigned int const count = LockedPtr<LS_IAuthentication>(face)->getNumberOfAuthenticates();
  for (unsigned int index = 0; index < count; ++index) {
    LS_Authenticate entry;
    if (LockedPtr<LS_IAuthentication>(face)
            ->getAuthenticate(index, entry.authenticationService, entry.userName)
            .isSuccess())
      out.add(entry);
  }
}

XCode LS_getIdentityAuthenticates(String& error,
                                  Vector<LS_Authenticate>& out,
                                  LS_IIdentity* identity,
                                  LS_AuthenticationType::Type type) {
  if (!identity) {
    error = "INVALID IDENTITY";
    return XCode::failure();
  }
  if (type != LS_AuthenticationType::INBOUND)
    appendFace(out, identity, LS_IdentityFace::AUTHENTICATION_OUTBOUND);
  if (type != LS_AuthenticationType::OUTBOUND)
    appendFace(out, identity, LS_IdentityFace::AUTHENTICATION_INBOUND);
  return XCode::success();
}

XCode LS_getIdentityOutboundAuthenticates(String& error,
                                          Vector<LS_Authenticate>& out,
                                          LS_IIdentity* identity) {
  return LS_getIdentityAuthenticates(error, out, identity, LS_AuthenticationType::OUTBOUND);
}

XCode LS_getInboundAuthenticationChallenge(String& error,
                                           Vector<LS_ProtocolRealm>& out,
                                           LS_IIdentity* identity,
                                           LS_IMasterAuthenticationService* authenticationMaster) {
  out.clear();
  Vector<LS_Authenticate> entries;
  XCode const result = LS_getIdentityAuthenticates(error, entries, identity, LS_AuthenticationType::INBOUND);
  if (result.isFailure())
    return result;
  for (LS_Authenticate const& entry : entries) {
    LS_Credentials credentials;
    if (LS_getCredentials(error, credentials, entry.authenticationService, effectiveUserName(entry, identity),
                          authenticationMaster)
            .isFailure())
      continue;
    LockedPtr<LS_IAuthenticationService> const service(credentials.authenticationService);
    LS_AuthenticationProtocol::Type const protocol = service->getProtocol();
    unsigned int const count = service->getNumberOfRealms();
    for (unsigned int index = 0; index < count; ++index) {
      LS_ProtocolRealm pair;
      pair.protocol = protocol;
      pair.realm = service->getRealm(index);
      if (!containsPair(out, pair.protocol, pair.realm))
        out.add(pair);
    }
  }
  return XCode::success();
}

XCode LS_getInboundAuthenticationChallenge(String& error,
                                           Vector<LS_ProtocolRealm>& out,
                                           CNameAddr const& nameAddr,
                                           bool useDefault,
                                           Vector<CHostPort> const& localHostPorts,
                                           LS_Imperative::Type imperative,
                                           LS_IMasterLocationService* master,
                                           LS_IMasterAuthenticationService* authenticationMaster) {
  return challengeForNameAddr(error, out, nameAddr, {nullptr, useDefault, localHostPorts, imperative, master},
                              authenticationMaster);
}

XCode LS_getInboundAuthenticationChallenge(String& error,
                                           Vector<LS_ProtocolRealm>& out,
                                           CNameAddr const& nameAddr,
                                           Vector<String> const& names,
                                           bool useDefault,
                                           Vector<CHostPort> const& localHostPorts,
                                           LS_Imperative::Type imperative,
                                           LS_IMasterLocationService* master,
                                           LS_IMasterAuthenticationService* authenticationMaster) {
  return challengeForNameAddr(error, out, nameAddr, {&names, useDefault, localHostPorts, imperative, master},
                              authenticationMaster);
}

XCode LS_getInboundAuthenticationResponse(String& error,
                                          Vector<String>& passwords,
                                          LS_IIdentity* identity,
                                          CNameAddr const& nameAddr,
                                          LS_AuthenticationProtocol::Type protocol,
                                          String const& realm,
                                          String const& userName,
                                          LS_IMasterAuthenticationService* authenticationMaster) {
  passwords.clear();
  String uriUser;
  CHostPort host;
  XCode result = LS_splitNameAddr(error, uriUser, host, nameAddr);
  if (result.isFailure())
    return result;
  Vector<LS_Authenticate> entries;
  result = LS_getIdentityAuthenticates(error, entries, identity, LS_AuthenticationType::INBOUND);
  if (result.isFailure())
    return result;
  for (LS_Authenticate const& entry : entries) {
    LS_Credentials credentials;
    if (LS_getCredentials(error, credentials, entry.authenticationService, effectiveUserName(entry, identity),
                          authenticationMaster)
            .isFailure())
      continue;
    bool exact = false;
    if (!LockedPtr<LS_IAuthenticationService>(credentials.authenticationService)
             ->isResponsible(protocol, realm, exact))
      continue;
    bool const claimed = credentials.userName == userName;
    bool const defaultForUriUser = credentials.userName == DEFAULT_USER_NAME && userName == uriUser;
    if (claimed || defaultForUriUser)
      passwords.add(credentials.password);
  }
  return XCode::success();
}

XCode LS_getInboundAuthenticationResponse(String& error,
                                          Vector<String>& passwords,
                                          CNameAddr const& nameAddr,
                                          LS_AuthenticationProtocol::Type protocol,
                                          String const& realm,
                                          String const& userName,
                                          bool useDefault,
                                          Vector<CHostPort> const& localHostPorts,
                                          LS_Imperative::Type imperative,
                                          LS_IMasterLocationService* master,
                                          LS_IMasterAuthenticationService* authenticationMaster) {
  return responseForNameAddr(error, passwords, nameAddr, protocol, realm, userName,
                             {nullptr, useDefault, localHostPorts, imperative, master}, authenticationMaster);
}

XCode LS_getInboundAuthenticationResponse(String& error,
                                          Vector<String>& passwords,
                                          CNameAddr const& nameAddr,
                                          LS_AuthenticationProtocol::Type protocol,
                                          String const& realm,
                                          String const& userName,
                                          Vector<String> const& names,
                                          bool useDefault,
                                          Vector<CHostPort> const& localHostPorts,
                                          LS_Imperative::Type imperative,
                                          LS_IMasterLocationService* master,
                                          LS_IMasterAuthenticationService* authenticationMaster) {
  return responseForNameAddr(error, passwords, nameAddr, protocol, realm, userName,
                             {&names, useDefault, localHostPorts, imperative, master}, authenticationMaster);
}

XCode LS_getOutboundAuthenticationCredentials(String& error,
                                              String& userName,
                                              String& password,
                                              LS_IIdentity* identity,
                                              CNameAddr const& nameAddr,
                                              LS_AuthenticationProtocol::Type protocol,
                                              String const& realm,
                                              LS_IMasterAuthenticationService* authenticationMaster) {
  // The answer is built here and handed out once, so that every failure
  // leaves both outputs empty.
  String foundUser;
  String foundPassword;
  bool found = false;
  Vector<LS_Authenticate> entries;
  XCode result = LS_getIdentityAuthenticates(error, entries, identity, LS_AuthenticationType::OUTBOUND);
  for (size_t index = 0; result.isSuccess() && index < entries.size(); ++index) {
    LS_Authenticate const& entry = entries[index];
    LS_Credentials credentials;
    if (LS_getCredentials(error, credentials, entry.authenticationService, effectiveUserName(entry, identity),
                          authenticationMaster)
            .isFailure())
      continue;
    bool exact = false;
    if (!LockedPtr<LS_IAuthenticationService>(credentials.authenticationService)
             ->isResponsible(protocol, realm, exact))
      continue;
    if (found && !exact)
      continue;
    foundUser = credentials.userName;
    foundPassword = credentials.password;
    found = true;
    if (foundUser == DEFAULT_USER_NAME) {
      CHostPort host;
      result = LS_splitNameAddr(error, foundUser, host, nameAddr);
    }
    if (exact)
      break;
  }
  if (result.isSuccess() && !found) {
    error.format("NO CREDENTIALS ON IDENTITY '%s' FOR PROTOCOL '%s', AND REALM '%s'",
                 LockedPtr<LS_IIdentity>(identity)->getName().c_str(),
                 LS_AuthenticationProtocol::NAME(protocol), realm.c_str());
    result = XCode::failure();
  }
  if (result.isFailure()) {
    userName = String();
    password = String();
    return result;
  }
  userName = foundUser;
  password = foundPassword;
  return result;
}

XCode LS_getOutboundAuthenticationCredentials(String& error,
                                              String& userName,
                                              String& password,
                                              CNameAddr const& nameAddr,
                                              LS_AuthenticationProtocol::Type protocol,
                                              String const& realm,
                                              bool useDefault,
                                              Vector<CHostPort> const& localHostPorts,
                                              LS_Imperative::Type imperative,
                                              LS_IMasterLocationService* master,
                                              LS_IMasterAuthenticationService* authenticationMaster) {
  return outboundForNameAddr(error, userName, password, nameAddr, protocol, realm,
                             {nullptr, useDefault, localHostPorts, imperative, master}, authenticationMaster);
}

XCode LS_getOutboundAuthenticationCredentials(String& error,
                                              String& userName,
                                              String& password,
                                              CNameAddr const& nameAddr,
                                              LS_AuthenticationProtocol::Type protocol,
                                              String const& realm,
                                              Vector<String> const& names,
                                              bool useDefault,
                                              Vector<CHostPort> const& localHostPorts,
                                              LS_Imperative::Type imperative,
                                              LS_IMasterLocationService* master,
                                              LS_IMasterAuthenticationService* authenticationMaster) {
  return outboundForNameAddr(error, userName, password, nameAddr, protocol, realm,
                             {&names, useDefault, localHostPorts, imperative, master}, authenticationMaster);
}
