// ExpiryRange: the registration lifetimes the registrar grants, in seconds:
// the shortest it accepts, the longest it grants and the one it gives a
// contact that asks for none.
//
// Decision: an inbound-registration face that has no lifetime range of its
// own or up its chain hands out 0, 4294967295 and 3600, which would grant
// 136 years to "Expires: 99999999999" and accept a registration refreshed
// every second. The gateway's own range then applies instead: 60 s at
// least (RFC 3261 section 10.2.8 suggests refreshing no more often; 423
// with Min-Expires below it), 3600 s at most and by default, each
// overridable on the command line. A configured range of exactly those
// three values is taken for none: it grants the same.
#pragma once

#include <cstdint>

struct ExpiryRange {
  static constexpr uint32_t kMinimum = 60;
  static constexpr uint32_t kMaximum = 3600;
  static constexpr uint32_t kDefault = 3600;

  uint32_t minimum = kMinimum;
  uint32_t maximum = kMaximum;
  uint32_t defaultLifetime = kDefault;

  // The range to apply for a face that reported these values: its own, or
  // gateway's when the face has none.
  static ExpiryRange forFace(unsigned int minimum,
                             unsigned int maximum,
                             unsigned int defaultLifetime,
                             ExpiryRange const& gateway) {
    if (minimum == 0 && maximum == UINT32_MAX && defaultLifetime == 3600)
      return gateway;
    return ExpiryRange{minimum, maximum, defaultLifetime};
  }

  // What a contact asking for requested seconds (present or not) is
  // granted; 0 stays 0, a removal.
  uint32_t grant(bool present, uint32_t requested) const {
    uint32_t const asked = present ? requested : defaultLifetime;
    return asked < maximum ? asked : maximum;
  }
};
