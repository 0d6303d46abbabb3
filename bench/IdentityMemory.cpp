// What one derived identity costs in memory: the growth of the live bytes
// asked of operator new while N identities are created on a group with all
// seven faces and some twenty settings, as a gateway's subscribers inherit
// their group, divided by N; and the live blocks the same way. It takes a
// few seconds under qemu-user, so that the figure is taken on the 32-bit
// target as well as on the build machine. Bytes asked, not bytes the heap
// spends: the allocator's own rounding and headers differ by C library and
// are left out. The first argument sets N (10,000 when absent).
#include <cstdio>
#include <cstdlib>
#include <new>
#include <string>

#include "LS_CMasterLocationService.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_ICallConfig.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_IMwiSubscriptionConfig.h"
#include "LS_IOutboundConfig.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutboundConfig.h"

namespace {

// Live bytes and blocks asked of operator new. The program starts no
// thread, so plain counters do.
size_t liveBytes = 0;
size_t liveBlocks = 0;

// Every block carries the size it was asked for in front of it, padded so
// that the block keeps the alignment operator new promises.
constexpr size_t kHeader = alignof(std::max_align_t);

void* counted(size_t size) {
  void* const raw = std::malloc(kHeader + size);
  if (!raw)
    throw std::bad_alloc();
  *static_cast<size_t*>(raw) = size;
  liveBytes += size;
  ++liveBlocks;
  return static_cast<char*>(raw) + kHeader;
}

void uncounted(void* block) {
  if (!block)
    return;
  void* const raw = static_cast<char*>(block) - kHeader;
  liveBytes -= *static_cast<size_t*>(raw);
  --liveBlocks;
  std::free(raw);
}

}  // namespace

// The standard library's other plain forms (arrays, nothrow, sized delete)
// reach these two.
void* operator new(size_t size) {
  return counted(size);
}
void operator delete(void* block) noexcept {
  uncounted(block);
}
void operator delete(void* block, size_t) noexcept {
  uncounted(block);
}

namespace {

CHostPort hostPortOf(char const* text) {
  CHostPort parsed;
  parsed = CString(text);
  return parsed;
}

template <class T>
RefPtr<T> faceOf(LS_IIdentityConfig* group, LS_IdentityFace::Type face) {
  RefPtr<T> created;
  adoptInterface(created,
                 [&](UUID const& iid, void** raw) { return group->createConfigFaceIf(face, iid, raw); });
  return created;
}

// Settings on every face, as a gateway's subscriber group carries them.
void configureFullGroup(LS_IIdentityConfig* group) {
  group->setConfigDisplayName("Group");
  group->setConfigPhoneContext("example.com");
  RefPtr<LS_IRegistrationOutboundConfig> const outbound =
      faceOf<LS_IRegistrationOutboundConfig>(group, LS_IdentityFace::REGISTRATION_OUTBOUND);
  outbound->setConfigRegistrar(hostPortOf("registrar.example.com"), CHostPort());
  outbound->setConfigLifetime(600);
  RefPtr<LS_IOutboundConfig> transport;
  outbound->queryIf(transport);
  transport->setConfigTrafficClass(46);
  transport->setConfigPenaltyBox(true);
  outbound->setConfigKeepAliveInterval(30);
  faceOf<LS_IRegistrationInboundConfig>(group, LS_IdentityFace::REGISTRATION_INBOUND)
      ->setConfigLifetimeRange(60, 3600, 600);
  RefPtr<LS_IMwiSubscriptionConfig> const mwi =
      faceOf<LS_IMwiSubscriptionConfig>(group, LS_IdentityFace::MESSAGE_SUBSCRIPTION);
  mwi->setConfigMwiNotifier(hostPortOf("mwi.example.com"), CHostPort());
  mwi->setConfigLifetime(3600);
  for (LS_IdentityFace::Type face : {LS_IdentityFace::CALL_OUTBOUND, LS_IdentityFace::CALL_INBOUND}) {
    RefPtr<LS_ICallConfig> const call = faceOf<LS_ICallConfig>(group, face);
    call->setConfigVoipProfile("voip");
    call->setConfigToneSetProfile("tones");
    call->setConfigSipProfile("sip");
  }
  for (LS_IdentityFace::Type face :
       {LS_IdentityFace::AUTHENTICATION_OUTBOUND, LS_IdentityFace::AUTHENTICATION_INBOUND})
    faceOf<LS_IAuthenticationConfig>(group, face)->insertConfigAuthenticate(0, "http", "");
}

RefPtr<LS_IIdentityConfig> createIdentity(LS_ILocationServiceConfig* service,
                                          std::string const& name,
                                          char const* base,
                                          LS_IdentityType::Type type) {
  RefPtr<LS_IIdentityConfig> created;
  adoptInterface(created, [&](UUID const& iid, void** raw) {
    return service->createConfigIdentityIf(name.c_str(), base, type, iid, raw);
  });
  return created;
}

}  // namespace

int main(int argc, char** argv) {
  int const count = argc > 1 ? std::atoi(argv[1]) : 10000;
  if (count <= 0) {
    std::fprintf(stderr, "usage: %s [number of derived identities]\n", argv[0]);
    return 2;
  }
  RefPtr<LS_CMasterLocationService> const master = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_ILocationServiceConfig> service;
  adoptInterface(
      service, [&](UUID const& iid, void** raw) { return master->createLocationServiceIf("ls", iid, raw); });
  configureFullGroup(createIdentity(service.get(), "FULL", "", LS_IdentityType::IDENTITY_GROUP).get());
  // The first member makes what every later one shares.
  createIdentity(service.get(), "warm-up", "FULL", LS_IdentityType::IDENTITY);

  size_t const bytesBefore = liveBytes;
  size_t const blocksBefore = liveBlocks;
  for (int i = 0; i < count; ++i)
    createIdentity(service.get(), "member-" + std::to_string(i), "FULL", LS_IdentityType::IDENTITY);
  double const bytes = static_cast<double>(liveBytes - bytesBefore) / count;
  double const blocks = static_cast<double>(liveBlocks - blocksBefore) / count;
  std::printf(
      "bytes per derived identity (%u-bit, %d on a group with all seven faces): %.0f in %.1f blocks\n",
      static_cast<unsigned int>(sizeof(void*) * 8), count, bytes, blocks);
  return 0;
}
