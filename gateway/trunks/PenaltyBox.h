// PenaltyBox: the proxies that failed lately a request sent on an
// identity's behalf (no answer within the face's transaction timeout, a
// transport error, or 503), so that requests from a face with the penalty
// box switched on skip them for a while instead of each waiting out the
// same timeout. What a proxy is, and which failures count, is for the
// calls and the message-waiting subscriptions OutboundRoute's and for the
// registrations RegistrationRoute's to say; this only keeps the time. One
// box serves them all: a proxy that let a REGISTER down is as dead for the
// next call or SUBSCRIBE.
//
// Decision: a proxy stays boxed for kBoxMs, 60 s, from its last failure.
// Long enough that a burst of calls pays the timeout of a dead proxy once,
// not once per call; short enough that a proxy back from a restart gets
// calls within a minute, since nothing probes it meanwhile. An answer from
// a boxed proxy (tried because every proxy was boxed) lets it out at once.
//
// Proxies are keyed by the route text a call is sent with, transport
// included: the same host over UDP and over TLS are different paths. The
// time is passed in, so that the rules can be checked without waiting.
// Owned by TrunkRegistrations, shared by every face; one thread, libre's.
#pragma once

#include <cstdint>
#include <map>
#include <string>

class PenaltyBox {
 public:
  static constexpr uint64_t kBoxMs = 60 * 1000;

  void failed(std::string const& proxy, uint64_t nowMs);
  void answered(std::string const& proxy) { m_boxed.erase(proxy); }
  bool isBoxed(std::string const& proxy, uint64_t nowMs);

 private:
  // Until when each proxy stays boxed; an entry past its time goes when
  // it is next asked about.
  std::map<std::string, uint64_t> m_boxed;
};
