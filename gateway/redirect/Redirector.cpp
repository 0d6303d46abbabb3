#include "redirect/Redirector.h"

#include <algorithm>
#include <vector>

#include "CBlob.h"
#include "LS_IRegistrationInbound.h"
#include "registrar/FaceContacts.h"
#include "registrar/InboundFilter.h"
#include "sip/Exchange.h"

namespace {

struct Found {
  CNameAddr contact;
  bool registered;
  unsigned int q;  // thousandths, for a registered contact
};

// A q value as RFC 3261 writes it: "1", "0.5", "0.125".
std::string qText(unsigned int thousandths) {
  if (thousandths >= 1000)
    return "1";
  std::string digits = std::to_string(1000 + thousandths).substr(1);
  digits.erase(digits.find_last_not_of('0') + 1);
  return "0." + (digits.empty() ? std::string("0") : digits);
}

}  // namespace

void Redirector::handle(Exchange& exchange) {
  if (!m_sources.admits(exchange.request().src))
    return exchange.answer(403, "Forbidden");
  CNameAddr target;
  RefPtr<LS_IIdentity> const identity = exchange.resolveOrAnswer(exchange.request().ruri, target);
  if (!identity)
    return;
  if (InboundFilter::refuses(exchange, *identity, LS_IdentityFace::CALL_INBOUND))
    return;
  std::vector<Found> found;
  for (FaceContact const& each :
       exchange.clock().measure([&] { return faceContacts(identity.get(), kMaximumContacts); }))
    found.push_back(Found{each.contact, !each.callId.empty(), each.priority});
  // Static contacts carry no Call-ID and stay in front.
  std::stable_sort(found.begin(), found.end(), [](Found const& a, Found const& b) {
    if (a.registered != b.registered)
      return !a.registered;
    return a.registered && a.q > b.q;
  });
  std::string contacts;
  for (Found const& each : found) {
    CBlob text;
    each.contact.Serialize(text);
    contacts += "Contact: " + std::string(reinterpret_cast<char const*>(text.GetData()), text.GetSize());
    if (each.registered)
      contacts += ";q=" + qText(each.q);
    contacts += "\r\n";
  }
  if (contacts.empty())
    return exchange.answer(480, "Temporarily Unavailable");
  exchange.answer(302, "Moved Temporarily", contacts);
}
