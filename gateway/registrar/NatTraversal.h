// NatTraversal: where a binding's calls must go when its phone is behind a
// NAT, as Kamailio's fix_nated_register decides it for a proxy. A phone
// behind NAT registers the Contact it knows, its private address, which
// nobody outside its network can reach; the REGISTER itself came from the
// NAT's public mapping, which can.
//
// Decisions, with their reasons:
// - A Contact is taken as NATed when its host is an IP address in one of
//   the ranges no NAT forwards to from outside: private (RFC 1918),
//   shared (RFC 6598, carrier-grade NAT), link-local or loopback, and the
//   REGISTER came from another address or port (5060 when the Contact
//   names none). Over a connection (TCP, TLS, WebSocket) only the address
//   counts: the connection's source port is one the phone's system drew
//   for it, never the port the phone listens on, so a phone on the LAN
//   would otherwise be sent to a port nobody listens on. A name is never NATed: resolving it here would cost
//   a DNS lookup per registration, and a phone that has a name is reachable by it. IPv6 unique local
//   addresses (fc00::/7) are left alone: IPv6 needs no NAT, and such an address is routable within its site.
// - The target is the Contact with its host and port replaced by the
//   source's; user, parameters and headers stay, so that the phone still
//   recognises the request as its own.
//
// Pure functions on libre's parsing; no state.
#pragma once

#include <string>

#include "sip/Libre.h"

namespace NatTraversal {

// Whether address lies in a range that is reachable only from inside its
// own network (see above).
bool isUnreachable(sa const& address);

// The contact URI calls must go to when its registration came from
// source over transport: true with the rewritten URI in target when the contact is NATed,
// false (target untouched) when it is to be used as it is.
bool natedTarget(pl const& contactUri, sa const& source, sip_transp transport, std::string& target);

// The contact URI with its host and port replaced by source's.
bool atSource(pl const& contactUri, sa const& source, std::string& target);

// Where in-dialog requests reach a phone over the flow it came on: the
// contact URI at source, with the flow's transport when the URI names
// none. Empty when the URI cannot be read.
std::string flowTarget(pl const& contactUri, sa const& source, sip_transp transport);

}  // namespace NatTraversal
