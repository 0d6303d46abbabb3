#include "DebugMonitor.h"

#include <cstdarg>
#include <cstdio>
#include <string>

std::atomic<DebugMonitor*> DebugMonitor::s_enabled[DebugMonitor::kChannels];

namespace {

DebugMonitor& channel(unsigned int id) {
  // Constructed once, never destroyed: a log call racing with disable() or
  // with process exit must not meet a dead monitor.
  static DebugMonitor* const monitors = new DebugMonitor[DebugMonitor::kChannels];
  return monitors[id];
}

}  // namespace

void DebugMonitor::enable(unsigned int id, unsigned int maxLevel, Sink sink) {
  if (id >= kChannels)
    return;
  DebugMonitor& monitor = channel(id);
  {
    std::lock_guard<std::mutex> guard(monitor.m_mutex);
    monitor.m_level.store(maxLevel, std::memory_order_relaxed);
    monitor.m_sink = std::move(sink);
  }
  s_enabled[id].store(&monitor, std::memory_order_release);
}

void DebugMonitor::disable(unsigned int id) {
  if (id >= kChannels)
    return;
  s_enabled[id].store(nullptr, std::memory_order_release);
  DebugMonitor& monitor = channel(id);
  std::lock_guard<std::mutex> guard(monitor.m_mutex);
  monitor.m_sink = nullptr;
}

void DebugMonitor::log(char const* format, ...) {
  va_list args;
  va_start(args, format);
  va_list measure;
  va_copy(measure, args);
  int const needed = std::vsnprintf(nullptr, 0, format, measure);
  va_end(measure);
  std::string line(needed > 0 ? static_cast<size_t>(needed) : 0, '\0');
  if (needed > 0)
    std::vsnprintf(&line[0], line.size() + 1, format, args);
  va_end(args);
  std::lock_guard<std::mutex> guard(m_mutex);
  if (m_sink)
    m_sink(line.c_str());
}
