// MonotonicTimer: a one-shot timer of the event loop on MonotonicClock, for
// the gateway's timers that a step of the system clock must not move (see
// MonotonicClock for why libre's own cannot serve): a timerfd, which
// libre's loop polls as it polls a socket. Periodic users start it again
// from their handler.
//
// The descriptor is made at the first start(), on the loop's thread, where
// libre keeps its descriptor table. When none can be had (out of
// descriptors), the timer runs on libre's tmr instead: late after a step
// back, but it fires.
//
// Owned by its user; destroying it cancels it. The handler may start,
// cancel or destroy the timer. Not thread-safe: everything runs on libre's
// thread.
#pragma once

#include <cstdint>

#include "sip/Libre.h"

class MonotonicTimer {
 public:
  using Handler = void (*)(void* argument);

  MonotonicTimer() { tmr_init(&m_fallback); }
  ~MonotonicTimer();
  MonotonicTimer(MonotonicTimer const&) = delete;
  MonotonicTimer& operator=(MonotonicTimer const&) = delete;

  // Calls handler(argument) once, delayMs from now; replaces a pending start.
  void start(uint64_t delayMs, Handler handler, void* argument);
  void cancel();
  bool running() const { return m_handler != nullptr; }

 private:
  // Whether m_fd is a timerfd libre's loop polls, making it on first use.
  bool pollable();
  void fire();
  static void onReadable(int flags, void* timer);
  static void onFallback(void* timer);

  int m_fd = -1;
  bool m_noDescriptor = false;  // one attempt: a failure falls back for good
  Handler m_handler = nullptr;  // null when not running
  void* m_argument = nullptr;
  tmr m_fallback;
};
