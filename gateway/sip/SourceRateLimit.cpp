#include "sip/SourceRateLimit.h"

#include <iostream>

#include "sip/MonotonicClock.h"

bool SourceRateLimit::admit(sip& stack, sip_msg const& request) {
  switch (m_throttle.count(request.src, MonotonicClock::nowMs())) {
    case SourceThrottle::Verdict::PASSED:
      return true;
    case SourceThrottle::Verdict::HELD:
      return false;
    case SourceThrottle::Verdict::HELD_NOW:
      break;
  }
  char address[64];
  re_snprintf(address, sizeof address, "%j", &request.src);
  std::cerr << "location-gateway: " << address << " sends too many requests, dropped for " << kHoldMs / 1000
            << " s" << std::endl;
  sip_replyf(&stack, &request, 503, "Service Unavailable", "Retry-After: %llu\r\nContent-Length: 0\r\n\r\n",
             static_cast<unsigned long long>(kHoldMs / 1000));
  return false;
}
