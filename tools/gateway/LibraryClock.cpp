#include "LibraryClock.h"

#include <time.h>

#include <cstdio>

double LibraryClock::threadSeconds() {
  timespec now{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
  return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9;
}

std::string LibraryClock::summary() const {
  double const total = threadSeconds();
  double const share = total > 0 ? 100.0 * m_librarySeconds / total : 0.0;
  char text[128];
  std::snprintf(text, sizeof text, "CPU %.3f s, in the library %.3f s (%.1f%%)", total, m_librarySeconds, share);
  return text;
}
