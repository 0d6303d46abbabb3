#include "sip/MonotonicClock.h"

uint64_t MonotonicClock::nowMs() {
  timespec now{};
  clock_gettime(kClock, &now);
  return static_cast<uint64_t>(now.tv_sec) * 1000 + static_cast<uint64_t>(now.tv_nsec) / 1000000;
}
