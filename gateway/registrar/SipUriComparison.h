// SipUriComparison: whether two SIP or SIPS URIs are equal as RFC 3261
// section 19.1.4 defines it, which is how a registrar decides that a
// Contact names a binding it already holds (section 10.3, step 7). Text
// comparison is not enough: "sip:alice@HOST.example" and
// "sip:alice@host.example;transport=udp" are one binding, and two bindings
// for them would send callers to the same phone twice.
//
// The rules, all from that section: the schemes must be the same; the user
// and password compare case-sensitively, the rest case-insensitively, each
// after undoing %-escapes; a port given in one URI only never matches (the
// default port is not assumed); a user, ttl, method or maddr parameter in
// one URI only never matches, any other parameter in one URI only is
// ignored, and a parameter in both must have equal values; headers must be
// the same set with equal values. A text that does not parse as a SIP or
// SIPS URI equals nothing, itself included, so that a malformed contact can
// never take another's binding.
//
// Parsing is libre's (uri_decode and its parameter and escape helpers); no
// SIP grammar is written here. Pure functions, no state.
#pragma once

#include "sip/Libre.h"

namespace SipUriComparison {

bool equal(pl const& a, pl const& b);

}  // namespace SipUriComparison
