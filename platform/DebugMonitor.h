// DebugMonitor: the utility library's debug log channels, numbered by id.
//
// A channel is off until a host (or a test) switches it on with a sink that
// receives each formatted line exactly as written (a format without "\n"
// gives a line without one). get() is the whole cost of a disabled call: one
// load and one null check, so callers write
//   if (DebugMonitor* monitor = DebugMonitor::get(id, level)) monitor->log(...);
// and evaluate no argument while the channel is off. Channels are never
// destroyed, so a monitor handed out stays valid while another thread
// switches it off; the sink is swapped under the monitor's mutex.
#pragma once

#include "Export.h"

#include <atomic>
#include <functional>
#include <mutex>

class LS_EXPORT DebugMonitor {
 public:
  using Sink = std::function<void(char const* line)>;
  static constexpr unsigned int kChannels = 64;

  // The monitor of id when it is on and writes level; null otherwise.
  static DebugMonitor* get(unsigned int id, unsigned int level) {
    if (id >= kChannels)
      return nullptr;
    DebugMonitor* const monitor = s_enabled[id].load(std::memory_order_acquire);
    return monitor && level <= monitor->m_level.load(std::memory_order_relaxed) ? monitor : nullptr;
  }

  // Switches channel id on for lines of level 0 up to maxLevel.
  static void enable(unsigned int id, unsigned int maxLevel, Sink sink);
  static void disable(unsigned int id);

  void log(char const* format, ...) __attribute__((format(printf, 2, 3)));

 private:
  static std::atomic<DebugMonitor*> s_enabled[kChannels];

  std::mutex m_mutex;
  std::atomic<unsigned int> m_level{0};
  Sink m_sink;
};
