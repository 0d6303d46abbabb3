// Shared setup of the identity and credential lookup tests: both masters,
// location services with domains and identities, authentication services
// with realms and credentials, and the text forms the tables compare. The
// masters are declared first so that they go last, cutting every
// identity's link back to its service.
#pragma once

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>

#include "CNameAddr.h"
#include "LS_CMasterAuthenticationService.h"
#include "LS_CMasterLocationService.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_IIdentity.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationServiceConfig.h"

inline CHostPort hostPort(char const* text) {
  CHostPort parsed;
  parsed = CString(text);
  return parsed;
}

inline CNameAddr nameAddr(char const* text) {
  CNameAddr parsed;
  EXPECT_TRUE(parsed.Parse(text, std::string(text).size())) << text;
  return parsed;
}

inline Vector<String> namesOf(std::initializer_list<char const*> texts) {
  Vector<String> names;
  for (char const* text : texts)
    names.add(text);
  return names;
}

inline Vector<CHostPort> hostPortsOf(std::initializer_list<char const*> texts) {
  Vector<CHostPort> hostPorts;
  for (char const* text : texts)
    hostPorts.add(hostPort(text));
  return hostPorts;
}

// "service/identity", or "-" for null.
inline std::string whereIs(RefPtr<LS_IIdentity> const& identity) {
  if (!identity)
    return "-";
  RefPtr<LS_ILocationService> service;
  adoptInterface(service, [&](UUID const& iid, void** raw) { return identity->getLocationServiceIf(iid, raw); });
  return (service ? service->getName().str() : "?") + "/" + identity->getName().str();
}

class LookupTest : public ::testing::Test {
 protected:
  RefPtr<LS_ILocationServiceConfig> locationService(char const* name) {
    RefPtr<LS_ILocationServiceConfig> created;
    adoptInterface(created,
                   [&](UUID const& iid, void** raw) { return locationMaster->createLocationServiceIf(name, iid, raw); });
    return created;
  }
  RefPtr<LS_ILocationService> runtimeService(char const* name) {
    RefPtr<LS_ILocationService> found;
    LS_getLocationServiceIf(locationMaster.get(), name, found);
    return found;
  }
  RefPtr<LS_IIdentityConfig> identity(char const* service,
                                      char const* name,
                                      LS_IdentityType::Type type = LS_IdentityType::IDENTITY,
                                      char const* base = "") {
    RefPtr<LS_ILocationServiceConfig> const owner = locationService(service);
    RefPtr<LS_IIdentityConfig> created;
    EXPECT_TRUE(adoptInterface(created, [&](UUID const& iid, void** raw) {
                  return owner->createConfigIdentityIf(name, base, type, iid, raw);
                }).isSuccess())
        << name;
    return created;
  }
  RefPtr<LS_IAuthenticationService> authenticationService(char const* name,
                                                          LS_AuthenticationProtocol::Type protocol,
                                                          std::initializer_list<char const*> realms) {
    RefPtr<LS_IAuthenticationService> created;
    adoptInterface(created, [&](UUID const& iid, void** raw) {
      return authenticationMaster->createAuthenticationServiceIf(name, iid, raw);
    });
    created->setProtocol(protocol);
    for (char const* realm : realms)
      created->insertRealm(created->getNumberOfRealms(), realm);
    return created;
  }
  // Replaces the identity's own entries of that face.
  static void setEntries(LS_IIdentityConfig* identity,
                         LS_IdentityFace::Type face,
                         std::initializer_list<std::pair<char const*, char const*>> entries) {
    RefPtr<LS_IAuthenticationConfig> config;
    adoptInterface(config, [&](UUID const& iid, void** raw) { return identity->createConfigFaceIf(face, iid, raw); });
    config->clearConfigAuthenticates();
    for (auto const& entry : entries) {
      unsigned int count = 0;
      config->getNumberOfConfigAuthenticates(count);
      config->insertConfigAuthenticate(count, entry.first, entry.second);
    }
  }

  RefPtr<LS_CMasterLocationService> locationMaster = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_CMasterAuthenticationService> authenticationMaster = adoptRef(new LS_CMasterAuthenticationService);
  String error{"untouched"};
};
