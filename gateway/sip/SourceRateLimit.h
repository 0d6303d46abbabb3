// SourceRateLimit: --source-rate N, what Kamailio's pike module does: a
// source address (any port) sending more than N requests within a second is
// answered 503 with Retry-After once, then its requests are dropped unread
// by the library for kHoldMs. One line on standard error when a hold
// starts, never one per packet.
//
// Off by default: phones behind one NAT share a source address, and so does
// a load test from one machine; an operator sets N above what its largest
// site sends. Dropping rather than answering every request keeps a flood
// from costing a send per packet; the one 503 tells a well-behaved peer
// when to come back. Neither the 503 nor a drop gets a request log line:
// the one line of the hold says it. Runs on libre's thread, before anything else looks at
// the request.
#pragma once

#include <cstdint>

#include "sip/Libre.h"
#include "sip/SourceThrottle.h"

class SourceRateLimit {
 public:
  static constexpr uint64_t kHoldMs = 5000;
  static constexpr size_t kSources = 4096;

  explicit SourceRateLimit(uint32_t perSecond) : m_throttle(perSecond, 1000, kHoldMs, kSources) {}

  // False when the request is not to be handled (answered or dropped here).
  bool admit(sip& stack, sip_msg const& request);

 private:
  SourceThrottle m_throttle;
};
