#include "LS_IdentityResolution.h"

#include "LS_AddressText.h"
#include "LS_CLocationService.h"
#include "LS_ServiceResolution.h"
#include "LockedPtr.h"
#include "StringTokenizer.h"

namespace {

char const* const UNKNOWN_URI = "CANNOT PROCESS UNKNOWN URI; MUST BE A SIP, SIPS OR TEL URI";

// The master to use: the one given, else the registered one.
XCode resolveMaster(String& error, LS_IMasterLocationService* given, RefPtr<LS_IMasterLocationService>& master) {
  master = given;
  return given ? XCode::success() : LS_getMasterLocationService(error, master);
}

String firstUserToken(CString const& userPart) {
  StringTokenizer tokens(String(userPart.c_str(), userPart.length()), ";");
  return tokens.nextToken();
}

bool isLocalHostName(CHostPort const& host, Vector<CHostPort> const& localHostPorts) {
  for (CHostPort const& local : localHostPorts) {
    if (host.GetHost().equalsIgnoringCase(local.GetHost()))
      return true;
  }
  return false;
}

// The identity named user when it is a plain identity.
RefPtr<LS_IIdentity> directIdentity(LS_ILocationService* service, String const& user) {
  RefPtr<LS_IIdentity> identity;
  if (LS_getIdentityIf(service, user, identity).isFailure())
    return nullptr;
  if (LockedPtr<LS_IIdentity>(identity)->getIdentityType() != LS_IdentityType::IDENTITY)
    return nullptr;
  return identity;
}

// Asks every identity in turn: the answer for a service that keeps no alias
// index (one reached through a proxy, say), and the reference the index is
// tested against.
RefPtr<LS_IIdentity> firstResponsibleByScan(LS_ILocationService* service, String const& user) {
  Vector<String> names;
  LockedPtr<LS_ILocationService>(service)->getIdentities(names);
  for (String const& name : names) {
    RefPtr<LS_IIdentity> identity;
    if (LS_getIdentityIf(service, name, identity).isFailure())
      continue;
    // The identity stays locked across both questions; a real lock must be
    // re-entrant for the second one.
    LockedPtr<LS_IIdentity> const locked(identity);
    if (locked->isResponsible(user) &&
        LockedPtr<LS_IIdentity>(identity)->getIdentityType() == LS_IdentityType::IDENTITY)
      return identity;
  }
  return nullptr;
}

RefPtr<LS_IIdentity> firstResponsibleIdentity(LS_ILocationService* service, String const& user) {
  if (auto* const indexed = dynamic_cast<LS_CLocationService*>(service))
    return LockedPtr<LS_CLocationService>(indexed)->getFirstResponsibleIdentity(user);
  return firstResponsibleByScan(service, user);
}

RefPtr<LS_IIdentity> defaultGroup(LS_ILocationService* service) {
  RefPtr<LS_IIdentity> identity;
  if (LS_getIdentityIf(service, "DEFAULT", identity).isFailure())
    return nullptr;
  if (LockedPtr<LS_IIdentity>(identity)->getIdentityType() != LS_IdentityType::IDENTITY_GROUP)
    return nullptr;
  return identity;
}

// Pass 1: the first service responsible exactly, else the last one
// responsible partially, else null.
RefPtr<LS_ILocationService> responsibleService(String& error,
                                               LS_IMasterLocationService* master,
                                               CHostPort const& host,
                                               Vector<String> const& names,
                                               LS_Imperative::Type imperative) {
  Vector<CHostPort> const noLocalHostPorts;
  RefPtr<LS_ILocationService> partial;
  for (String const& name : names) {
    RefPtr<LS_ILocationService> service;
    if (LS_getLocationService(error, service, name, master).isFailure())
      continue;
    bool exact = false;
    if (!LockedPtr<LS_ILocationService>(service)->isResponsible(host, noLocalHostPorts, imperative, exact))
      continue;
    if (exact)
      return service;
    partial = service;
  }
  return partial;
}

// Passes 2 and 3: the identity of user in the first service of names that
// has it, among the default-domain services only when onlyDefaultDomain.
XCode identityInFirstService(String& error,
                             LS_IMasterLocationService* master,
                             String const& user,
                             Vector<String> const& names,
                             bool onlyDefaultDomain,
                             bool useDefault,
                             RefPtr<LS_IIdentity>& out) {
  for (String const& name : names) {
    RefPtr<LS_ILocationService> service;
    if (LS_getLocationService(error, service, name, master).isFailure())
      continue;
    if (onlyDefaultDomain && !LockedPtr<LS_ILocationService>(service)->getDefaultDomain())
      continue;
    if (LS_getIdentityOrAliasIf(service, user, useDefault, out).isSuccess())
      return XCode::success();
  }
  return XCode::failure();
}

}  // namespace

XCode LS_splitNameAddr(String& error, String& user, CHostPort& host, CNameAddr const& nameAddr) {
  user = String();
  host = LS_emptyHostPort();
  if (nameAddr.GetUriKind() == CNameAddr::URI_NONE)
    return XCode::failure();
  if (CSipUri const* const sip = nameAddr.GetSipUri()) {
    user = firstUserToken(sip->GetUser());
    host = sip->GetHostPort();
    return XCode::success();
  }
  if (CTelUri const* const tel = nameAddr.GetTelUri()) {
    CString const& number = tel->GetNumber();
    user = String(number.c_str(), number.length());
    if (CString const* const context = tel->GetPhoneContext())
      host = *context;
    return XCode::success();
  }
  error = UNKNOWN_URI;
  return XCode::failure();
}

XCode LS_getIdentityOrAliasIf(RefPtr<LS_ILocationService> locationService,
                              String const& user,
                              bool useDefault,
                              RefPtr<LS_IIdentity>& out) {
  if (!locationService)
    return XCode::failure();
  RefPtr<LS_IIdentity> found = directIdentity(locationService.get(), user);
  if (!found)
    found = firstResponsibleIdentity(locationService.get(), user);
  if (!found && useDefault)
    found = defaultGroup(locationService.get());
  if (!found)
    return XCode::failure();
  out = found;
  return XCode::success();
}

XCode LS_getIdentity(String& error,
                     RefPtr<LS_IIdentity>& out,
                     CNameAddr const& nameAddr,
                     Vector<String> const& names,
                     bool useDefault,
                     Vector<CHostPort> const& localHostPorts,
                     LS_Imperative::Type imperative,
                     LS_IMasterLocationService* master) {
  String user;
  CHostPort host;
  XCode result = LS_splitNameAddr(error, user, host, nameAddr);
  if (result.isFailure())
    return result;
  if (host.GetHost().equalsIgnoringCase("local-host")) {
    if (localHostPorts.isEmpty()) {
      error = "NO LOCAL DOMAINS";
      return XCode::failure();
    }
    host = localHostPorts[0];
  }
  RefPtr<LS_IMasterLocationService> resolved;
  result = resolveMaster(error, master, resolved);
  if (result.isFailure())
    return result;

  // The identity goes to out only on success, whatever out held before.
  RefPtr<LS_IIdentity> found;
  RefPtr<LS_ILocationService> const chosen = responsibleService(error, resolved.get(), host, names, imperative);
  if (chosen) {
    result = LS_getIdentityOrAliasIf(chosen, user, useDefault, found);
    if (result.isSuccess())
      out = found;
    return result;
  }
  result = identityInFirstService(error, resolved.get(), user, names, true, useDefault, found);
  if (result.isFailure()) {
    if (!isLocalHostName(host, localHostPorts))
      return XCode::failure();
    result = identityInFirstService(error, resolved.get(), user, names, false, useDefault, found);
  }
  if (result.isSuccess())
    out = found;
  return result;
}

XCode LS_getIdentity(String& error,
                     RefPtr<LS_IIdentity>& out,
                     CNameAddr const& nameAddr,
                     bool useDefault,
                     Vector<CHostPort> const& localHostPorts,
                     LS_Imperative::Type imperative,
                     LS_IMasterLocationService* master) {
  RefPtr<LS_IMasterLocationService> resolved;
  XCode const result = resolveMaster(error, master, resolved);
  if (result.isFailure())
    return result;
  Vector<String> names;
  LockedPtr<LS_IMasterLocationService>(resolved)->getLocationServices(names);
  return LS_getIdentity(error, out, nameAddr, names, useDefault, localHostPorts, imperative, resolved.get());
}

XCode LS_getFristPlainDomanin(CHostPort& out, LS_IIdentity* identity) {
  if (!identity)
    return XCode::failure();
  RefPtr<LS_ILocationService> service;
  XCode const result = adoptInterface(service, [identity](UUID const& iid, void** raw) {
    return LockedPtr<LS_IIdentity>(identity)->getLocationServiceIf(iid, raw);
  });
  if (result.isFailure())
    return result;
  unsigned int const count = LockedPtr<LS_ILocationService>(service)->getNumberOfDomains();
  for (unsigned int index = 0; index < count; ++index) {
    CHostPort const domain = LockedPtr<LS_ILocationService>(service)->getDomain(index);
    CString const& host = domain.GetHost();
    if (host.isEmpty() || String(host.c_str(), host.length()).indexOf('*') >= 0)
      continue;
    out = domain;
    return XCode::success();
  }
  return XCode::failure();
}
