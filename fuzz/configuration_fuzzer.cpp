// Reads its input as a sequence of operations that a configuration layer and
// a SIP stack could make through the public interfaces: location services,
// identities (configured and dynamic, of both types), faces and
// authentication services are created, edited and removed; bases are set and
// cleared, also to removed identities and to identities of another service;
// contacts are registered and dropped; the five questions are asked; and
// references are kept and dropped at random, as callers do. After every
// step, what must always hold is checked:
// - each location service within reach answers every user of a pool from
//   its alias index as asking every identity in turn does;
// - the process-wide count of registered contacts is the sum of the dynamic
//   contacts that the living inbound-registration faces hold themselves.
// At the end everything is released: the count is back where it started,
// and LeakSanitizer must find nothing left.
//
// Input: each step is one byte choosing the operation from the table,
// followed by the bytes its operands take; an input that runs out reads
// zeros, so every prefix of an input is a valid one.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstdio>
#include <set>
#include <string>
#include <vector>

#include "CNameAddr.h"
#include "LS_CMasterAuthenticationService.h"
#include "LS_CMasterLocationService.h"
#include "LS_CRegistrationInbound.h"
#include "LS_CredentialLookup.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_ICallConfig.h"
#include "LS_IContainer.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_IMwiSubscription.h"
#include "LS_IOutbound.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutbound.h"
#include "LS_IdentityResolution.h"
#include "LS_ServiceResolution.h"
#include "support/ScanOnlyService.h"

namespace {

void check(bool condition) {
  if (!condition)
    std::abort();
}

// Small pools, so that names collide: identity names that are also users,
// "DEFAULT", ranges whose ends share prefixes with other users.
char const* const SERVICES[] = {"s0", "s1", "s2"};
char const* const IDENTITIES[] = {"a", "b", "c", "DEFAULT", "150", "x1"};
char const* const USERS[] = {"", "1", "10", "100", "1000", "10a", "150", "199", "2", "a", "ab", "abc", "b",
                             "x", "x1", "x12", "DEFAULT"};
char const* const EXPRESSIONS[] = {"1[0-9]*", "a|1", "(?i)A.*", "x?1", "10+", "[ab]1", ".*", "abc", "x1.*", "", "("};
char const* const HOSTS[] = {"example.com", "example.com:5060", "*.example.com", "other.org", "gw:5060"};
char const* const AUTHENTICATION_SERVICES[] = {"h", "g", "DEFAULT"};
char const* const REALMS[] = {"r1", "r2", ""};
char const* const CONTACTS[] = {"sip:u@10.0.0.9", "sip:v@host", "<sip:w@h:5070>"};
char const* const CALL_IDS[] = {"", "c1", "c2"};

// The one place that turns input bytes into choices.
class Decoder {
 public:
  Decoder(uint8_t const* data, size_t size) : m_data(data), m_size(size) {}

  bool atEnd() const { return m_next >= m_size; }
  unsigned int byte() { return atEnd() ? 0 : m_data[m_next++]; }
  size_t below(size_t bound) { return byte() % bound; }
  bool flag() { return byte() & 1; }
  template <size_t N>
  char const* pick(char const* const (&pool)[N]) {
    return pool[below(N)];
  }

 private:
  uint8_t const* const m_data;
  size_t const m_size;
  size_t m_next = 0;
};

CHostPort hostPort(char const* text) {
  CHostPort parsed;
  parsed = CString(text);
  return parsed;
}

CNameAddr nameAddr(char const* text) {
  CNameAddr parsed;
  parsed.Parse(text, std::char_traits<char>::length(text));
  return parsed;
}

template <class T, class Call>
RefPtr<T> handedOut(Call&& call) {
  RefPtr<T> out;
  adoptInterface(out, call);
  return out;
}

template <class T, class From>
RefPtr<T> as(From const& from) {
  RefPtr<T> to;
  if (from)
    from->queryIf(to);
  return to;
}

template <class T>
void insert(std::vector<RefPtr<T>>& list, std::set<T*>& seen, RefPtr<T> const& item) {
  if (item && seen.insert(item.get()).second)
    list.push_back(item);
}

// The model and the references a caller keeps into it, services and
// identities removed since among them. Dropping the world drops every
// reference, the masters' last.
struct World {
  RefPtr<LS_CMasterLocationService> locationMaster = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_CMasterAuthenticationService> authenticationMaster = adoptRef(new LS_CMasterAuthenticationService);
  std::vector<RefPtr<LS_ILocationServiceConfig>> services;
  std::vector<RefPtr<LS_IIdentityConfig>> identities;
  std::vector<RefPtr<LS_IElement>> faces;
  std::vector<RefPtr<LS_IAuthenticationService>> authenticationServices;

  template <class T>
  static void keep(Decoder& in, std::vector<RefPtr<T>>& list, RefPtr<T> const& item) {
    if (item && in.flag())
      list.push_back(item);
  }
  // One of list, when the input chooses a kept reference; else null.
  template <class T>
  static RefPtr<T> kept(Decoder& in, std::vector<RefPtr<T>> const& list) {
    size_t const choice = in.byte();
    if (list.empty() || choice % 2 == 0)
      return nullptr;
    return list[(choice / 2) % list.size()];
  }

  RefPtr<LS_ILocationServiceConfig> service(Decoder& in) {
    if (RefPtr<LS_ILocationServiceConfig> held = kept(in, services))
      return held;
    char const* const name = in.pick(SERVICES);
    return handedOut<LS_ILocationServiceConfig>(
        [&](UUID const& iid, void** out) { return locationMaster->getLocationServiceIf(name, iid, out); });
  }
  RefPtr<LS_IIdentityConfig> identity(Decoder& in) {
    if (RefPtr<LS_IIdentityConfig> held = kept(in, identities))
      return held;
    RefPtr<LS_ILocationService> const owner = as<LS_ILocationService>(service(in));
    char const* const name = in.pick(IDENTITIES);
    return owner ? handedOut<LS_IIdentityConfig>(
                       [&](UUID const& iid, void** out) { return owner->getIdentityIf(name, iid, out); })
                 : nullptr;
  }
  // A kept face, else the own or inherited face of one kind of an identity.
  RefPtr<LS_IElement> face(Decoder& in) {
    if (RefPtr<LS_IElement> held = kept(in, faces))
      return held;
    RefPtr<LS_IIdentity> const owner = as<LS_IIdentity>(identity(in));
    auto const kind = static_cast<LS_IdentityFace::Type>(in.below(7));
    return owner ? handedOut<LS_IElement>(
                       [&](UUID const& iid, void** out) { return owner->getFaceIf(kind, iid, out); })
                 : nullptr;
  }
  RefPtr<LS_IAuthenticationService> authenticationService(Decoder& in) {
    if (RefPtr<LS_IAuthenticationService> held = kept(in, authenticationServices))
      return held;
    char const* const name = in.pick(AUTHENTICATION_SERVICES);
    return handedOut<LS_IAuthenticationService>([&](UUID const& iid, void** out) {
      return authenticationMaster->getAuthenticationServiceIf(name, iid, out);
    });
  }

  // The master's services, then the kept ones.
  std::vector<RefPtr<LS_ILocationService>> servicesWithinReach() const {
    std::vector<RefPtr<LS_ILocationService>> reached;
    std::set<LS_ILocationService*> seen;
    Vector<String> names;
    locationMaster->getLocationServices(names);
    for (String const& name : names) {
      insert(reached, seen, handedOut<LS_ILocationService>([&](UUID const& iid, void** out) {
               return locationMaster->getLocationServiceIf(name, iid, out);
             }));
    }
    for (RefPtr<LS_ILocationServiceConfig> const& held : services)
      insert(reached, seen, as<LS_ILocationService>(held));
    return reached;
  }

  // Every identity listed by a service within reach or kept, and every
  // base of those, up the chain.
  std::vector<RefPtr<LS_IIdentityConfig>> identitiesWithinReach() const {
    std::vector<RefPtr<LS_IIdentityConfig>> reached;
    std::set<LS_IIdentityConfig*> seen;
    for (RefPtr<LS_ILocationService> const& owner : servicesWithinReach()) {
      Vector<String> names;
      owner->getIdentities(names);
      for (String const& name : names)
        insert(reached, seen, handedOut<LS_IIdentityConfig>([&](UUID const& iid, void** out) {
                 return owner->getIdentityIf(name, iid, out);
               }));
    }
    for (RefPtr<LS_IIdentityConfig> const& held : identities)
      insert(reached, seen, held);
    for (size_t next = 0; next < reached.size(); ++next) {
      RefPtr<LS_IIdentityConfig> base;
      reached[next]->getConfigBaseIdentity(base);
      insert(reached, seen, base);
    }
    return reached;
  }

  // Every inbound-registration face of an identity within reach, own or
  // shadow, every kept face, and every base of those: each face that can
  // hold registered contacts.
  std::vector<RefPtr<LS_IElement>> facesWithinReach() const {
    String const key("registration-inbound");
    std::vector<RefPtr<LS_IElement>> reached;
    std::set<LS_IElement*> seen;
    for (RefPtr<LS_IIdentityConfig> const& owner : identitiesWithinReach()) {
      RefPtr<LS_IContainer> const container = as<LS_IContainer>(owner);
      for (LS_Strategy::Type strategy : {LS_Strategy::LOCAL_ONLY, LS_Strategy::BASE_ONLY}) {
        RefPtr<LS_IElement> child;
        if (container->getElement(key, strategy, child).isSuccess())
          insert(reached, seen, child);
      }
    }
    for (RefPtr<LS_IElement> const& held : faces)
      insert(reached, seen, held);
    for (size_t next = 0; next < reached.size(); ++next) {
      RefPtr<LS_IElement> base;
      reached[next]->getBase(base);
      insert(reached, seen, base);
    }
    return reached;
  }
};

void checkAliasIndex(World const& world) {
  for (RefPtr<LS_ILocationService> const& indexed : world.servicesWithinReach()) {
    for (char const* user : USERS) {
      RefPtr<LS_IIdentity> fromIndex;
      RefPtr<LS_IIdentity> fromScan;
      check(answersAsTheScan(indexed, user, false, fromIndex, fromScan));
    }
  }
}

int ownRegisteredContacts(RefPtr<LS_IElement> const& face) {
  RefPtr<LS_IRegistrationInbound> const inbound = as<LS_IRegistrationInbound>(face);
  RefPtr<LS_IRegistrationInboundConfig> const config = as<LS_IRegistrationInboundConfig>(face);
  RefPtr<LS_IContainer> const container = as<LS_IContainer>(face);
  if (!inbound || !config || !container || !container->containsElement("dynamic-contact", LS_Strategy::LOCAL_ONLY))
    return 0;
  return static_cast<int>(inbound->getNumberOfContacts() - config->getNumberOfConfigContacts());
}

void checkContactCount(World const& world, int before) {
  int held = 0;
  for (RefPtr<LS_IElement> const& face : world.facesWithinReach())
    held += ownRegisteredContacts(face);
  check(LS_CRegistrationInbound::getGlobalContacts() - before == held);
}

// The operations. Each reads its operands from the input and does nothing
// where a target it chose does not exist.

void createService(World& world, Decoder& in) {
  char const* const name = in.pick(SERVICES);
  World::keep(in, world.services, handedOut<LS_ILocationServiceConfig>([&](UUID const& iid, void** out) {
                return world.locationMaster->createLocationServiceIf(name, iid, out);
              }));
}

void removeService(World& world, Decoder& in) {
  world.locationMaster->removeLocationService(in.pick(SERVICES));
}

void createIdentity(World& world, Decoder& in) {
  RefPtr<LS_ILocationServiceConfig> const owner = world.service(in);
  char const* const name = in.pick(IDENTITIES);
  bool const dynamic = in.flag();
  char const* const base = in.flag() ? in.pick(IDENTITIES) : "";
  auto const type = in.flag() ? LS_IdentityType::IDENTITY_GROUP : LS_IdentityType::IDENTITY;
  if (!owner)
    return;
  RefPtr<LS_ILocationService> const runtime = as<LS_ILocationService>(owner);
  World::keep(in, world.identities, handedOut<LS_IIdentityConfig>([&](UUID const& iid, void** out) {
                return dynamic ? runtime->createDynamicIdentityIf(name, iid, out)
                               : owner->createConfigIdentityIf(name, base, type, iid, out);
              }));
}

void removeIdentity(World& world, Decoder& in) {
  RefPtr<LS_ILocationServiceConfig> const owner = world.service(in);
  char const* const name = in.pick(IDENTITIES);
  bool const dynamic = in.flag();
  if (!owner)
    return;
  if (dynamic)
    as<LS_ILocationService>(owner)->removeDynamicIdentity(name);
  else
    owner->removeConfigIdentity(name);
}

// Any identity may become the base, a removed one or one of another service
// included; like the location service, the caller refuses a loop.
void setBase(World& world, Decoder& in) {
  RefPtr<LS_IIdentityConfig> const identity = world.identity(in);
  RefPtr<LS_IIdentityConfig> const base = in.flag() ? world.identity(in) : nullptr;
  if (!identity)
    return;
  if (base && base->isNoIdentityConfigLoop(identity.get(), 10).isFailure())
    return;
  identity->setConfigBaseIdentity(base.get());
}

void editAliases(World& world, Decoder& in) {
  RefPtr<LS_IIdentityConfig> const identity = world.identity(in);
  size_t const edit = in.below(8);
  char const* const first = in.pick(USERS);
  char const* const last = in.pick(USERS);
  char const* const expression = in.pick(EXPRESSIONS);
  if (!identity)
    return;
  switch (edit) {
    case 0:
      identity->addConfigAliasName(first);
      return;
    case 1:
      identity->removeConfigAliasName(first);
      return;
    case 2:
      identity->addConfigAliasRange(first, last);
      return;
    case 3:
      identity->removeConfigAliasRange(first, last);
      return;
    case 4:
      identity->addConfigAliasExpression(expression);
      return;
    case 5:
      identity->removeConfigAliasExpression(expression);
      return;
    case 6:
      identity->clearConfigAlias();
      return;
    default:
      identity->destroyConfigAlias();
  }
}

void editIdentity(World& world, Decoder& in) {
  RefPtr<LS_IIdentityConfig> const identity = world.identity(in);
  size_t const edit = in.below(4);
  char const* const name = in.pick(IDENTITIES);
  if (!identity)
    return;
  switch (edit) {
    case 0:
      identity->setConfigName(name);
      return;
    case 1:
      identity->setConfigIdentityType(identity->getConfigIdentityType() == LS_IdentityType::IDENTITY
                                          ? LS_IdentityType::IDENTITY_GROUP
                                          : LS_IdentityType::IDENTITY);
      return;
    case 2:
      identity->setConfigDisplayName(name);
      return;
    default:
      identity->removeConfigDisplayName();
  }
}

void createFace(World& world, Decoder& in) {
  RefPtr<LS_IIdentityConfig> const identity = world.identity(in);
  auto const kind = static_cast<LS_IdentityFace::Type>(in.below(7));
  bool const dynamic = in.flag();
  if (!identity)
    return;
  RefPtr<LS_IIdentity> const runtime = as<LS_IIdentity>(identity);
  World::keep(in, world.faces, handedOut<LS_IElement>([&](UUID const& iid, void** out) {
                return dynamic ? runtime->createDynamicFaceIf(kind, iid, out)
                               : identity->createConfigFaceIf(kind, iid, out);
              }));
}

void removeFace(World& world, Decoder& in) {
  RefPtr<LS_IIdentityConfig> const identity = world.identity(in);
  auto const kind = static_cast<LS_IdentityFace::Type>(in.below(7));
  bool const dynamic = in.flag();
  if (!identity)
    return;
  if (dynamic)
    as<LS_IIdentity>(identity)->removeDynamicFace(kind);
  else
    identity->removeConfigFace(kind);
}

// One setting of whichever face was chosen, where it has that setting.
void editFace(World& world, Decoder& in) {
  RefPtr<LS_IElement> const face = world.face(in);
  size_t const edit = in.below(6);
  char const* const contact = in.pick(CONTACTS);
  char const* const host = in.pick(HOSTS);
  char const* const service = in.pick(AUTHENTICATION_SERVICES);
  char const* const user = in.pick(USERS);
  unsigned int const index = in.byte() % 4;
  bool const set = edit % 2;
  if (RefPtr<LS_IRegistrationInboundConfig> const inbound = as<LS_IRegistrationInboundConfig>(face)) {
    if (edit % 3 == 0)
      inbound->addConfigContact(nameAddr(contact), "ctx", "prov", index);
    else if (edit % 3 == 1)
      inbound->removeConfigContact(nameAddr(contact));
    else
      inbound->setConfigLifetimeRange(index, 3600, 600);
  }
  if (RefPtr<LS_IAuthenticationConfig> const authentication = as<LS_IAuthenticationConfig>(face)) {
    if (edit % 3 == 0)
      authentication->insertConfigAuthenticate(index, service, user);
    else if (edit % 3 == 1)
      authentication->removeConfigAuthenticate(index);
    else
      authentication->destroyConfigAuthenticates();
  }
  if (RefPtr<LS_IOutbound> const outbound = as<LS_IOutbound>(face)) {
    if (set)
      outbound->setDynamicProxy(hostPort(host), false);
    else
      outbound->removeDynamicProxy();
  }
  if (RefPtr<LS_IRegistrationOutbound> const registration = as<LS_IRegistrationOutbound>(face)) {
    if (set)
      registration->setDynamicRegistrar(hostPort(host));
    else
      registration->removeDynamicRegistrar();
  }
  if (RefPtr<LS_IMwiSubscription> const mwi = as<LS_IMwiSubscription>(face)) {
    if (set)
      mwi->setDynamicMwiNotifier(hostPort(host));
    else
      mwi->removeDynamicMwiNotifier();
  }
  if (RefPtr<LS_ICallConfig> const call = as<LS_ICallConfig>(face)) {
    if (set)
      call->setConfigVoipProfile(user);
    else
      call->removeConfigVoipProfile();
  }
}

void registerContact(World& world, Decoder& in) {
  RefPtr<LS_IRegistrationInbound> const face = as<LS_IRegistrationInbound>(world.face(in));
  char const* const callId = in.pick(CALL_IDS);
  char const* const contact = in.pick(CONTACTS);
  unsigned int const expires = in.byte();
  if (face)
    face->addContact(callId, nameAddr(contact), hostPort("10.0.0.9:5060"), "", "", 0, expires);
}

void dropContact(World& world, Decoder& in) {
  RefPtr<LS_IRegistrationInbound> const face = as<LS_IRegistrationInbound>(world.face(in));
  bool const all = in.flag();
  char const* const callId = in.pick(CALL_IDS);
  char const* const contact = in.pick(CONTACTS);
  if (!face)
    return;
  if (all)
    face->removeContacts();
  else
    face->removeContact(nameAddr(contact), callId);
}

void announceRegistration(World& world, Decoder& in) {
  RefPtr<LS_IIdentity> const identity = as<LS_IIdentity>(world.identity(in));
  bool const registered = in.flag();
  if (!identity)
    return;
  if (registered)
    identity->isInboundRegistered();
  else
    identity->isInboundUnregistered();
}

void editService(World& world, Decoder& in) {
  RefPtr<LS_ILocationServiceConfig> const service = world.service(in);
  size_t const edit = in.below(6);
  unsigned int const index = in.byte() % 4;
  char const* const host = in.pick(HOSTS);
  if (!service)
    return;
  switch (edit) {
    case 0:
      service->insertConfigDomain(index, hostPort(host));
      return;
    case 1:
      service->modifyConfigDomain(index, hostPort(host));
      return;
    case 2:
      service->moveConfigDomain(index, static_cast<int>(index) - 2);
      return;
    case 3:
      service->removeConfigDomain(hostPort(host));
      return;
    case 4:
      service->setConfigImperative(static_cast<LS_Imperative::Type>(index % 3));
      return;
    default:
      service->setConfigDefaultDomain(index % 2);
  }
}

void createAuthenticationService(World& world, Decoder& in) {
  char const* const name = in.pick(AUTHENTICATION_SERVICES);
  if (in.flag()) {
    world.authenticationMaster->removeAuthenticationService(name);
    return;
  }
  World::keep(in, world.authenticationServices,
              handedOut<LS_IAuthenticationService>([&](UUID const& iid, void** out) {
                return world.authenticationMaster->createAuthenticationServiceIf(name, iid, out);
              }));
}

void editAuthenticationService(World& world, Decoder& in) {
  RefPtr<LS_IAuthenticationService> const service = world.authenticationService(in);
  size_t const edit = in.below(6);
  unsigned int const index = in.byte() % 3;
  char const* const realm = in.pick(REALMS);
  char const* const user = in.pick(USERS);
  if (!service)
    return;
  switch (edit) {
    case 0:
      service->insertRealm(index, realm);
      return;
    case 1:
      service->removeRealm(realm);
      return;
    case 2:
      service->setCredentials(user, realm);
      return;
    case 3:
      service->removeCredentials(user);
      return;
    case 4:
      service->setProtocol(index % 2 ? LS_AuthenticationProtocol::THREE_GPP : LS_AuthenticationProtocol::HTTP);
      return;
    default:
      service->moveRealm(index, 1);
  }
}

void dropReference(World& world, Decoder& in) {
  size_t const kind = in.below(4);
  size_t const choice = in.byte();
  auto const drop = [choice](auto& list) {
    if (!list.empty())
      list.erase(list.begin() + static_cast<std::ptrdiff_t>(choice % list.size()));
  };
  switch (kind) {
    case 0:
      drop(world.services);
      return;
    case 1:
      drop(world.identities);
      return;
    case 2:
      drop(world.faces);
      return;
    default:
      drop(world.authenticationServices);
  }
}

// The five questions, over every service of the master; each answer keeps
// its contract: a failure leaves its outputs empty.
void ask(World& world, Decoder& in) {
  char const* const user = in.pick(USERS);
  char const* const host = in.pick(HOSTS);
  bool const useDefault = in.flag();
  auto const imperative = static_cast<LS_Imperative::Type>(in.below(3));
  auto const protocol = in.flag() ? LS_AuthenticationProtocol::THREE_GPP : LS_AuthenticationProtocol::HTTP;
  char const* const realm = in.pick(REALMS);
  std::string const text = std::string("sip:") + user + "@" + host;
  CNameAddr const request = nameAddr(text.c_str());
  Vector<CHostPort> local;
  local.add(hostPort("gw:5060"));
  LS_CMasterLocationService* const master = world.locationMaster.get();
  LS_CMasterAuthenticationService* const authentication = world.authenticationMaster.get();
  String error;

  RefPtr<LS_ILocationService> service;
  check(LS_getLocationService(error, service, hostPort(host), local, imperative, master).isSuccess() ==
        bool(service));
  RefPtr<LS_IIdentity> identity;
  check(LS_getIdentity(error, identity, request, useDefault, local, imperative, master).isSuccess() ==
        bool(identity));
  Vector<LS_ProtocolRealm> realms;
  if (LS_getInboundAuthenticationChallenge(error, realms, request, useDefault, local, imperative, master,
                                           authentication)
          .isFailure())
    check(realms.isEmpty());
  Vector<String> passwords;
  if (LS_getInboundAuthenticationResponse(error, passwords, request, protocol, realm, user, useDefault, local,
                                          imperative, master, authentication)
          .isFailure())
    check(passwords.isEmpty());
  String userName;
  String password;
  if (LS_getOutboundAuthenticationCredentials(error, userName, password, request, protocol, realm, useDefault,
                                              local, imperative, master, authentication)
          .isFailure())
    check(userName.isEmpty() && password.isEmpty());
}

struct Operation {
  char const* name;  // printed for each step when CONFIGURATION_FUZZER_TRACE is set
  void (*run)(World& world, Decoder& in);
};

Operation const OPERATIONS[] = {
    {"create location service", createService},
    {"remove location service", removeService},
    {"create identity", createIdentity},
    {"remove identity", removeIdentity},
    {"set or clear base", setBase},
    {"edit aliases", editAliases},
    {"edit identity", editIdentity},
    {"create face", createFace},
    {"remove face", removeFace},
    {"edit face", editFace},
    {"register contact", registerContact},
    {"drop contact", dropContact},
    {"announce registration", announceRegistration},
    {"edit location service", editService},
    {"create or remove authentication service", createAuthenticationService},
    {"edit authentication service", editAuthenticationService},
    {"drop reference", dropReference},
    {"ask", ask},
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
  static bool const trace = std::getenv("CONFIGURATION_FUZZER_TRACE") != nullptr;
  int const before = LS_CRegistrationInbound::getGlobalContacts();
  {
    World world;
    Decoder in(data, size);
    while (!in.atEnd()) {
      Operation const& operation = OPERATIONS[in.below(sizeof OPERATIONS / sizeof OPERATIONS[0])];
      if (trace)
        std::fprintf(stderr, "%s\n", operation.name);
      operation.run(world, in);
      checkAliasIndex(world);
      checkContactCount(world, before);
    }
  }
  check(LS_CRegistrationInbound::getGlobalContacts() == before);
  return 0;
}
