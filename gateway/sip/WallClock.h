// WallClock: the system's calendar time, for the little the gateway must
// agree on with other processes: the stamps in nonces, which another
// gateway sharing the key, or this one after a restart, reads. Durations
// are measured on MonotonicClock; the store converts its expiries through
// the database's own clock.
//
// Defined in a file of its own, as MonotonicClock is, so that a harness
// that runs the gateway on a clock of its making can put its own
// definition in its place. Safe on any thread.
#pragma once

#include <cstdint>

namespace WallClock {

// Milliseconds since 1970, as the system's clock has it: it may step.
uint64_t nowMs();

}  // namespace WallClock
