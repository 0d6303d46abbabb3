#include "trunks/OutboundRoute.h"

#include <iostream>

#include "LS_CredentialLookup.h"
#include "LS_IOutbound.h"
#include "LS_IdentityFace.h"
#include "sip/Libre.h"
#include "sip/MonotonicClock.h"
#include "trunks/OutboundHops.h"

namespace {

using OutboundHops::hopOf;
using OutboundHops::Transport;

// The Service-Route the caller's registration learnt (the dynamic proxy of
// its outbound-registration face) as a hop; empty when it has none.
std::string serviceRouteOf(LS_IIdentity* caller, Transport transport) {
  RefPtr<LS_IOutbound> registration;
  LS_getFaceIf(caller, LS_IdentityFace::REGISTRATION_OUTBOUND, registration);
  CHostPort address;
  bool strictRoute = false;
  if (!registration || registration->getDynamicProxy(address, strictRoute).isFailure())
    return std::string();
  return hopOf(address, address, transport);
}

// The host of a hop "sip:HOST[:PORT];...", for the TLS certificate check.
std::string hostOf(std::string const& hop) {
  pl text;
  pl_set_str(&text, hop.c_str());
  uri parsed;
  if (uri_decode(&parsed, &text) != 0)
    return std::string();
  return std::string(parsed.host.p, parsed.host.l);
}

}  // namespace

OutboundRoute::OutboundRoute(LS_IIdentity* caller,
                             CNameAddr const& from,
                             TrunkRegistrations& trunks,
                             PenaltyBox& box,
                             LibraryClock& clock,
                             std::function<bool(std::string const& hop)> const& refused,
                             LS_IdentityFace::Type faceType)
    : m_caller(caller), m_from(from), m_box(box), m_clock(clock) {
  RefPtr<LS_IOutbound> face;
  Transport transport = Transport::ANY;
  std::vector<std::string> hops;
  m_clock.measure([&] {
    LS_getFaceIf(caller, faceType, face);
    if (!face)
      return;
    transport = OutboundHops::transportOf(*face);
    m_penaltyBox = face->getPenaltyBox();
    LS_ForcedDestination forced;
    if (face->getForcedDestination(forced).isSuccess()) {
      std::string const hop = forced.type == LS_ForcedDestination::REGISTRAR_ADDRESS
                                  ? trunks.registrarOf(caller)
                                  : hopOf(forced.udpTcpAddress, forced.tlsDestination, transport);
      if (!hop.empty())
        return hops.push_back(hop);
    }
    // The Service-Route takes the place of the first proxy, as the face's
    // own dynamic proxy would; that one, when set, wins.
    CHostPort ownDynamic;
    bool ownStrict = false;
    std::string const serviceRoute = face->getDynamicProxy(ownDynamic, ownStrict).isFailure()
                                         ? serviceRouteOf(caller, transport)
                                         : std::string();
    if (!serviceRoute.empty())
      hops.push_back(serviceRoute);
    for (unsigned int index = serviceRoute.empty() ? 0 : 1; index < face->getNumberOfProxies(); ++index) {
      CHostPort address;
      CHostPort tlsAddress;
      bool strictRoute = false;
      if (face->getProxy(index, address, tlsAddress, strictRoute).isFailure())
        continue;
      std::string const hop = hopOf(address, tlsAddress, transport);
      if (!hop.empty())
        hops.push_back(hop);
    }
  });
  if (hops.empty())
    hops.push_back(std::string());
  uint64_t const nowMs = MonotonicClock::nowMs();
  std::vector<std::string> boxed;
  for (std::string const& hop : hops) {
    if (!hop.empty() && refused(hop))
      continue;
    std::string error;
    if (hop.find(";transport=tls") != std::string::npos && !trunks.verifyTls(hostOf(hop), error)) {
      std::cerr << "location-gateway: no outbound call over TLS to " << hop << ": " << error << std::endl;
      continue;
    }
    if (m_penaltyBox && m_box.isBoxed(hop, nowMs))
      boxed.push_back(hop);
    else
      m_hops.push_back(hop);
  }
  if (m_hops.empty())
    m_hops = std::move(boxed);
}

bool OutboundRoute::failOver(uint16_t code, bool heard, uint64_t nowMs) {
  if (!available() || (heard && code != 503))
    return false;
  if (m_penaltyBox && !route().empty())
    m_box.failed(route(), nowMs);
  ++m_current;
  return available();
}

void OutboundRoute::answered() {
  if (available())
    m_box.answered(route());
}

int OutboundRoute::onChallenge(char** user, char** password, char const* realm, void* argument) {
  OutboundRoute& route = *static_cast<OutboundRoute*>(argument);
  String error;
  String userName;
  String secret;
  XCode const found = route.m_clock.measure([&] {
    return LS_getOutboundAuthenticationCredentials(error, userName, secret, route.m_caller.get(),
                                                   route.m_from, LS_AuthenticationProtocol::HTTP, realm,
                                                   nullptr);
  });
  // The challenge is then the attempt's final answer (libre's EAUTH).
  if (found.isFailure())
    return EAUTH;
  int result = str_dup(user, userName.c_str());
  if (result == 0)
    result = str_dup(password, secret.c_str());
  return result;
}
