// What resolving a request's name-addr costs in a location service with
// 1,000, 10,000 and 100,000 identities: by the identity's own name, by an
// alias name or an alias range of the last identity (the alias step asks
// every identity in turn), and through the "DEFAULT" group (every identity
// asked first); and the inbound challenge and response for an identity that
// inherits its authentication entries from that group. Each is reported as
// a ratio to one lookup of the same key in a std::unordered_map, the floor
// any name table has to pay.
#include <benchmark/benchmark.h>
#include <malloc.h>

#include <cstdio>
#include <map>
#include <memory>
#include <string>
#include <unordered_map>

#include "LS_CMasterAuthenticationService.h"
#include "LS_CMasterLocationService.h"
#include "LS_CredentialLookup.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_ICallConfig.h"
#include "LS_IMwiSubscriptionConfig.h"
#include "LS_IOutboundConfig.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutboundConfig.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_IdentityResolution.h"
#include "RatioReporter.h"

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

Model& modelOf(int count) {
  static std::map<int, std::unique_ptr<Model>> models;
  std::unique_ptr<Model>& model = models[count];
  if (!model)
    model = std::make_unique<Model>(count);
  return *model;
}

void resolve(benchmark::State& state, std::string const& user, bool useDefault, char const* expected) {
  Model& model = modelOf(static_cast<int>(state.range(0)));
  CNameAddr const request = nameAddrOf(user);
  String error;
  RefPtr<LS_IIdentity> identity;
  for (auto _ : state) {
    XCode const result = LS_getIdentity(error, identity, request, model.names, useDefault, model.localHostPorts,
                                        AUTHORITATIVE, model.locationMaster.get());
    benchmark::DoNotOptimize(result);
  }
  if (!identity || identity->getName() != String(expected ? expected : model.last.c_str()))
    state.SkipWithError("resolved the wrong identity");
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

void BM_ResolveDirect(benchmark::State& state) {
  resolve(state, modelOf(static_cast<int>(state.range(0))).last, false, nullptr);
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
BENCHMARK(BM_ResolveDirect)->Apply(sizes);
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

// The heap that one more identity takes when it inherits a group with all
// seven faces and some twenty settings on them, as a gateway's subscribers
// inherit their group.
size_t bytesOfOneInheritingIdentity() {
  Model model(0);
  RefPtr<LS_IIdentityConfig> const group = model.identity("FULL", "", LS_IdentityType::IDENTITY_GROUP);
  group->setConfigDisplayName("Group");
  group->setConfigPhoneContext("example.com");
  RefPtr<LS_IRegistrationOutboundConfig> const outbound =
      faceOf<LS_IRegistrationOutboundConfig>(group.get(), LS_IdentityFace::REGISTRATION_OUTBOUND);
  outbound->setConfigRegistrar(Model::hostPortOf("registrar.example.com"), CHostPort());
  outbound->setConfigLifetime(600);
  RefPtr<LS_IOutboundConfig> transport;
  outbound->queryIf(transport);
  transport->setConfigTrafficClass(46);
  transport->setConfigPenaltyBox(true);
  outbound->setConfigKeepAliveInterval(30);
  RefPtr<LS_IRegistrationInboundConfig> const inbound =
      faceOf<LS_IRegistrationInboundConfig>(group.get(), LS_IdentityFace::REGISTRATION_INBOUND);
  inbound->setConfigLifetimeRange(60, 3600, 600);
  RefPtr<LS_IMwiSubscriptionConfig> const mwi =
      faceOf<LS_IMwiSubscriptionConfig>(group.get(), LS_IdentityFace::MESSAGE_SUBSCRIPTION);
  mwi->setConfigMwiNotifier(Model::hostPortOf("mwi.example.com"), CHostPort());
  mwi->setConfigLifetime(3600);
  for (LS_IdentityFace::Type face : {LS_IdentityFace::CALL_OUTBOUND, LS_IdentityFace::CALL_INBOUND}) {
    RefPtr<LS_ICallConfig> const call = faceOf<LS_ICallConfig>(group.get(), face);
    call->setConfigVoipProfile("voip");
    call->setConfigToneSetProfile("tones");
    call->setConfigSipProfile("sip");
  }
  for (LS_IdentityFace::Type face : {LS_IdentityFace::AUTHENTICATION_OUTBOUND, LS_IdentityFace::AUTHENTICATION_INBOUND})
    faceOf<LS_IAuthenticationConfig>(group.get(), face)->insertConfigAuthenticate(0, "http", "");

  model.identity("warm-up", "FULL", LS_IdentityType::IDENTITY);
  size_t const before = mallinfo2().uordblks;
  RefPtr<LS_IIdentityConfig> const member = model.identity("member", "FULL", LS_IdentityType::IDENTITY);
  return mallinfo2().uordblks - before;
}

}  // namespace

int main(int argc, char** argv) {
  benchmark::Initialize(&argc, argv);
  std::vector<RatioReporter::Ratio> ratios;
  for (char const* size : {"1000", "10000", "100000"}) {
    std::string const floor = std::string("BM_MapFloor/") + size;
    for (char const* measured : {"BM_ResolveDirect", "BM_ResolveAliasName", "BM_ResolveAliasRange",
                                 "BM_ResolveDefault", "BM_InboundChallenge", "BM_InboundResponse"})
      ratios.push_back({std::string(measured) + "/" + size, floor});
  }
  RatioReporter reporter(ratios);
  benchmark::RunSpecifiedBenchmarks(&reporter);
  std::printf("one identity inheriting a full group: %zu bytes\n", bytesOfOneInheritingIdentity());
  benchmark::Shutdown();
  return 0;
}
