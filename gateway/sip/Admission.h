// Admission: what the gateway answers itself, before the part for a request's
// method sees it. In this order:
// - 420 Bad Extension, listing them in Unsupported, for a request whose
//   Require names an extension the gateway does not support
//   (Capabilities), before anything else, authentication included (RFC 3261
//   section 8.2.2.3). CANCEL is exempt, as the section says.
// - 200 with Allow, Accept and Supported for an OPTIONS to the gateway
//   itself (RFC 3261 section 11.2): one whose request URI has no user part,
//   or names one of the addresses the gateway listens on with a user that
//   denotes no identity there. A user there that does denote one is a
//   subscriber asked for, and redirected as any other: phones are called by
//   the gateway's address as often as by a domain. That holds only for the
//   sources the redirect server answers (--redirect-from): to any other,
//   every user at the gateway's address is the gateway, looked up by
//   nobody, since a 200 for nobody beside the Redirector's 403 for a
//   subscriber would tell a stranger who exists. Health checks that name a
//   user keep their 200 from anywhere. A source the redirect server
//   answers learns no more than an INVITE tells it (404 for nobody).
// - 481 for a request with a To tag other than REGISTER: it belongs to a
//   dialog, and a redirect server makes none (RFC 3261 section 12.2.2).
//   REGISTER is exempt because registration clients (libre's among them)
//   send their refreshes with the tag of the first answer.
// - 404 for a REGISTER whose request URI names no domain of a location
//   service, as the library finds the service for a host (RFC 3261
//   section 10.3, step 1: the registrar has no bindings for that domain).
//
// Keeps no state of its own; the listeners and the redirect server's source
// filter it is given outlive it. Runs on libre's thread.
#pragma once

#include "sip/Exchange.h"
#include "sip/Listeners.h"
#include "sip/SourceFilter.h"

class Admission {
 public:
  Admission(Listeners const& listeners, SourceFilter const& redirectSources)
      : m_listeners(listeners), m_redirectSources(redirectSources) {}

  // Whether the request has been answered here.
  bool answered(Exchange& exchange) const;

 private:
  bool unsupportedExtension(Exchange& exchange) const;
  bool toGateway(Exchange& exchange) const;
  bool registrarDomainUnknown(Exchange& exchange) const;

  Listeners const& m_listeners;
  SourceFilter const& m_redirectSources;
};
