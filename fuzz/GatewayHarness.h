// GatewayHarness: what the gateway's fuzz targets share to run its parts
// without a network, a wall clock or chance, so that every input is
// answered the same way each time it is replayed.
//
// The harness takes the place of four of libre's functions, as the gateway
// itself takes the place of its random functions (sip/StackRandom.cpp):
// libre calls them through its procedure linkage table, so the fuzz
// target's own definitions, exported from the executable, are the ones
// every caller reaches.
// - tmr_jiffies() reads a clock the harness sets: a nonce made at
//   kStartMs stays valid for every input, and time passes only when a
//   target advances it (the timers due then run in runTimers()).
// - rand_bytes(), rand_u32() and rand_u64() give zeros: the nonce key is
//   twenty zero bytes, so that seeded Authorization headers can carry
//   nonces the registrar accepts (fuzz/sip_message_seeds.py makes them),
//   and the tags of the answers repeat.
// - sip_send() keeps what it is given instead of sending it (takeSent()):
//   the stack has no transports, and the answers are checked instead.
//
// The gateway's log lines (standard output, and std::cerr) and libre's
// warnings are dropped: fuzzing writes thousands a second. Sanitizer reports and libFuzzer's own
// output go to the standard error descriptor, which stays open.
//
// Everything runs on the fuzzing thread, except what a target's own
// threads (the store's writer) read of the clock.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "ScriptSession.h"

namespace GatewayHarness {

// Milliseconds on the stack's clock when each input starts.
constexpr uint64_t kStartMs = 1764000000000ull;

// libre started and the outputs dropped; idempotent.
void setUp();

// Sets the stack's clock and runs the timers due by then.
void setNow(uint64_t nowMs);
uint64_t now();
void runTimers();

// The messages given to sip_send() since the last call, oldest first.
std::vector<std::string> takeSent();

// Runs the gateway tests' subscriber scripts on session, aborting when a
// line fails: subscribers of example.com with digest authentication,
// aliases and a "DEFAULT" group with a static contact, one with her own
// password, one with a short lifetime range, a trunk that only registers
// upstream, and a second domain without a "DEFAULT" group.
void loadModel(ScriptSession& session);

}  // namespace GatewayHarness
