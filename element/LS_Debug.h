// The library's debug log: every class writes its lines to debug monitor 57
// at level 0. LS_DEBUG evaluates its arguments only while that monitor is on,
// so a disabled line costs one load and one null check on hot paths.
#pragma once

#include "DebugMonitor.h"

constexpr unsigned int LS_DEBUG_MONITOR_ID = 57;
constexpr unsigned int LS_DEBUG_LEVEL = 0;

#define LS_DEBUG(...)                                                                             \
  do {                                                                                            \
    if (DebugMonitor* ls_debug_monitor_ = DebugMonitor::get(LS_DEBUG_MONITOR_ID, LS_DEBUG_LEVEL)) \
      ls_debug_monitor_->log(__VA_ARGS__);                                                        \
  } while (0)

// An object's address for "%p".
inline void const* LS_ptr(void const* object) {
  return object;
}
