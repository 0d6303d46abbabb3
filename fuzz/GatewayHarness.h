// GatewayHarness: what the gateway's fuzz targets share to run its parts
// without a network, a wall clock or chance, so that every input is
// answered the same way each time it is replayed.
//
// The harness takes the place of five of libre's functions, as the gateway
// itself takes the place of its random functions (sip/StackRandom.cpp):
// libre calls them through its procedure linkage table, so the fuzz
// target's own definitions, exported from the executable, are the ones
// every caller reaches.
// - tmr_jiffies() reads a clock the harness sets: a nonce made at
//   kStartMs stays valid for every input, and time passes only when a
//   target advances it (the timers due then run in runTimers()).
// - rand_bytes() gives zeros: the nonce key is twenty zero bytes and the
//   nonces' issuer zero, so that seeded Authorization headers can carry
//   nonces the registrar accepts (fuzz/sip_message_seeds.py makes them).
//   rand_u32() and rand_u64() count from one, anew for each input: the
//   tags of the answers repeat, and callers that draw until they get a
//   number they have not used yet (the NAT pinger's ids) get one.
// - sip_send() keeps what it is given instead of sending it (takeSent()):
//   the stack has no transports, and the answers are checked instead.
// - fd_listen() refuses every descriptor: the gateway's MonotonicTimer
//   falls back to the stack's timers, and so runs on the clock above.
// The gateway's own clocks (MonotonicClock, WallClock) are defined here
// too, as that same clock: each is alone in its file of the gateway_clock
// archive, which the linker then leaves out.
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

// Before each input: libre started and the outputs dropped (once), the
// clock at kStartMs, the random numbers counting from their start, and
// nothing sent.
void startInput();

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
