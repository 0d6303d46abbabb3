// Captures the lines of the library's debug monitor for the lifetime of the
// object, so a test can assert the exact log text.
#pragma once

#include <string>
#include <vector>

#include "DebugMonitor.h"
#include "LS_Debug.h"
#include "String.h"

class LogCapture {
 public:
  LogCapture() {
    DebugMonitor::enable(LS_DEBUG_MONITOR_ID, LS_DEBUG_LEVEL,
                         [this](char const* line) { m_lines.emplace_back(line); });
  }
  ~LogCapture() { DebugMonitor::disable(LS_DEBUG_MONITOR_ID); }
  LogCapture(LogCapture const&) = delete;
  LogCapture& operator=(LogCapture const&) = delete;

  std::vector<std::string> const& lines() const { return m_lines; }
  void clear() { m_lines.clear(); }
  bool contains(std::string const& line) const {
    for (auto const& candidate : m_lines) {
      if (candidate == line)
        return true;
    }
    return false;
  }

 private:
  std::vector<std::string> m_lines;
};

// printf into a std::string, for expected log lines with addresses.
template <class... Args>
std::string formatted(char const* format, Args... args) {
  return String().format(format, args...).str();
}
