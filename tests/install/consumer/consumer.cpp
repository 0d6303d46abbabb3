// What a gateway host does first with an installed library: build both
// masters, configure a location service with an identity, and resolve a
// name-addr to it. Exits 0 only when the identity is found.
#include <cstdio>
#include <cstring>

#include "LS_CMasterAuthenticationService.h"
#include "LS_CMasterLocationService.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_IdentityResolution.h"

int main() {
  RefPtr<LS_CMasterLocationService> const locationMaster = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_CMasterAuthenticationService> const authenticationMaster = adoptRef(new LS_CMasterAuthenticationService);

  RefPtr<LS_ILocationServiceConfig> service;
  adoptInterface(service, [&](UUID const& iid, void** raw) {
    return locationMaster->createLocationServiceIf("example.com", iid, raw);
  });
  CHostPort domain;
  domain = CString("example.com");
  service->insertConfigDomain(0, domain);
  RefPtr<LS_IIdentityConfig> alice;
  adoptInterface(alice, [&](UUID const& iid, void** raw) {
    return service->createConfigIdentityIf("alice", "", LS_IdentityType::IDENTITY, iid, raw);
  });
  alice->addConfigAliasName("201");

  char const text[] = "<sip:201@example.com>";
  CNameAddr nameAddr;
  if (!nameAddr.Parse(text, std::strlen(text)))
    return 1;
  String error;
  RefPtr<LS_IIdentity> found;
  if (LS_getIdentity(error, found, nameAddr, true, Vector<CHostPort>(), LS_Imperative::FOREIGN, locationMaster.get())
          .isFailure())
    return 1;
  std::printf("%s resolves to %s\n", text, found->getName().c_str());
  return found->getName() == "alice" ? 0 : 1;
}
