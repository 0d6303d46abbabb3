// Redirector: the requests for a user that the gateway answers as a redirect
// server (INVITE, MESSAGE, SUBSCRIBE, OPTIONS with a user part). The request
// URI names the identity; the contacts in effect on its inbound-registration
// face, static ones first and then registered ones, go back in a 302, and an
// identity without any gets 480. Nothing is proxied; no dialog is kept.
// A source its SourceFilter does not admit gets 403 before any lookup.
#pragma once

#include "redirect/SourceFilter.h"

class Exchange;

class Redirector {
 public:
  void handle(Exchange& exchange);
  SourceFilter& sources() { return m_sources; }

 private:
  // Each contact is sent as received, up to kMaximumContacts of them.
  static constexpr unsigned int kMaximumContacts = 32;

  SourceFilter m_sources;
};
