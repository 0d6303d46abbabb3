#include "sip/Admission.h"

#include <string>

#include "CHostPort.h"
#include "sip/Capabilities.h"
#include "sip/HeaderValues.h"

namespace {

// The request URI's host and port as the library reads a host, brackets
// around an IPv6 address included.
CHostPort hostPortOf(uri const& target) {
  std::string host = textOf(target.host);
  if (target.af == AF_INET6)
    host = "[" + host + "]";
  if (target.port != 0)
    host += ":" + std::to_string(target.port);
  CHostPort hostPort;
  hostPort.ParseUriHostPort(host.data(), host.size());
  return hostPort;
}

}  // namespace

bool Admission::answered(Exchange& exchange) const {
  sip_msg const& message = exchange.request();
  if (pl_strcmp(&message.met, "CANCEL") != 0 && unsupportedExtension(exchange))
    return true;
  if (pl_strcmp(&message.met, "OPTIONS") == 0 && toGateway(exchange))
    return true;
  if (pl_strcmp(&message.met, "REGISTER") == 0)
    return registrarDomainUnknown(exchange);
  if (pl_isset(&message.to.tag)) {
    exchange.answer(481, "Call/Transaction Does Not Exist");
    return true;
  }
  return false;
}

bool Admission::unsupportedExtension(Exchange& exchange) const {
  std::string unsupported;
  forEachHeaderValue(exchange.request(), SIP_HDR_REQUIRE, [&](sip_hdr const& header) {
    // The stack bounds a message, and so the answer that lists its tags.
    if (!Capabilities::supports(header.val))
      unsupported += (unsupported.empty() ? "" : ", ") + textOf(header.val);
    return true;
  });
  if (unsupported.empty())
    return false;
  exchange.answer(420, "Bad Extension", "Unsupported: " + unsupported + "\r\n" + Capabilities::kSupported);
  return true;
}

bool Admission::toGateway(Exchange& exchange) const {
  sip_msg const& message = exchange.request();
  bool own = !pl_isset(&message.uri.user);
  if (!own && m_listeners.names(message.uri)) {
    CNameAddr target;
    String error;
    own = !m_redirectSources.admits(message.src) ||
          (target.Parse(message.ruri.p, message.ruri.l) &&
           !exchange.clock().measure([&] { return exchange.session().resolve(error, target); }));
  }
  if (!own)
    return false;
  exchange.answer(200, "OK",
                  std::string(Capabilities::kAllow) + Capabilities::kAccept + Capabilities::kSupported);
  return true;
}

bool Admission::registrarDomainUnknown(Exchange& exchange) const {
  CHostPort const domain = hostPortOf(exchange.request().uri);
  String error;
  RefPtr<LS_ILocationService> service;
  if (!domain.GetHost().isEmpty())
    service = exchange.clock().measure([&] { return exchange.session().serviceFor(error, domain); });
  if (service)
    return false;
  exchange.setResult("\"" + error.str() + "\"");
  exchange.answer(404, "Not Found");
  return true;
}
