#include "sip/LibraryClock.h"

#include <time.h>

#include <cstdio>

namespace {

double secondsOf(clockid_t clock) {
  timespec now{};
  clock_gettime(clock, &now);
  return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9;
}

}  // namespace

double LibraryClock::threadSeconds() {
  return secondsOf(CLOCK_THREAD_CPUTIME_ID);
}

double LibraryClock::monotonicSeconds() {
  return secondsOf(CLOCK_MONOTONIC);
}

std::string LibraryClock::summary() const {
  double const total = threadSeconds();
  double const share = total > 0 ? 100.0 * m_librarySeconds / total : 0.0;
  char text[128];
  std::snprintf(text, sizeof text, "CPU %.3f s, in the library %.3f s (%.1f%%)", total, m_librarySeconds,
                share);
  return text;
}
