// ContactHeader: one contact of a REGISTER's Contact header, read into what
// the registrar keeps of it: the URI, every header parameter but "expires"
// as written (q, +sip.instance, reg-id, methods and any other, echoed in the
// 200 and kept with the binding), and the values it acts on.
//
// A q value outside RFC 3261's qvalue grammar ("0" to "1" with at most
// three decimals), an expires that is not a number or a URI the library
// refuses makes the contact malformed. A contact without q ranks as q=1:
// RFC 3261 gives it no preference relative to others, and a redirect must
// still put it somewhere; first, among equals, keeps it where a phone that
// states no preference expects to be.
//
// The header's syntax is libre's (sip_addr_decode, msg_param_decode,
// uri_params_apply); nothing here splits SIP text itself.
#pragma once

#include <cstdint>
#include <string>

#include "CNameAddr.h"
#include "sip/Libre.h"

struct ContactHeader {
  static constexpr unsigned int kNoQ = 1000;

  std::string uri;  // as written, without the angle brackets
  CNameAddr contact;
  // ";name=value" each, in the order written, "expires" left out.
  std::string parameters;
  bool hasExpires = false;
  uint32_t expires = 0;
  // In thousandths; kNoQ when the contact states none.
  unsigned int q = kNoQ;
  // +sip.instance without its quotes, and reg-id; empty when absent.
  std::string instance;
  std::string regId;

  // value: one contact, as libre splits a Contact header at its commas.
  // False when it is malformed (see above).
  static bool parse(pl const& value, ContactHeader& contact);
  // A delta-seconds value, as expires and the Expires header give it; one
  // beyond 32 bits saturates (RFC 3261 asks to take such a value as the
  // largest). False for anything but digits.
  static bool parseSeconds(pl const& value, uint32_t& seconds);
};
