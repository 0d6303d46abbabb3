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
                             std::function<bool(std::string const& hop)> const& refused)
    : m_caller(caller), m_from(from), m_box(box), m_clock(clock) {
  RefPtr<LS_IOutbound> face;
  Transport transport = Transport::ANY;
  std::vector<std::string> hops;
  m_clock.measure([&] {
    LS_getFaceIf(caller, LS_IdentityFace::CALL_OUTBOUND, face);
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
    for (unsigned int index = 0; index < face->getNumberOfProxies(); ++index) {
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
