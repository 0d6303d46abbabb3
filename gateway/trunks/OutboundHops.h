// OutboundHops: the text of a hop that a request sent on an identity's
// behalf is routed by, as an outbound face names it: which transport the
// face prefers, and "sip:HOST[:PORT][;transport=T]" for one of its
// addresses. Shared by the calls' routes (OutboundRoute) and the trunks'
// registrations (RegistrationRoute); which hops a request tries, and in
// which order, is theirs to say.
#pragma once

#include <string>

#include "CHostPort.h"
#include "LS_IOutbound.h"

namespace OutboundHops {

enum class Transport { ANY, UDP, TCP, TLS };

// The first transport of the face's preference list, or the forced one;
// ANY without a preference (libre then chooses: UDP, or what the host's
// NAPTR records say).
Transport transportOf(LS_IOutbound& face);

// address, or for TLS tlsAddress when it has a host, as a hop with the
// transport's parameter; empty when neither names a host.
std::string hopOf(CHostPort const& address, CHostPort const& tlsAddress, Transport transport);

}  // namespace OutboundHops
