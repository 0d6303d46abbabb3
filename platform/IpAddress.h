// IpAddress: an IPv4 or IPv6 address with a net mask, as a filter rule
// names the peers it accepts or denies. The empty address means "any".
// Matching peers against rules belongs to the SIP side, not here.
#pragma once

#include "Export.h"

#include "String.h"

// A value type in the utility library's style. The net mask must be of the
// address's family and contiguous (ones, then zeros): a filter rule stands
// for a subnet, and a mask with holes is almost always a typing error that
// would silently admit or block unrelated peers.
class LS_EXPORT IpAddress {
 public:
  // Empty: any address.
  IpAddress() = default;

  // Takes a numeric address and its mask. An empty address with an empty
  // mask gives the empty value; an empty mask with an address gives the
  // host mask (all ones). Malformed text (either part unparsable, a zero
  // byte inside, families that differ, a mask with holes, a mask without
  // an address) gives the empty value and false. The address is kept as
  // given, bits outside the mask included.
  bool set(String const& address, String const& netMask);

  bool isEmpty() const { return m_family == Family::None; }
  // Canonical numeric texts ("10.0.0.1", "2001:db8::1"); empty texts for
  // the empty value.
  void getIpAddrAsString(String& out) const;
  void getNetMaskAsString(String& out) const;

  bool operator==(IpAddress const& other) const;

 private:
  enum class Family : unsigned char { None, V4, V6 };

  void toString(unsigned char const* bytes, String& out) const;

  Family m_family = Family::None;
  // Network byte order; IPv4 uses the first four bytes, the rest stay 0.
  unsigned char m_address[16] = {};
  unsigned char m_netMask[16] = {};
};
