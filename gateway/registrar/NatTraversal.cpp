#include "registrar/NatTraversal.h"

namespace {

bool inRange(uint32_t address, uint32_t network, unsigned int bits) {
  uint32_t const mask = bits == 0 ? 0 : ~uint32_t{0} << (32 - bits);
  return (address & mask) == network;
}

int printUri(struct re_printf* printer, void* address) {
  return uri_encode(printer, static_cast<uri const*>(address));
}

}  // namespace

bool NatTraversal::isUnreachable(sa const& address) {
  if (sa_af(&address) == AF_INET) {
    uint32_t const ip = sa_in(&address);
    return inRange(ip, 0x0a000000, 8) || inRange(ip, 0xac100000, 12) || inRange(ip, 0xc0a80000, 16) ||
           inRange(ip, 0x64400000, 10) || inRange(ip, 0xa9fe0000, 16) || inRange(ip, 0x7f000000, 8);
  }
  return sa_is_linklocal(&address) || sa_is_loopback(&address);
}

bool NatTraversal::natedTarget(pl const& contactUri,
                               sa const& source,
                               sip_transp transport,
                               std::string& target) {
  uri contact;
  sa host;
  if (uri_decode(&contact, &contactUri) != 0 ||
      sa_set(&host, &contact.host, contact.port ? contact.port : 5060) != 0)
    return false;
  bool const connection = transport != SIP_TRANSP_UDP;
  if (!isUnreachable(host) || sa_cmp(&host, &source, connection ? SA_ADDR : SA_ALL))
    return false;
  return atSource(contactUri, source, target);
}

bool NatTraversal::atSource(pl const& contactUri, sa const& source, std::string& target) {
  uri contact;
  char address[64];
  if (uri_decode(&contact, &contactUri) != 0 || sa_ntop(&source, address, sizeof address) != 0)
    return false;
  pl_set_str(&contact.host, address);
  contact.af = sa_af(&source);
  contact.port = sa_port(&source);
  char* text = nullptr;
  if (re_sdprintf(&text, "%H", printUri, &contact) != 0)
    return false;
  target = text;
  mem_deref(text);
  return true;
}

std::string NatTraversal::flowTarget(pl const& contactUri, sa const& source, sip_transp transport) {
  std::string target;
  if (!atSource(contactUri, source, target))
    return target;
  // The transport the flow runs over, whatever the Contact said.
  pl value;
  pl_set_str(&value, target.c_str());
  uri parsed;
  pl transportParameter;
  if (uri_decode(&parsed, &value) == 0 &&
      msg_param_decode(&parsed.params, "transport", &transportParameter) != 0)
    target += sip_transp_param(transport);
  return target;
}
