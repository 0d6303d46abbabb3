#include "registrar/Registrar.h"

#include <algorithm>
#include <cctype>
#include <vector>

#include "LS_ILocationService.h"
#include "LS_IdentityResolution.h"
#include "LS_IdentityType.h"
#include "sip/Exchange.h"

namespace {

// The Call-ID is kept with every binding; a longer one is refused.
constexpr size_t kMaximumCallId = 256;

std::string text(pl const& value) {
  return std::string(value.p, value.l);
}

// A delta-seconds value; one beyond 32 bits saturates (RFC 3261 asks to
// take such a value as the largest). False for anything but digits.
bool parseSeconds(pl const& value, uint32_t& seconds) {
  if (value.l == 0)
    return false;
  uint64_t total = 0;
  for (size_t i = 0; i < value.l; ++i) {
    char const c = value.p[i];
    if (c < '0' || c > '9')
      return false;
    total = std::min<uint64_t>(total * 10 + static_cast<uint64_t>(c - '0'), UINT32_MAX);
  }
  seconds = static_cast<uint32_t>(total);
  return true;
}

template <class Visit>
void forEachHeader(sip_msg const& message, sip_hdrid id, Visit visit) {
  for (le const* entry = list_head(&message.hdrl); entry; entry = entry->next) {
    sip_hdr const* header = static_cast<sip_hdr const*>(entry->data);
    if (header->id == id && !visit(*header))
      return;
  }
}

CHostPort sourceOf(sip_msg const& message) {
  char address[64];
  re_snprintf(address, sizeof address, "%J", &message.src);
  CHostPort source;
  source.Parse(address, std::char_traits<char>::length(address));
  return source;
}

}  // namespace

Registrar::~Registrar() {
  for (auto& entry : m_bindings) {
    size_t const before = entry.second.byContact.size();
    removeAll(entry.second);
    reportTransition(entry.second, before);
  }
  tmr_cancel(&m_sweep);
}

void Registrar::handle(Exchange& exchange) {
  if (m_authenticator.refuseHeldSource(exchange))
    return;
  CNameAddr to;
  RefPtr<LS_IIdentity> const resolved = exchange.resolveOrAnswer(exchange.request().to.auri, to, false);
  if (!resolved) {
    if (!exchange.answered())
      m_authenticator.refuseUnknown(exchange, to);
    return;
  }
  if (!m_authenticator.admit(exchange, resolved.get(), to))
    return;
  bool created = false;
  RefPtr<LS_IIdentity> const identity = registering(resolved.get(), to, created);
  if (!identity)
    return exchange.answer(403, "Forbidden");
  update(exchange, identity, created);
  forgetIfUnbound(identity.get(), created);
}

RefPtr<LS_IIdentity> Registrar::registering(LS_IIdentity* resolved, CNameAddr const& to, bool& created) {
  return m_clock.measure([&] {
    if (resolved->getIdentityType() != LS_IdentityType::IDENTITY_GROUP)
      return RefPtr<LS_IIdentity>(resolved);
    String error;
    String user;
    CHostPort host;
    RefPtr<LS_ILocationService> service;
    RefPtr<LS_IIdentity> identity;
    if (LS_splitNameAddr(error, user, host, to).isFailure() ||
        adoptInterface(service,
                       [&](UUID const& iid, void** raw) { return resolved->getLocationServiceIf(iid, raw); })
            .isFailure() ||
        adoptInterface(identity, [&](UUID const& iid, void** raw) {
          return service->createDynamicIdentityIf(user, iid, raw);
        }).isFailure())
      return RefPtr<LS_IIdentity>();
    created = true;
    return identity;
  });
}

void Registrar::forgetIfUnbound(LS_IIdentity* identity, bool created) {
  // Held here: the table's entry may be the last reference.
  RefPtr<LS_IIdentity> const held(identity);
  bool dynamic = created;
  auto const found = m_bindings.find(identity);
  if (found != m_bindings.end()) {
    if (!found->second.byContact.empty())
      return;
    dynamic = dynamic || found->second.dynamic;
    m_bindings.erase(found);
  }
  if (!dynamic)
    return;
  m_clock.measure([&] {
    RefPtr<LS_ILocationService> service;
    adoptInterface(service,
                   [&](UUID const& iid, void** raw) { return identity->getLocationServiceIf(iid, raw); });
    if (service)
      service->removeDynamicIdentity(identity->getName());
  });
}

void Registrar::update(Exchange& exchange, RefPtr<LS_IIdentity> const& identity, bool created) {
  sip_msg const& message = exchange.request();
  RefPtr<LS_IRegistrationInbound> face;
  m_clock.measure([&] {
    adoptInterface(face, [&](UUID const& iid, void** raw) {
      return identity->createDynamicFaceIf(LS_IdentityFace::REGISTRATION_INBOUND, iid, raw);
    });
  });
  if (!face)
    return exchange.answer(500, "No Registration Face");
  unsigned int minimum = 0;
  unsigned int maximum = 0;
  unsigned int defaultLifetime = 0;
  m_clock.measure([&] { face->getLifetimeRange(minimum, maximum, defaultLifetime); });

  if (message.callid.l > kMaximumCallId)
    return exchange.answer(400, "Call-ID Too Long");
  uint32_t headerExpires = defaultLifetime;
  bool const hasExpires = pl_isset(&message.expires);
  if (hasExpires && !parseSeconds(message.expires, headerExpires))
    return exchange.answer(400, "Bad Expires");

  bool wildcard = false;
  bool malformed = false;
  std::vector<ContactRequest> requests;
  forEachHeader(message, SIP_HDR_CONTACT, [&](sip_hdr const& header) {
    pl value = header.val;
    if (pl_strcmp(&value, "*") == 0) {
      wildcard = true;
      return true;
    }
    sip_addr address;
    uint32_t expires = headerExpires;
    pl parameter;
    CNameAddr contact;
    if (requests.size() == kMaximumContacts || sip_addr_decode(&address, &value) != 0 ||
        !contact.Parse(address.auri.p, address.auri.l) ||
        (msg_param_decode(&address.params, "expires", &parameter) == 0 &&
         !parseSeconds(parameter, expires))) {
      malformed = true;
      return false;
    }
    requests.push_back(ContactRequest{contact, text(address.auri), std::min<uint32_t>(expires, maximum)});
    return true;
  });
  if (malformed)
    return exchange.answer(400, "Bad Contact");

  if (wildcard && (!requests.empty() || !hasExpires || headerExpires != 0))
    return exchange.answer(400, "Bad Wildcard Contact");
  for (ContactRequest const& request : requests)
    if (request.expires != 0 && request.expires < minimum)
      return exchange.answer(423, "Interval Too Brief", "Min-Expires: " + std::to_string(minimum) + "\r\n");
  Bindings& bindings = m_bindings[identity.get()];
  bindings.identity = identity;
  bindings.dynamic = bindings.dynamic || created;
  bindings.face = face;
  switch (order(bindings, requests, wildcard, message.callid, message.cseq.num)) {
    case Order::OUT_OF_ORDER:
      return exchange.answer(400, "Out of Order");
    case Order::RETRANSMITTED:
      return exchange.answer(200, "OK", bindingHeaders(bindings));
    case Order::NEW:
      break;
  }
  size_t const before = bindings.byContact.size();
  size_t added = 0;
  for (ContactRequest const& request : requests)
    added += request.expires != 0 && bindings.byContact.count(request.key) == 0;
  if (before + added > kMaximumBindings)
    return exchange.answer(403, "Too Many Bindings");

  if (wildcard)
    removeAll(bindings);
  CHostPort const received = sourceOf(message);
  for (ContactRequest const& request : requests) {
    if (request.expires != 0) {
      add(bindings, request, message, received);
      continue;
    }
    auto const found = bindings.byContact.find(request.key);
    if (found != bindings.byContact.end())
      remove(*found->second);
  }
  reportTransition(bindings, before);
  exchange.answer(200, "OK", bindingHeaders(bindings));
}

void Registrar::dropRemoved(std::vector<LS_IIdentity const*> const& removed, bool checkAll) {
  for (LS_IIdentity const* identity : removed) {
    auto const found = m_bindings.find(const_cast<LS_IIdentity*>(identity));
    if (found != m_bindings.end())
      drop(found);
  }
  if (!checkAll)
    return;
  for (auto entry = m_bindings.begin(); entry != m_bindings.end();) {
    auto const next = std::next(entry);
    LS_IIdentity* const identity = entry->first;
    bool const present = m_clock.measure([&] {
      RefPtr<LS_ILocationService> service;
      RefPtr<LS_IIdentity> found;
      adoptInterface(service,
                     [&](UUID const& iid, void** raw) { return identity->getLocationServiceIf(iid, raw); });
      return service && LS_getIdentityIf(service.get(), identity->getName(), found).isSuccess() &&
             found.get() == identity;
    });
    if (!present)
      drop(entry);
    entry = next;
  }
}

std::vector<Registrar::BindingView> Registrar::bindings(LS_IIdentity const* identity) const {
  uint64_t const now = tmr_jiffies();
  std::vector<BindingView> views;
  for (auto const& entry : m_bindings) {
    if (identity && entry.first != identity)
      continue;
    for (auto const& held : entry.second.byContact) {
      Binding const& binding = *held.second;
      char source[80];
      re_snprintf(source, sizeof source, "%s:%J", sip_transp_name(binding.transport), &binding.source);
      std::string text = source;
      std::transform(text.begin(), text.end(), text.begin(),
                     [](char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); });
      views.push_back(BindingView{entry.first, held.first,
                                  binding.expiresAtMs > now ? binding.expiresAtMs - now : 0, binding.callId,
                                  std::move(text)});
    }
  }
  return views;
}

void Registrar::drop(std::map<LS_IIdentity*, Bindings>::iterator entry) {
  size_t const before = entry->second.byContact.size();
  m_bindingsDropped += before;
  removeAll(entry->second);
  reportTransition(entry->second, before);
  m_bindings.erase(entry);
}

Registrar::Order Registrar::order(Bindings const& bindings,
                                  std::vector<ContactRequest> const& requests,
                                  bool wildcard,
                                  pl const& callId,
                                  uint32_t cseq) {
  Order verdict = Order::NEW;
  auto judge = [&](Binding const& binding) {
    if (pl_strcmp(&callId, binding.callId.c_str()) != 0)
      return;
    if (cseq < binding.cseq)
      verdict = Order::OUT_OF_ORDER;
    else if (cseq == binding.cseq && verdict == Order::NEW)
      verdict = Order::RETRANSMITTED;
  };
  if (wildcard) {
    for (auto const& entry : bindings.byContact)
      judge(*entry.second);
  }
  for (ContactRequest const& request : requests) {
    auto const found = bindings.byContact.find(request.key);
    if (found != bindings.byContact.end())
      judge(*found->second);
  }
  return verdict;
}

void Registrar::add(Bindings& bindings,
                    ContactRequest const& request,
                    sip_msg const& message,
                    CHostPort const& received) {
  std::string const callId = text(message.callid);
  XCode const added = m_clock.measure([&] {
    return bindings.face->addContact(callId.c_str(), request.contact, received, "", "", 0, request.expires);
  });
  // A contact configured statically on the face stands as registered already.
  if (added.isFailure())
    return;
  std::unique_ptr<Binding>& slot = bindings.byContact[request.key];
  if (!slot) {
    slot = std::make_unique<Binding>();
    slot->owner = &bindings;
    slot->contact = request.contact;
  } else {
    unschedule(*slot);
  }
  slot->callId = callId;
  slot->cseq = message.cseq.num;
  slot->source = message.src;
  slot->transport = message.tp;
  slot->expiresAtMs = tmr_jiffies() + uint64_t{request.expires} * 1000;
  schedule(*slot);
}

void Registrar::remove(Binding& binding) {
  unschedule(binding);
  Bindings& bindings = *binding.owner;
  m_clock.measure([&] { bindings.face->removeContact(binding.contact, binding.callId.c_str()); });
  for (auto entry = bindings.byContact.begin(); entry != bindings.byContact.end(); ++entry)
    if (entry->second.get() == &binding) {
      bindings.byContact.erase(entry);
      return;
    }
}

void Registrar::removeAll(Bindings& bindings) {
  for (auto& entry : bindings.byContact)
    unschedule(*entry.second);
  bindings.byContact.clear();
  m_clock.measure([&] { bindings.face->removeContacts(); });
}

void Registrar::reportTransition(Bindings& bindings, size_t before) {
  size_t const after = bindings.byContact.size();
  if (before == 0 && after != 0)
    m_clock.measure([&] { bindings.identity->isInboundRegistered(); });
  else if (before != 0 && after == 0)
    m_clock.measure([&] { bindings.identity->isInboundUnregistered(); });
}

std::string Registrar::bindingHeaders(Bindings const& bindings) {
  uint64_t const now = tmr_jiffies();
  std::string headers;
  for (auto const& entry : bindings.byContact) {
    uint64_t const remainingMs = entry.second->expiresAtMs > now ? entry.second->expiresAtMs - now : 0;
    headers +=
        "Contact: <" + entry.first + ">;expires=" + std::to_string((remainingMs + 999) / 1000) + "\r\n";
  }
  return headers;
}

void Registrar::schedule(Binding& binding) {
  binding.expiry = m_expiries.emplace(binding.expiresAtMs, &binding);
  if (binding.expiry == m_expiries.begin())
    rearm();
}

// The stack timer stays set for an earlier binding that went: the sweep it
// then makes finds nothing due and sets it again.
void Registrar::unschedule(Binding& binding) {
  m_expiries.erase(binding.expiry);
}

void Registrar::rearm() {
  if (m_expiries.empty())
    return tmr_cancel(&m_sweep);
  uint64_t const now = tmr_jiffies();
  uint64_t const first = m_expiries.begin()->first;
  tmr_start(&m_sweep, first > now ? first - now : 0, onSweep, this);
}

void Registrar::onSweep(void* argument) {
  Registrar& registrar = *static_cast<Registrar*>(argument);
  uint64_t const now = tmr_jiffies();
  while (!registrar.m_expiries.empty() && registrar.m_expiries.begin()->first <= now) {
    Binding& binding = *registrar.m_expiries.begin()->second;
    Bindings& bindings = *binding.owner;
    LS_IIdentity* const identity = bindings.identity.get();
    registrar.remove(binding);
    registrar.reportTransition(bindings, 1);
    registrar.forgetIfUnbound(identity, false);
  }
  registrar.rearm();
}
