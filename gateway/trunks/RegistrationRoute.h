// RegistrationRoute: where a trunk's REGISTER goes, as the identity's
// outbound-registration face says: the Request-URI and the Route set of one
// attempt, from the face's forced destination, proxies and penalty box and
// from the registrar a 3xx named. Registering, retrying and learning are
// TrunkRegistrations'.
//
// Decisions, with their reasons:
// - The hops are, as for calls (OutboundRoute): a forced destination, which
//   replaces the proxies (manual: its address, its TLS address for a trunk
//   over TLS; registrar-address: the address the registrar last answered
//   from, and the proxies until one has answered); else the configured
//   proxies in order; else none, and the Request-URI's host is resolved.
//   libre sends a request to its first Route, so a forced destination is
//   reached as one (loose) Route and needs no DNS when it is numeric.
// - The face's dynamic proxy is not a hop of the REGISTER: it holds the
//   registrar's Service-Route, which is for the identity's other requests
//   (RFC 3608: a service route is learnt from, not used by, the
//   registration; an IMS client registers through its outbound proxy, not
//   its service route). The configured proxy it hides at index 0 is read
//   from the face, or the face it inherits, directly.
// - With the penalty box on, an attempt takes the first hop not boxed
//   (every hop when all are); a hop that let an attempt down (no answer,
//   transport error, 503) is boxed by the caller. Without it, always the
//   first hop: a trunk then waits for its first proxy to come back.
// - A registrar learnt from a 3xx (the face's dynamic registrar) is where
//   the next REGISTER goes: as its Request-URI when the face's request-URI
//   dynamic-registrar switch is on (RFC 3261 section 8.1.3.4: the request
//   retried at the Contact), else as the last Route after the hop, the
//   Request-URI staying the configured registrar's (for a registrar that
//   redirects the path but keeps the domain).
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "LS_IIdentity.h"
#include "LS_IRegistrationOutbound.h"
#include "trunks/PenaltyBox.h"

namespace RegistrationRoute {

// What the face configures, read when the trunk is found; a change of any
// of it makes the trunk register anew.
struct Configured {
  // The forced destination's hop alone, or the configured proxies' in
  // order; empty for none.
  std::vector<std::string> hops;
  // Forced destination "registrar-address": the registrar's address once
  // learnt, hops until then.
  bool toRegistrarAddress = false;
  bool penaltyBox = false;
  bool requestUriDynamic = false;
  // ";transport=tls" for a trunk over TLS, else empty.
  std::string transport;

  bool operator==(Configured const& other) const {
    return hops == other.hops && toRegistrarAddress == other.toRegistrarAddress &&
           penaltyBox == other.penaltyBox && requestUriDynamic == other.requestUriDynamic &&
           transport == other.transport;
  }
};

Configured read(LS_IIdentity* identity, LS_IRegistrationOutbound& face, bool secure);

struct Attempt {
  std::string requestUri;
  // The Route set, first hop first; empty: the Request-URI's host.
  std::vector<std::string> routes;
  // routes' first, what the penalty box keys; empty for none.
  std::string hop;
};

// registrarUri: the configured registrar's URI; dynamicRegistrar and
// registrarAddress: "HOST[:PORT]" of the registrar a 3xx named and of the
// address the registrar answered from, empty when none is known.
Attempt choose(Configured const& configured,
               std::string const& registrarUri,
               std::string const& dynamicRegistrar,
               std::string const& registrarAddress,
               PenaltyBox& box,
               uint64_t nowMs);

}  // namespace RegistrationRoute
