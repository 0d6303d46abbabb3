// Redirector: the requests for a user that the gateway answers as a redirect
// server (INVITE, MESSAGE, SUBSCRIBE, OPTIONS with a user part). The request
// URI names the identity; the contacts in effect on its inbound-registration
// face go back in a 302, and an identity without any gets 480. Nothing is
// proxied; no dialog is kept.
//
// Order: the static contacts first, as configured; then the registered
// ones, highest q first (RFC 3261 section 16.6 tries the highest q first,
// and a caller's UA follows the order it is given), each with its q. The
// registrar files a contact's q as its priority in thousandths, 1000 for a
// contact registered without one; registrations of equal q keep the face's
// order, oldest first.
//
// A source its SourceFilter does not admit gets 403 before any lookup, and
// one the called identity's inbound call face denies (InboundFilter) gets
// 403 before its contacts are read.
#pragma once

#include "sip/RequestHandler.h"
#include "sip/SourceFilter.h"

class Exchange;

class Redirector final : public RequestHandler {
 public:
  void handle(Exchange& exchange) override;
  SourceFilter& sources() { return m_sources; }

 private:
  // Each contact is sent as received, up to kMaximumContacts of them.
  static constexpr unsigned int kMaximumContacts = 32;

  SourceFilter m_sources;
};
