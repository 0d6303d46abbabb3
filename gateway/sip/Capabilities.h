// Capabilities: what the gateway tells peers it does, as header lines for its
// answers (Allow, Supported, Accept), and which SIP extensions it supports.
// One place, so that what an answer claims and what Admission enforces
// cannot drift apart.
//
// Decisions, with their reasons:
// - No option tag is supported, so Supported is sent empty (RFC 3261
//   allows that; it says "none") and every Require gets 420.
//   - path (RFC 3327): the registrar could store a Path, but it serves calls
//     as a redirect server, and a 302 carries contacts only, never a route
//     set, so a caller redirected to a contact registered through a proxy
//     would bypass the very proxy the Path names. Honouring Require: path
//     would accept a registration that calls then cannot use.
//   - outbound (RFC 5626): the registrar keeps a binding per instance and
//     reg-id and redirects NATed phones to their source, but a redirect
//     server never sends over the phone's flow, which is the extension's
//     point; a phone told "outbound" would rely on it.
//   - gruu (RFC 5627): no GRUU is minted.
// - Accept is "*/*": no request is refused for its body; the gateway never
//   reads one (a redirected INVITE's SDP goes on with the caller).
#pragma once

#include "sip/Libre.h"

namespace Capabilities {

// The methods accepted: those the gateway registers in the front-end's
// method table, ACK (never answered) and CANCEL (481 from the front-end).
constexpr char kAllow[] = "Allow: REGISTER, INVITE, ACK, CANCEL, MESSAGE, SUBSCRIBE, OPTIONS\r\n";
constexpr char kSupported[] = "Supported:\r\n";
constexpr char kAccept[] = "Accept: */*\r\n";

// Whether the option tag of a Require names an extension the gateway
// supports: none, see above.
inline bool supports(pl const&) {
  return false;
}

}  // namespace Capabilities
