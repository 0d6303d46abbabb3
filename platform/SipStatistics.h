// SipStatistics: the SIP stack's process-wide counters, of which the system
// moves one: the number of contacts registered with the gateway. Other
// counters of the stack and any reporting of them do not belong here.
#pragma once

#include "Export.h"

#include <atomic>

// One object per process, s_sipStatistics. The counter is atomic because
// several threads register and unregister contacts at once; each call is
// one indivisible step, and nothing orders it against other memory.
class LS_EXPORT SipStatistics {
 public:
  constexpr SipStatistics() = default;
  SipStatistics(SipStatistics const&) = delete;
  SipStatistics& operator=(SipStatistics const&) = delete;

  void onInboundRegAdded() { m_inboundRegistrations.fetch_add(1, std::memory_order_relaxed); }
  void onInboundRegRemoved() { m_inboundRegistrations.fetch_sub(1, std::memory_order_relaxed); }
  // For hosts and tests; the system itself never reads it back.
  int getInboundRegistrations() const { return m_inboundRegistrations.load(std::memory_order_relaxed); }

 private:
  std::atomic<int> m_inboundRegistrations{0};
};

// Constant-initialised, so it is usable from other objects' static
// initialisation and destruction.
extern LS_EXPORT SipStatistics s_sipStatistics;
