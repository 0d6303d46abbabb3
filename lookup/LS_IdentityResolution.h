// The lookups through which the SIP stack finds the identity that a SIP
// name-addr denotes: the user and host of the URI, the identity of a user
// inside one location service (by name, by alias, or through the "DEFAULT"
// identity group), the identity over a list of location services or over all
// of them, and the first plain domain of an identity's location service.
// Choosing a location service for a host alone belongs to the service
// resolution; credentials and challenges to the credential lookup.
//
// As every lookup, they take no lock of their own (each call on an object
// goes through its LockedPtr for that one call), never clear the error
// text, and allocate nothing that outlives the call except the references
// handed back and what a location service's alias index keeps when it
// catches up with the changes made since its previous lookup.
//
// Host texts are compared without regard to ASCII case everywhere here
// ("local-host", the own-host test, the domains), as SIP compares hosts and
// as CHostPort equality already does for the domains: a mixed rule would let
// "GW" pass the domain test and fail the own-host test.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "CNameAddr.h"
#include "LS_IIdentity.h"
#include "LS_ILocationService.h"
#include "LS_IMasterLocationService.h"
#include "LS_Imperative.h"
#include "RefPtr.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

// user and host of a SIP, SIPS or TEL URI; user is emptied and host set to
// the empty host-port first. A SIP or SIPS URI gives the first ";"-separated
// token of its user part and its host-port. The split is the platform
// tokenizer's, which skips empty tokens, so that the stack and the lookups
// cut a user part alike: one that begins with ";" gives the token after it
// (";x=1;y" gives "x=1"), and one made only of ";" gives the empty user. A
// TEL URI gives its number as written and the host-port parsed from its
// "phone-context" value, which stays empty when there is none or when the
// value is no host-port (a global-number context such as "+49"). Without a
// URI: failure, error untouched; any other scheme: failure with
// "CANNOT PROCESS UNKNOWN URI; MUST BE A SIP, SIPS OR TEL URI".
LS_EXPORT XCode LS_splitNameAddr(String& error, String& user, CHostPort& host, CNameAddr const& nameAddr);

// The identity of user inside locationService: the identity of that name,
// else the first identity (configured ones, then dynamic ones) that is
// responsible for user by name or alias, else, when useDefault is set, the
// identity "DEFAULT". A service of this library answers the alias step from
// its alias index; any other implementation of the interface has every
// identity asked in turn. Only identities of type "Identity" answer a user and
// only an "Identity-Group" answers as "DEFAULT". out is written only on
// success; a null service fails.
LS_EXPORT XCode LS_getIdentityOrAliasIf(RefPtr<LS_ILocationService> locationService,
                              String const& user,
                              bool useDefault,
                              RefPtr<LS_IIdentity>& out);

// The identity that nameAddr denotes among the location services names, in
// their order. Host "local-host" stands for the first of localHostPorts
// ("NO LOCAL DOMAINS" without any). Pass 1 asks each service whether it is
// responsible for the host under imperative: the first exact match, else the
// last partial one, decides alone, and a user it lacks is a failure. Pass 2
// tries every default-domain service until one has the user. Pass 3, only
// for a host whose host part is one of localHostPorts' (ports aside), tries
// every service. A name that is no location service is skipped, leaving
// "LOCATION-SERVICE '%s' DOES NOT EXIST" in error. out is written only on
// success.
LS_EXPORT XCode LS_getIdentity(String& error,
                     RefPtr<LS_IIdentity>& out,
                     CNameAddr const& nameAddr,
                     Vector<String> const& names,
                     bool useDefault,
                     Vector<CHostPort> const& localHostPorts,
                     LS_Imperative::Type imperative,
                     LS_IMasterLocationService* master);
// The same over all location services of the master, in creation order.
LS_EXPORT XCode LS_getIdentity(String& error,
                     RefPtr<LS_IIdentity>& out,
                     CNameAddr const& nameAddr,
                     bool useDefault,
                     Vector<CHostPort> const& localHostPorts,
                     LS_Imperative::Type imperative,
                     LS_IMasterLocationService* master);

// The first domain of the identity's location service whose host is neither
// empty nor contains "*" anywhere, port included. Fails, leaving out alone,
// for a null identity, one without location service, or when no domain
// qualifies. The exported name is spelled as the SIP stack links to it.
LS_EXPORT XCode LS_getFristPlainDomanin(CHostPort& out, LS_IIdentity* identity);
