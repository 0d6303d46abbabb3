#include "trunks/RegistrationRoute.h"

#include "LS_IOutbound.h"
#include "LS_IOutboundConfig.h"
#include "LS_IdentityFace.h"
#include "trunks/OutboundHops.h"

namespace {

using OutboundHops::hopOf;
using OutboundHops::Transport;

// The first proxy of the list the face has, its own or the one it
// inherits, past a dynamic proxy that hides it.
bool firstConfiguredProxy(LS_IIdentity* identity, CHostPort& address, CHostPort& tlsAddress) {
  RefPtr<LS_IIdentity> each = identity;
  while (each) {
    RefPtr<LS_IOutboundConfig> face;
    LS_getFaceIf(each.get(), LS_IdentityFace::REGISTRATION_OUTBOUND, face);
    unsigned int count = 0;
    bool strictRoute = false;
    if (face && face->getNumberOfConfigProxies(count).isSuccess())
      return count > 0 && face->getConfigProxy(0, address, tlsAddress, strictRoute).isSuccess();
    RefPtr<LS_IIdentity> base;
    if (each->getBaseIdentity(base).isFailure())
      return false;
    each = base;
  }
  return false;
}

std::vector<std::string> proxyHops(LS_IIdentity* identity, LS_IOutbound& face, Transport transport) {
  std::vector<std::string> hops;
  CHostPort dynamic;
  bool strictRoute = false;
  bool const hidden = face.getDynamicProxy(dynamic, strictRoute).isSuccess();
  for (unsigned int index = 0; index < face.getNumberOfProxies(); ++index) {
    CHostPort address;
    CHostPort tlsAddress;
    bool const found = index == 0 && hidden
                           ? firstConfiguredProxy(identity, address, tlsAddress)
                           : face.getProxy(index, address, tlsAddress, strictRoute).isSuccess();
    std::string const hop = found ? hopOf(address, tlsAddress, transport) : std::string();
    if (!hop.empty())
      hops.push_back(hop);
  }
  return hops;
}

}  // namespace

namespace RegistrationRoute {

Configured read(LS_IIdentity* identity, LS_IRegistrationOutbound& registration, bool secure) {
  Configured configured;
  Transport const transport = secure ? Transport::TLS : Transport::ANY;
  configured.transport = secure ? ";transport=tls" : "";
  RefPtr<LS_IOutbound> face;
  registration.queryIf(face);
  if (!face)
    return configured;
  configured.penaltyBox = face->getPenaltyBox();
  configured.requestUriDynamic = face->getRequestUriDynamic();
  LS_ForcedDestination forced;
  if (face->getForcedDestination(forced).isSuccess()) {
    if (forced.type == LS_ForcedDestination::REGISTRAR_ADDRESS)
      configured.toRegistrarAddress = true;
    std::string const hop = forced.type == LS_ForcedDestination::MANUAL
                                ? hopOf(forced.udpTcpAddress, forced.tlsDestination, transport)
                                : std::string();
    if (!hop.empty()) {
      configured.hops.push_back(hop);
      return configured;
    }
  }
  configured.hops = proxyHops(identity, *face, transport);
  return configured;
}

Attempt choose(Configured const& configured,
               std::string const& registrarUri,
               std::string const& dynamicRegistrar,
               std::string const& registrarAddress,
               PenaltyBox& box,
               uint64_t nowMs) {
  Attempt attempt;
  if (configured.toRegistrarAddress && !registrarAddress.empty())
    attempt.hop = "sip:" + registrarAddress + configured.transport;
  for (size_t index = 0; attempt.hop.empty() && index < configured.hops.size(); ++index)
    if (!configured.penaltyBox || !box.isBoxed(configured.hops[index], nowMs))
      attempt.hop = configured.hops[index];
  if (attempt.hop.empty() && !configured.hops.empty())
    attempt.hop = configured.hops.front();
  if (!attempt.hop.empty())
    attempt.routes.push_back(attempt.hop);
  attempt.requestUri = registrarUri;
  if (dynamicRegistrar.empty())
    return attempt;
  std::string const dynamic = "sip:" + dynamicRegistrar + configured.transport;
  if (configured.requestUriDynamic)
    attempt.requestUri = dynamic;
  else
    attempt.routes.push_back(dynamic);
  return attempt;
}

}  // namespace RegistrationRoute
