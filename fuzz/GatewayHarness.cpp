#include "GatewayHarness.h"

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>
#include <sstream>

#include "CommandTable.h"
#include "ScriptLanguage.h"
#include "ScriptRunner.h"
#include "sip/Libre.h"
#include "sip/MonotonicClock.h"
#include "sip/WallClock.h"

// re_dbg.h wants a module name and level of its includer.
#define DEBUG_MODULE "fuzz"
#define DEBUG_LEVEL 0
#include <re_dbg.h>

// libre exports the timer list of the calling thread, but declares it in no
// header; tmr_poll() needs it.
extern "C" struct list* tmrl_get(void);

namespace {

std::atomic<uint64_t> g_nowMs{GatewayHarness::kStartMs};
std::vector<std::string> g_sent;
uint64_t g_drawn = 0;

std::string readScript(char const* name) {
  std::string const path = std::string(LS_GATEWAY_TEST_SCRIPTS) + "/" + name;
  std::ifstream file(path);
  if (!file) {
    std::fprintf(stderr, "cannot read %s\n", path.c_str());
    std::abort();
  }
  return std::string(std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>());
}

}  // namespace

extern "C" __attribute__((visibility("default"))) uint64_t tmr_jiffies(void) {
  return g_nowMs.load(std::memory_order_relaxed);
}

// The gateway's own clocks: the same time as the stack's.
uint64_t MonotonicClock::nowMs() {
  return tmr_jiffies();
}

uint64_t WallClock::nowMs() {
  return tmr_jiffies();
}

// No descriptor is ever watched: the gateway's MonotonicTimer then runs on
// the stack's timers, which run on the clock above.
extern "C" __attribute__((visibility("default"))) int fd_listen(int, int, fd_h*, void*) {
  return ENOSYS;
}

extern "C" __attribute__((visibility("default"))) void rand_bytes(uint8_t* p, size_t size) {
  std::memset(p, 0, size);
}

extern "C" __attribute__((visibility("default"))) uint32_t rand_u32(void) {
  return static_cast<uint32_t>(++g_drawn);
}

extern "C" __attribute__((visibility("default"))) uint64_t rand_u64(void) {
  return ++g_drawn;
}

extern "C" __attribute__((visibility("default"))) int sip_send(struct sip*,
                                                               void*,
                                                               enum sip_transp,
                                                               const struct sa*,
                                                               struct mbuf* mb) {
  if (!mb)
    return EINVAL;
  g_sent.emplace_back(reinterpret_cast<char const*>(mbuf_buf(mb)), mbuf_get_left(mb));
  return 0;
}

void GatewayHarness::startInput() {
  static bool const done = [] {
    if (libre_init() != 0)
      std::abort();
    // libre's own warnings about what it could not parse.
    dbg_init(DBG_EMERG, DBG_NONE);
    if (!std::freopen("/dev/null", "w", stdout))
      std::abort();
    std::cerr.rdbuf(nullptr);
    return true;
  }();
  (void)done;
  setNow(kStartMs);
  g_drawn = 0;
  takeSent();
}

void GatewayHarness::setNow(uint64_t nowMs) {
  g_nowMs.store(nowMs, std::memory_order_relaxed);
}

uint64_t GatewayHarness::now() {
  return g_nowMs.load(std::memory_order_relaxed);
}

void GatewayHarness::runTimers() {
  tmr_poll(tmrl_get());
}

std::vector<std::string> GatewayHarness::takeSent() {
  std::vector<std::string> sent;
  sent.swap(g_sent);
  return sent;
}

void GatewayHarness::loadModel(ScriptSession& session) {
  static std::string const scripts = readScript("subscribers.script") + readScript("security.script");
  static CommandTable const table = [] {
    CommandTable commands;
    addScriptCommands(commands);
    return commands;
  }();
  std::ostringstream ignored;
  std::istringstream input(scripts);
  ScriptRunner runner(session, table, ignored, std::cerr);
  if (!runner.run(input, "model", false)) {
    std::fprintf(stderr, "the fuzz model's scripts failed\n");
    std::abort();
  }
}
