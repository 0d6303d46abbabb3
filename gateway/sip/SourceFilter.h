// SourceFilter: a set of networks (CIDR, IPv4 or IPv6) that a request's
// source address is matched against. Empty, it admits every source, so that
// an option that fills it (--redirect-from, for the redirect server and for
// what Admission tells about subscribers) changes nothing until it is given.
// What a filtered source is refused is its user's to decide.
//
// A mapped IPv4 address (::ffff:a.b.c.d) is matched as the IPv4 address it
// is, so that a dual-stack socket does not let anyone through or keep
// anyone out by the form of its address.
#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "sip/Libre.h"

class SourceFilter {
 public:
  // "ADDR/BITS" or "ADDR" (a single host); false, leaving the filter as it
  // was, for anything else.
  bool allow(std::string const& cidr);
  bool admits(sa const& source) const;

 private:
  struct Network {
    std::array<uint8_t, 16> address;  // IPv4 as a mapped IPv6 address
    unsigned int bits;                // of the 128, 96 + n for IPv4
  };
  static std::array<uint8_t, 16> bytesOf(sa const& address);

  std::vector<Network> m_networks;
};
