// MonotonicClock: the clock every part of the gateway measures durations on:
// binding lifetimes, nonce lifetimes, source holds, the autosave's spacing
// and the store's back-off. Wall-clock time stays out of
// the gateway's own arithmetic; the store alone converts to it, at its
// boundary, since its rows outlive the process (StoredBinding).
//
// Decisions, with their reasons:
// - libre's tmr_jiffies() is not used: the libre Debian ships (1.1.0)
//   derives it from gettimeofday(), so a step of the system clock back
//   stalled every expiry by the step, and a step forward expired every
//   binding at once and deleted it from the store.
// - CLOCK_BOOTTIME: never stepped, like CLOCK_MONOTONIC, and it also counts
//   the time the machine was suspended, so that a binding runs out when the
//   phone's own registration does.
// - libre's timers (tmr_start) run on the same gettimeofday(), and the
//   gateway cannot change that for the stack's own (transactions, the
//   trunks' registration clients, DNS): a step back delays those by the
//   step, a step forward fires them early. The gateway's own timers that
//   decide a binding's fate, the registrar's expiry sweep and the NAT
//   pings, run on MonotonicTimer instead, which libre's loop polls like a
//   socket. Its other timers (the request log's flush, the autosave, the
//   trunks' retries and keep-alives) stay on libre's: a step moves them by
//   its size once, which costs a late write or a late retry, nothing lost.
//
// Safe on any thread.
#pragma once

#include <time.h>

#include <cstdint>

namespace MonotonicClock {

constexpr clockid_t kClock = CLOCK_BOOTTIME;

// Milliseconds since an arbitrary start (the machine's boot). Defined in
// a file of its own, so that a harness that runs the gateway on a clock of
// its making can put its own definition in its place.
uint64_t nowMs();

}  // namespace MonotonicClock
