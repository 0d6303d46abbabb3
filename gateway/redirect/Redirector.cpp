#include "redirect/Redirector.h"

#include <vector>

#include "CBlob.h"
#include "LS_IRegistrationInbound.h"
#include "sip/Exchange.h"

void Redirector::handle(Exchange& exchange) {
  if (!m_sources.admits(exchange.request().src))
    return exchange.answer(403, "Forbidden");
  CNameAddr target;
  RefPtr<LS_IIdentity> const identity = exchange.resolveOrAnswer(exchange.request().ruri, target);
  if (!identity)
    return;
  std::vector<CNameAddr> found;
  exchange.clock().measure([&] {
    RefPtr<LS_IRegistrationInbound> face;
    LS_getFaceIf(identity.get(), LS_IdentityFace::REGISTRATION_INBOUND, face);
    unsigned int const count = face ? face->getNumberOfContacts() : 0;
    for (unsigned int i = 0; i < count && i < kMaximumContacts; ++i) {
      String callId, context, provider;
      CNameAddr contact;
      CHostPort received;
      unsigned int priority = 0;
      unsigned int expires = 0;
      if (face->getContact(i, callId, contact, received, context, provider, priority, expires).isSuccess())
        found.push_back(contact);
    }
  });
  std::string contacts;
  for (CNameAddr const& contact : found) {
    CBlob text;
    contact.Serialize(text);
    contacts +=
        "Contact: " + std::string(reinterpret_cast<char const*>(text.GetData()), text.GetSize()) + "\r\n";
  }
  if (contacts.empty())
    return exchange.answer(480, "Temporarily Unavailable");
  exchange.answer(302, "Moved Temporarily", contacts);
}
