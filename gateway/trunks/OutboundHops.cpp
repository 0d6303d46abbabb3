#include "trunks/OutboundHops.h"

namespace OutboundHops {

Transport transportOf(LS_IOutbound& face) {
  LS_ProtocolConfig::Type protocol = LS_ProtocolConfig::PREFERRED_NONE;
  if (face.getPreferredProtocol(protocol).isFailure())
    return Transport::ANY;
  switch (protocol) {
    case LS_ProtocolConfig::PREFERRED_UDP_TCP_TLS:
    case LS_ProtocolConfig::PREFERRED_UDP_TLS_TCP:
    case LS_ProtocolConfig::FORCED_UDP:
      return Transport::UDP;
    case LS_ProtocolConfig::PREFERRED_TCP_UDP_TLS:
    case LS_ProtocolConfig::PREFERRED_TCP_TLS_UDP:
    case LS_ProtocolConfig::FORCED_TCP:
      return Transport::TCP;
    case LS_ProtocolConfig::PREFERRED_TLS_UDP_TCP:
    case LS_ProtocolConfig::PREFERRED_TLS_TCP_UDP:
    case LS_ProtocolConfig::FORCED_TLS:
      return Transport::TLS;
    default:
      return Transport::ANY;
  }
}

std::string hopOf(CHostPort const& address, CHostPort const& tlsAddress, Transport transport) {
  CHostPort const& chosen =
      transport == Transport::TLS && !tlsAddress.GetHost().isEmpty() ? tlsAddress : address;
  if (chosen.GetHost().isEmpty())
    return std::string();
  std::string hop = std::string("sip:") + chosen.GetHost().c_str();
  if (chosen.GetPort() != 0)
    hop += ":" + std::to_string(chosen.GetPort());
  static char const* const kParameters[] = {"", ";transport=udp", ";transport=tcp", ";transport=tls"};
  return hop + kParameters[static_cast<int>(transport)];
}

}  // namespace OutboundHops
