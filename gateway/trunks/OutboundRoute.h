// OutboundRoute: where one call that leaves the gateway is sent, and with
// which credentials, as the caller identity's call-outbound face says: the
// hops to try in order, which one is being tried, when to give up on it,
// and the answer to the carrier's 401 or 407. Which requests go out at all,
// and whose they are, is Calls' to say; the dialogs are Call's.
//
// Decisions, with their reasons:
// - The hops are the face's effective proxies in order (index 0 may be the
//   dynamic proxy), each reached over the transport the face prefers: the
//   first of a preference list, or the forced one; over TLS at the proxy's
//   TLS address when it has one. Without a preference libre chooses (UDP,
//   or what the host's NAPTR records say). A forced destination replaces
//   the proxies: manual, its UDP/TCP address, or its TLS address when the
//   transport is TLS; registrar-address, the registrar the caller itself
//   registers at as a trunk, as TrunkRegistrations builds it (a subscriber
//   has no registrar of its own to name). A forced destination that names
//   no address for the transport, or a caller that is no trunk, leaves the
//   proxies in charge rather than fail every call. Without proxies the
//   INVITE goes where its Request-URI says.
// - The Service-Route the caller's own registration learnt (RFC 3608, the
//   dynamic proxy of its outbound-registration face, see
//   TrunkRegistrations) takes the place of the call face's first proxy, as
//   the face's own dynamic proxy would: the carrier that registered the
//   identity named the way its requests take. The call face's own dynamic
//   proxy, when it has one, wins; a forced destination wins over both.
// - A hop is given up, and the next one tried, when it never answered (the
//   INVITE transaction timeout ran out, or a transport error) or answered
//   503. Any other final answer, and a timeout after a provisional one, is
//   the callee's and ends the call: the proxy is alive.
// - With the face's penalty box on, a hop given up is boxed (PenaltyBox) and
//   later calls skip it, unless every hop is boxed: then all are tried.
// - A proxy configured for strict routing is routed loosely too: libre's
//   dialogs route loosely only (as the trunks' registrations do).
// - A TLS hop's carrier is verified as the trunks' are (TrunkTls); a hop
//   the verifying transport cannot be made for is dropped.
// - The INVITE transaction timeout bounds each attempt (Call's branch
//   timeout); 0 is taken as the default, 32 s.
// - The non-INVITE transaction timeout is not applied: libre's session
//   layer sends the BYE itself and takes no timeout for it nor for INFO,
//   running every non-INVITE transaction on its fixed 64*T1.
// - Use-flows asks nothing more of libre: it sends every request to an
//   address over the one connection it keeps there, the registration's
//   included, and from its one UDP socket.
// - The VoIP and tone set profiles name media settings, and the relay
//   neither touches the media nor plays tones; the SIP profile names
//   settings of a SIP stack the gateway does not have. None is applied.
// - Credentials come from LS_getOutboundAuthenticationCredentials for the
//   challenge's realm, for the caller identity and its From address; libre
//   asks once per realm and branch, so a carrier that refuses them
//   challenges again and that 401 or 407 ends the attempt.
//
// Owned by its Call; it holds a reference to the caller identity and
// borrows the penalty box (the trunks', shared with their registrations),
// the trunks and the clock, which outlive every call. Everything runs on libre's thread.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "CNameAddr.h"
#include "LS_IIdentity.h"
#include "LS_IdentityFace.h"
#include "RefPtr.h"
#include "sip/LibraryClock.h"
#include "trunks/PenaltyBox.h"
#include "trunks/TrunkRegistrations.h"

class OutboundRoute {
 public:
  // from: the caller's From address, which credentials held under
  // "DEFAULT" present as user name. refused: hops not to use (one naming
  // the gateway itself would bring the call back as a new one). face: the
  // outbound face whose hops these are; a subscription sent on the
  // identity's behalf goes by its message-waiting face, whose proxies,
  // transport, forced destination and penalty box are read the same way.
  OutboundRoute(LS_IIdentity* caller,
                CNameAddr const& from,
                TrunkRegistrations& trunks,
                PenaltyBox& box,
                LibraryClock& clock,
                std::function<bool(std::string const& hop)> const& refused,
                LS_IdentityFace::Type face = LS_IdentityFace::CALL_OUTBOUND);
  OutboundRoute(OutboundRoute const&) = delete;
  OutboundRoute& operator=(OutboundRoute const&) = delete;

  // Whether a hop is left to try.
  bool available() const { return m_current < m_hops.size(); }
  // The route the current hop is reached by, "sip:HOST[:PORT][;transport=T]";
  // empty for the Request-URI's own host.
  std::string const& route() const { return m_hops[m_current]; }

  // The attempt at the current hop ended with code (408 for a timeout, 503
  // for a transport error); heard: whether the hop sent any answer, a
  // provisional one included. True when that gives the hop up and another
  // one is now current.
  bool failOver(uint16_t code, bool heard, uint64_t nowMs);
  // The current hop answered.
  void answered();

  // libre's sip_auth_h, with the route as argument.
  static int onChallenge(char** user, char** password, char const* realm, void* route);

 private:
  RefPtr<LS_IIdentity> m_caller;
  CNameAddr m_from;
  PenaltyBox& m_box;
  LibraryClock& m_clock;
  std::vector<std::string> m_hops;
  size_t m_current = 0;
  bool m_penaltyBox = false;
};
