// What resolving a request's name-addr costs in a location service with 1,000,
// 10,000 and 100,000 identities: by the identity's own name, by an alias name
// or an alias range of the last identity, and through the "DEFAULT" group (no
// identity's name or alias claims the user); by name again with no master
// given, so that the master is found in the driver repository on every call;
// and the inbound challenge and response for an identity that inherits its
// authentication entries from that group. Resolving by name is reported as a
// ratio to its floor, splitting the same name-addr plus one lookup of the user
// in a std::unordered_map; resolving through the repository, by alias, by
// range and through "DEFAULT" as ratios to resolving by name with the master
// given at the same size, which stay flat from 1,000 to 100,000 when their
// cost does not grow with the service; challenge and response as ratios to the
// map lookup alone. Also: how long one change of a group takes to reach the
// registration observers of its 10,000 members, and its 100,000 members when
// nobody watches them; and an identity's first registration (its own
// inbound-registration face made and a contact added) as a ratio to
// resolving by name. What one member of a group takes in memory is
// identity_memory's (IdentityMemory.cpp).
#include <benchmark/benchmark.h>
#include <malloc.h>

#include <chrono>
#include <cstdio>
#include <map>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "CDriverRepository.h"
#include "LS_CMasterAuthenticationService.h"
#include "LS_CMasterLocationService.h"
#include "LS_CredentialLookup.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_IRegistrationInbound.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutboundConfig.h"
#include "LS_IRegistrationOutboundObserver.h"
#include "LS_IRegistrationOutboundSubject.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_IdentityResolution.h"
#include "RatioReporter.h"
#include "SystemRepository.h"

namespace {

constexpr auto AUTHORITATIVE = LS_Imperative::AUTHORITATIVE;

CNameAddr nameAddrOf(std::string const& user) {
  std::string const text = "sip:" + user + "@example.com";
  CNameAddr parsed;
  parsed.Parse(text.c_str(), text.size());
  return parsed;
}

// Identities "user-<i>" with the alias name "alias-<i>" and the alias range
// "range-<i>-a" to "range-<i>-z"; every tenth also has an alias expression,
// and every tenth (a different one) inherits from the "DEFAULT" group, whose
// inbound entry falls back to the "DEFAULT" credentials of service "http".
// Built once per size and kept until the program ends.
struct Model {
  explicit Model(int count) {
    adoptInterface(service,
                   [&](UUID const& iid, void** raw) { return locationMaster->createLocationServiceIf("ls", iid, raw); });
    service->insertConfigDomain(0, hostPortOf("example.com"));
    RefPtr<LS_IIdentityConfig> const group = identity("DEFAULT", "", LS_IdentityType::IDENTITY_GROUP);
    RefPtr<LS_IAuthenticationConfig> inbound;
    adoptInterface(inbound, [&](UUID const& iid, void** raw) {
      return group->createConfigFaceIf(LS_IdentityFace::AUTHENTICATION_INBOUND, iid, raw);
    });
    inbound->insertConfigAuthenticate(0, "http", "");

    for (int i = 0; i < count; ++i) {
      std::string const index = std::to_string(i);
      RefPtr<LS_IIdentityConfig> const created =
          identity(("user-" + index).c_str(), i % 10 == 9 ? "DEFAULT" : "", LS_IdentityType::IDENTITY);
      created->addConfigAliasName(("alias-" + index).c_str());
      created->addConfigAliasRange(("range-" + index + "-a").c_str(), ("range-" + index + "-z").c_str());
      if (i % 10 == 0)
        created->addConfigAliasExpression(("expr-" + index + "-[0-9]+").c_str());
      RefPtr<LS_IIdentity> runtime;
      created->queryIf(runtime);
      floor.emplace("user-" + index, runtime);
    }

    RefPtr<LS_IAuthenticationService> http;
    adoptInterface(http, [&](UUID const& iid, void** raw) {
      return authenticationMaster->createAuthenticationServiceIf("http", iid, raw);
    });
    http->insertRealm(0, "r1");
    http->insertRealm(1, "r2");
    http->setCredentials("DEFAULT", "secret");
    names.add("ls");
    last = "user-" + std::to_string(count - 1);
  }

  static CHostPort hostPortOf(char const* text) {
    CHostPort parsed;
    parsed = CString(text);
    return parsed;
  }
  RefPtr<LS_IIdentityConfig> identity(char const* name, char const* base, LS_IdentityType::Type type) {
    RefPtr<LS_IIdentityConfig> created;
    adoptInterface(created, [&](UUID const& iid, void** raw) {
      return service->createConfigIdentityIf(name, base, type, iid, raw);
    });
    return created;
  }

  // Declared first so that they go last, cutting the identities' links back
  // to their service.
  RefPtr<LS_CMasterLocationService> locationMaster = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_CMasterAuthenticationService> authenticationMaster = adoptRef(new LS_CMasterAuthenticationService);
  RefPtr<LS_ILocationServiceConfig> service;
  std::unordered_map<std::string, RefPtr<LS_IIdentity>> floor;
  Vector<String> names;
  Vector<CHostPort> localHostPorts;
  std::string last;  // the name of the identity created last
};

// What the first lookup in each size's model took, in milliseconds and in
// heap bytes per identity: the alias index reads every identity created
// since the previous lookup, here all of them.
struct FirstLookup {
  double milliseconds;
  double bytesPerIdentity;
};
std::map<int, FirstLookup>& firstLookups() {
  static std::map<int, FirstLookup> lookups;
  return lookups;
}

// The model of count identities, its alias index brought up to date before
// any timing loop sees it.
Model& modelOf(int count) {
  static std::map<int, std::unique_ptr<Model>> models;
  std::unique_ptr<Model>& model = models[count];
  if (model)
    return *model;
  model = std::make_unique<Model>(count);
  String error;
  RefPtr<LS_IIdentity> identity;
  CNameAddr const nobody = nameAddrOf("nobody");
  size_t const before = mallinfo2().uordblks;
  auto const start = std::chrono::steady_clock::now();
  LS_getIdentity(error, identity, nobody, model->names, false, model->localHostPorts, AUTHORITATIVE,
                 model->locationMaster.get());
  std::chrono::duration<double, std::milli> const taken = std::chrono::steady_clock::now() - start;
  double const bytes = static_cast<double>(mallinfo2().uordblks) - static_cast<double>(before);
  firstLookups()[count] = FirstLookup{taken.count(), bytes / count};
  return *model;
}

void resolve(benchmark::State& state,
             std::string const& user,
             bool useDefault,
             char const* expected,
             LS_IMasterLocationService* master) {
  Model& model = modelOf(static_cast<int>(state.range(0)));
  CNameAddr const request = nameAddrOf(user);
  String error;
  RefPtr<LS_IIdentity> identity;
  for (auto _ : state) {
    XCode const result =
        LS_getIdentity(error, identity, request, model.names, useDefault, model.localHostPorts, AUTHORITATIVE, master);
    benchmark::DoNotOptimize(result);
  }
  if (!identity || identity->getName() != String(expected ? expected : model.last.c_str()))
    state.SkipWithError("resolved the wrong identity");
}

void resolve(benchmark::State& state, std::string const& user, bool useDefault, char const* expected) {
  resolve(state, user, useDefault, expected, modelOf(static_cast<int>(state.range(0))).locationMaster.get());
}

void BM_MapFloor(benchmark::State& state) {
  Model& model = modelOf(static_cast<int>(state.range(0)));
  // The key is rebuilt from text in every iteration, as the lookups build
  // theirs from the URI.
  std::string const user = model.last;
  for (auto _ : state) {
    auto const found = model.floor.find(std::string(user.c_str()));
    benchmark::DoNotOptimize(found);
  }
}

// The floor of resolving by name: the name-addr split as the lookups split
// it, then one map lookup of the user.
void BM_SplitFloor(benchmark::State& state) {
  Model& model = modelOf(static_cast<int>(state.range(0)));
  CNameAddr const request = nameAddrOf(model.last);
  String error;
  String user;
  CHostPort host;
  for (auto _ : state) {
    LS_splitNameAddr(error, user, host, request);
    auto const found = model.floor.find(user.str());
    benchmark::DoNotOptimize(found);
  }
}

void BM_ResolveDirect(benchmark::State& state) {
  resolve(state, modelOf(static_cast<int>(state.range(0))).last, false, nullptr);
}

// As BM_ResolveDirect, but the SIP stack passes no master: every question
// finds it in the driver repository, where this size's master is registered
// for the run.
void BM_ResolveDirectFromRepository(benchmark::State& state) {
  Model& model = modelOf(static_cast<int>(state.range(0)));
  RefPtr<CDriverRepository> const repository = adoptRef(new CDriverRepository);
  repository->registerDriver(model.locationMaster.get());
  SYSTEM::SET_DRIVER_REPOSITORY(repository.get());
  resolve(state, model.last, false, nullptr, nullptr);
  SYSTEM::SET_DRIVER_REPOSITORY(nullptr);
  repository->unregisterDriver(model.locationMaster->getDriverName());
}

void BM_ResolveAliasName(benchmark::State& state) {
  int const last = static_cast<int>(state.range(0)) - 1;
  resolve(state, "alias-" + std::to_string(last), false, nullptr);
}

void BM_ResolveAliasRange(benchmark::State& state) {
  int const last = static_cast<int>(state.range(0)) - 1;
  resolve(state, "range-" + std::to_string(last) + "-m", false, nullptr);
}

void BM_ResolveDefault(benchmark::State& state) {
  resolve(state, "nobody", true, "DEFAULT");
}

RefPtr<LS_IIdentity> lastIdentity(Model& model) {
  return model.floor.find(model.last)->second;
}

void BM_InboundChallenge(benchmark::State& state) {
  Model& model = modelOf(static_cast<int>(state.range(0)));
  RefPtr<LS_IIdentity> const identity = lastIdentity(model);
  String error;
  Vector<LS_ProtocolRealm> realms;
  for (auto _ : state) {
    LS_getInboundAuthenticationChallenge(error, realms, identity.get(), model.authenticationMaster.get());
    benchmark::DoNotOptimize(realms);
  }
  if (realms.size() != 2)
    state.SkipWithError("wrong realms");
}

void BM_InboundResponse(benchmark::State& state) {
  Model& model = modelOf(static_cast<int>(state.range(0)));
  RefPtr<LS_IIdentity> const identity = lastIdentity(model);
  CNameAddr const request = nameAddrOf(model.last);
  String const user(model.last.c_str());
  String error;
  Vector<String> passwords;
  for (auto _ : state) {
    LS_getInboundAuthenticationResponse(error, passwords, identity.get(), request, LS_AuthenticationProtocol::HTTP,
                                        "r2", user, model.authenticationMaster.get());
    benchmark::DoNotOptimize(passwords);
  }
  if (passwords.size() != 1)
    state.SkipWithError("wrong passwords");
}

// Every benchmark at every size, all in nanoseconds so that the ratios
// compare like with like. Each size's model is built on first use, before
// any timing loop.
void sizes(benchmark::internal::Benchmark* benchmark) {
  benchmark->Arg(1000)->Arg(10000)->Arg(100000);
}
BENCHMARK(BM_MapFloor)->Apply(sizes);
BENCHMARK(BM_SplitFloor)->Apply(sizes);
BENCHMARK(BM_ResolveDirect)->Apply(sizes);
BENCHMARK(BM_ResolveDirectFromRepository)->Apply(sizes);
BENCHMARK(BM_ResolveAliasName)->Apply(sizes);
BENCHMARK(BM_ResolveAliasRange)->Apply(sizes);
BENCHMARK(BM_ResolveDefault)->Apply(sizes);
BENCHMARK(BM_InboundChallenge)->Apply(sizes);
BENCHMARK(BM_InboundResponse)->Apply(sizes);

// Interface T of the group's face, created on first use.
template <class T>
RefPtr<T> faceOf(LS_IIdentityConfig* group, LS_IdentityFace::Type face) {
  RefPtr<T> created;
  adoptInterface(created, [&](UUID const& iid, void** raw) { return group->createConfigFaceIf(face, iid, raw); });
  return created;
}

// Counts the outbound-registration changes that reach a member.
class RegistrationCounter : public LS_IRegistrationOutboundObserver {
 public:
  void onRegistrationOutboundChange(ObserverEvent<LS_IRegistrationOutbound>&) override { ++changes; }
  size_t changes = 0;
};

// A group with an outbound-registration face and N members, each watched
// by a registration observer, as a gateway's subscribers are watched by the
// SIP stack. Built once per size and kept until the program ends.
struct GroupOfMembers {
  explicit GroupOfMembers(int count) : model(0), counters(count) {
    RefPtr<LS_IIdentityConfig> const group = model.identity("GROUP", "", LS_IdentityType::IDENTITY_GROUP);
    registration = faceOf<LS_IRegistrationOutboundConfig>(group.get(), LS_IdentityFace::REGISTRATION_OUTBOUND);
    registration->setConfigLifetime(lifetime);
    for (int i = 0; i < count; ++i) {
      RefPtr<LS_IIdentityConfig> const member =
          model.identity(("member-" + std::to_string(i)).c_str(), "GROUP", LS_IdentityType::IDENTITY);
      RefPtr<LS_IRegistrationOutboundSubject> subject;
      member->queryIf(subject);
      subject->addRegistrationOutboundObserver(&counters[i], 0);
      subjects.push_back(subject);
    }
  }
  ~GroupOfMembers() {
    for (size_t i = 0; i < subjects.size(); ++i)
      subjects[i]->removeRegistrationOutboundObserver(&counters[i]);
  }

  Model model;
  RefPtr<LS_IRegistrationOutboundConfig> registration;
  unsigned int lifetime = 600;  // the face's current lifetime
  std::vector<RegistrationCounter> counters;
  std::vector<RefPtr<LS_IRegistrationOutboundSubject>> subjects;
};

// One change of the group's outbound lifetime, reaching the registration
// observer of every member.
void BM_GroupChangeReachesEveryMember(benchmark::State& state) {
  static std::map<int, std::unique_ptr<GroupOfMembers>> groups;
  int const count = static_cast<int>(state.range(0));
  std::unique_ptr<GroupOfMembers>& group = groups[count];
  if (!group)
    group = std::make_unique<GroupOfMembers>(count);
  for (RegistrationCounter& counter : group->counters)
    counter.changes = 0;
  // A value the face does not hold yet, or nothing would be announced.
  for (auto _ : state)
    group->registration->setConfigLifetime(++group->lifetime);
  for (RegistrationCounter const& counter : group->counters) {
    if (counter.changes != static_cast<size_t>(state.iterations())) {
      state.SkipWithError("a member missed a change, or heard it twice");
      break;
    }
  }
}
BENCHMARK(BM_GroupChangeReachesEveryMember)->Arg(10000)->Unit(benchmark::kMillisecond);

// The same change where nobody watches the members, as in a gateway whose
// subscribers inherit the "DEFAULT" group's inbound-registration face: the
// group's lifetime range changed, every member's face told.
void BM_GroupChangeReachesUnwatchedMembers(benchmark::State& state) {
  int const count = static_cast<int>(state.range(0));
  Model model(0);
  RefPtr<LS_IIdentityConfig> const group = model.identity("DEFAULT", "", LS_IdentityType::IDENTITY_GROUP);
  RefPtr<LS_IRegistrationInboundConfig> const registration =
      faceOf<LS_IRegistrationInboundConfig>(group.get(), LS_IdentityFace::REGISTRATION_INBOUND);
  for (int i = 0; i < count; ++i)
    model.identity(("member-" + std::to_string(i)).c_str(), "DEFAULT", LS_IdentityType::IDENTITY);
  unsigned int maximum = 7200;
  for (auto _ : state)
    registration->setConfigLifetimeRange(60, ++maximum, 3600);
}
BENCHMARK(BM_GroupChangeReachesUnwatchedMembers)->Arg(100000)->Unit(benchmark::kMillisecond);

// A storm's first registration of a member of the group: the member's own
// inbound-registration face made (inheriting the group's lifetime range) and
// a contact added to it, for each of count members in turn, as a gateway
// does when every phone registers after an outage.
void BM_FirstRegistration(benchmark::State& state) {
  int const count = static_cast<int>(state.range(0));
  Model model(0);
  RefPtr<LS_IIdentityConfig> const group = model.identity("DEFAULT", "", LS_IdentityType::IDENTITY_GROUP);
  faceOf<LS_IAuthenticationConfig>(group.get(), LS_IdentityFace::AUTHENTICATION_INBOUND)
      ->insertConfigAuthenticate(0, "http", "");
  faceOf<LS_IRegistrationInboundConfig>(group.get(), LS_IdentityFace::REGISTRATION_INBOUND)
      ->setConfigLifetimeRange(60, 7200, 3600);
  std::vector<RefPtr<LS_IIdentity>> members;
  for (int i = 0; i < count; ++i) {
    RefPtr<LS_IIdentity> member;
    model.identity(("member-" + std::to_string(i)).c_str(), "DEFAULT", LS_IdentityType::IDENTITY)->queryIf(member);
    members.push_back(member);
  }
  CNameAddr const contact = nameAddrOf("phone");
  CHostPort const received = Model::hostPortOf("192.0.2.1:5060");
  String const callId("call-id");
  size_t next = 0;
  for (auto _ : state) {
    LS_IIdentity* const member = members[next++ % members.size()].get();
    RefPtr<LS_IRegistrationInbound> face;
    adoptInterface(face, [&](UUID const& iid, void** raw) {
      return member->createDynamicFaceIf(LS_IdentityFace::REGISTRATION_INBOUND, iid, raw);
    });
    face->addContact(callId, contact, received, "", "", 1000, 3600);
  }
}
BENCHMARK(BM_FirstRegistration)->Arg(100000)->Iterations(100000);

}  // namespace

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  std::vector<RatioReporter::Ratio> ratios;
  for (std::string const size : {"/1000", "/10000", "/100000"}) {
    ratios.push_back({"BM_ResolveDirect" + size, "BM_SplitFloor" + size});
    for (char const* measured :
         {"BM_ResolveDirectFromRepository", "BM_ResolveAliasName", "BM_ResolveAliasRange", "BM_ResolveDefault"})
      ratios.push_back({measured + size, "BM_ResolveDirect" + size});
    for (char const* measured : {"BM_InboundChallenge", "BM_InboundResponse"})
      ratios.push_back({measured + size, "BM_MapFloor" + size});
  }
  ratios.push_back({"BM_FirstRegistration/100000/iterations:100000", "BM_ResolveDirect/100000"});
  RatioReporter reporter(ratios);
  benchmark::RunSpecifiedBenchmarks(&reporter);
  for (auto const& first : firstLookups())
    std::printf("first lookup after creating %d identities: %.1f ms, alias index %.0f bytes per identity\n",
                first.first, first.second.milliseconds, first.second.bytesPerIdentity);
  benchmark::Shutdown();
  return 0;
}
