// The lookups through which the SIP stack authenticates in both directions:
// the credentials of a user in an authentication service, an identity's
// authentication entries, and the three questions: with which (protocol,
// realm) pairs to challenge a request for an identity, against which
// passwords to check a peer's response, and which user name and password to
// answer a peer's challenge with. Each question comes for an identity
// already found, for a name-addr resolved over all location services, and
// for one resolved over a list of them. Finding the identity belongs to the
// identity resolution, the entries and credentials themselves to the
// authentication face and services.
//
// An entry authenticates as its user name, or as the identity's name when
// that is empty, and falls back to the service's "DEFAULT" credentials. A
// null master of either kind is found through the driver repository. The
// functions take no lock of their own, never clear the error text, and on
// failure leave the question's outputs empty.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "CNameAddr.h"
#include "LS_Authenticate.h"
#include "LS_AuthenticationProtocol.h"
#include "LS_AuthenticationType.h"
#include "LS_Credentials.h"
#include "LS_IAuthentication.h"
#include "LS_IIdentity.h"
#include "LS_IMasterAuthenticationService.h"
#include "LS_IMasterLocationService.h"
#include "LS_Imperative.h"
#include "LS_ProtocolRealm.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

// The credentials of userName in the service, else its "DEFAULT" ones (then
// out.userName is "DEFAULT"). out is written only on success, so a failed
// lookup does not leave a service in it without a password.
LS_EXPORT XCode LS_getCredentials(String& error,
                        LS_Credentials& out,
                        String const& authenticationService,
                        String const& userName,
                        LS_IMasterAuthenticationService* master);

// Appends the face's readable entries, base entries first; a null face
// appends nothing.
LS_EXPORT void LS_getIdentityAuthenticates(Vector<LS_Authenticate>& out, LS_IAuthentication* face);
// Appends the identity's outbound entries (type 0), inbound entries (type 1)
// or, for any other value, both in that order. An identity without such a
// face, own or inherited, appends nothing and succeeds.
LS_EXPORT XCode LS_getIdentityAuthenticates(String& error,
                                  Vector<LS_Authenticate>& out,
                                  LS_IIdentity* identity,
                                  LS_AuthenticationType::Type type);
LS_EXPORT XCode LS_getIdentityOutboundAuthenticates(String& error, Vector<LS_Authenticate>& out, LS_IIdentity* identity);

// The realms of the services that the inbound entries resolve to, each
// with its service's protocol, in entry and realm order, without repeating
// a pair. Entries that resolve to nothing are skipped (their message stays
// in error) and the result is still success.
LS_EXPORT XCode LS_getInboundAuthenticationChallenge(String& error,
                                           Vector<LS_ProtocolRealm>& out,
                                           LS_IIdentity* identity,
                                           LS_IMasterAuthenticationService* authenticationMaster);
LS_EXPORT XCode LS_getInboundAuthenticationChallenge(String& error,
                                           Vector<LS_ProtocolRealm>& out,
                                           CNameAddr const& nameAddr,
                                           bool useDefault,
                                           Vector<CHostPort> const& localHostPorts,
                                           LS_Imperative::Type imperative,
                                           LS_IMasterLocationService* master,
                                           LS_IMasterAuthenticationService* authenticationMaster);
LS_EXPORT XCode LS_getInboundAuthenticationChallenge(String& error,
                                           Vector<LS_ProtocolRealm>& out,
                                           CNameAddr const& nameAddr,
                                           Vector<String> const& names,
                                           bool useDefault,
                                           Vector<CHostPort> const& localHostPorts,
                                           LS_Imperative::Type imperative,
                                           LS_IMasterLocationService* master,
                                           LS_IMasterAuthenticationService* authenticationMaster);

// The passwords of the inbound entries whose service answers (protocol,
// realm): those held under userName, and "DEFAULT" ones when userName is
// the user of nameAddr's URI. Duplicates stay. Finding none is success.
LS_EXPORT XCode LS_getInboundAuthenticationResponse(String& error,
                                          Vector<String>& passwords,
                                          LS_IIdentity* identity,
                                          CNameAddr const& nameAddr,
                                          LS_AuthenticationProtocol::Type protocol,
                                          String const& realm,
                                          String const& userName,
                                          LS_IMasterAuthenticationService* authenticationMaster);
LS_EXPORT XCode LS_getInboundAuthenticationResponse(String& error,
                                          Vector<String>& passwords,
                                          CNameAddr const& nameAddr,
                                          LS_AuthenticationProtocol::Type protocol,
                                          String const& realm,
                                          String const& userName,
                                          bool useDefault,
                                          Vector<CHostPort> const& localHostPorts,
                                          LS_Imperative::Type imperative,
                                          LS_IMasterLocationService* master,
                                          LS_IMasterAuthenticationService* authenticationMaster);
LS_EXPORT XCode LS_getInboundAuthenticationResponse(String& error,
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
                                          LS_IMasterAuthenticationService* authenticationMaster);

// The user name and password of the first outbound entry whose service
// answers (protocol, realm), unless a later entry's service lists the realm
// itself: such an exact match wins and ends the search. Credentials held
// under "DEFAULT" present the user of nameAddr's URI as user name.
LS_EXPORT XCode LS_getOutboundAuthenticationCredentials(String& error,
                                              String& userName,
                                              String& password,
                                              LS_IIdentity* identity,
                                              CNameAddr const& nameAddr,
                                              LS_AuthenticationProtocol::Type protocol,
                                              String const& realm,
                                              LS_IMasterAuthenticationService* authenticationMaster);
LS_EXPORT XCode LS_getOutboundAuthenticationCredentials(String& error,
                                              String& userName,
                                              String& password,
                                              CNameAddr const& nameAddr,
                                              LS_AuthenticationProtocol::Type protocol,
                                              String const& realm,
                                              bool useDefault,
                                              Vector<CHostPort> const& localHostPorts,
                                              LS_Imperative::Type imperative,
                                              LS_IMasterLocationService* master,
                                              LS_IMasterAuthenticationService* authenticationMaster);
LS_EXPORT XCode LS_getOutboundAuthenticationCredentials(String& error,
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
                                              LS_IMasterAuthenticationService* authenticationMaster);
