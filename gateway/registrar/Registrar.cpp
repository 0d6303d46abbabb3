#include "registrar/Registrar.h"

#include <algorithm>
#include <cctype>
#include <iostream>
#include <vector>

#include "CBlob.h"
#include "LS_ILocationService.h"
#include "LS_IdentityResolution.h"
#include "LS_IdentityType.h"
#include "registrar/FaceContacts.h"
#include "registrar/InboundFilter.h"
#include "registrar/NatTraversal.h"
#include "registrar/SipUriComparison.h"
#include "sip/Capabilities.h"
#include "sip/Exchange.h"
#include "sip/HeaderValues.h"
#include "sip/MonotonicClock.h"
#include "store/StorableText.h"

namespace {

// The Call-ID is kept with every binding; a longer one is refused.
constexpr size_t kMaximumCallId = 256;

CHostPort sourceOf(sip_msg const& message) {
  char address[64];
  re_snprintf(address, sizeof address, "%J", &message.src);
  CHostPort source;
  source.Parse(address, std::char_traits<char>::length(address));
  return source;
}

// The stored name of a transport: "udp", "tcp" or "tls".
char const* transportName(sip_transp transport) {
  switch (transport) {
    case SIP_TRANSP_TCP:
      return "tcp";
    case SIP_TRANSP_TLS:
      return "tls";
    default:
      return "udp";
  }
}

}  // namespace

Registrar::~Registrar() {
  // The bindings go with the process, not from the store, and the parts
  // listening may be gone already.
  m_store = nullptr;
  m_listeners.clear();
  for (auto& entry : m_bindings) {
    size_t const before = entry.second.all.size();
    removeAll(entry.second);
    reportTransition(entry.second, before);
  }
}

void Registrar::start(sip& stack, ExpiryRange const& expiry, uint32_t natPingSeconds) {
  m_stack = &stack;
  m_expiry = expiry;
  if (natPingSeconds != 0)
    m_pinger = std::make_unique<NatPinger>(stack, natPingSeconds, onPingsUnanswered, this);
}

void Registrar::handle(Exchange& exchange) {
  if (m_authenticator.refuseHeldSource(exchange))
    return;
  CNameAddr to;
  RefPtr<LS_IIdentity> const resolved = exchange.resolveOrAnswer(exchange.request().to.auri, to, false);
  if (!resolved) {
    if (!exchange.answered())
      m_authenticator.refuseUnknown(exchange, to, Authenticator::Challenger::REGISTRAR);
    return;
  }
  if (InboundFilter::refuses(exchange, *resolved, LS_IdentityFace::REGISTRATION_INBOUND))
    return;
  Authenticator::Admission const admission =
      m_authenticator.admit(exchange, resolved.get(), to, Authenticator::Challenger::REGISTRAR);
  if (admission == Authenticator::Admission::REFUSED)
    return;
  bool created = false;
  RefPtr<LS_IIdentity> const identity = registering(resolved.get(), to, created);
  if (!identity)
    return exchange.answer(403, "Forbidden");
  update(exchange, identity, created, admission == Authenticator::Admission::REPEATED);
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
    if (!found->second.all.empty())
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

void Registrar::update(Exchange& exchange,
                       RefPtr<LS_IIdentity> const& identity,
                       bool created,
                       bool repeated) {
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
  ExpiryRange const range = ExpiryRange::forFace(minimum, maximum, defaultLifetime, m_expiry);

  if (message.callid.l > kMaximumCallId)
    return exchange.answer(400, "Call-ID Too Long");
  if (!isStorableText(message.callid.p, message.callid.l))
    return exchange.answer(400, "Bad Call-ID");
  uint32_t headerExpires = 0;
  bool const hasExpires = pl_isset(&message.expires);
  if (hasExpires && !ContactHeader::parseSeconds(message.expires, headerExpires))
    return exchange.answer(400, "Bad Expires");

  bool wildcard = false;
  bool malformed = false;
  std::vector<ContactRequest> requests;
  forEachHeaderValue(message, SIP_HDR_CONTACT, [&](sip_hdr const& header) {
    pl value = header.val;
    if (pl_strcmp(&value, "*") == 0) {
      wildcard = true;
      return true;
    }
    ContactRequest request;
    if (requests.size() == kMaximumContacts || value.l > kMaximumContactText ||
        !isStorableText(value.p, value.l) || !ContactHeader::parse(value, request.header)) {
      malformed = true;
      return false;
    }
    request.expires = request.header.hasExpires ? range.grant(true, request.header.expires)
                                                : range.grant(hasExpires, headerExpires);
    requests.push_back(std::move(request));
    return true;
  });
  if (malformed)
    return exchange.answer(400, "Bad Contact");

  if (wildcard && (!requests.empty() || !hasExpires || headerExpires != 0))
    return exchange.answer(400, "Bad Wildcard Contact");
  for (ContactRequest const& request : requests)
    if (request.expires != 0 && request.expires < range.minimum)
      return exchange.answer(423, "Interval Too Brief",
                             "Min-Expires: " + std::to_string(range.minimum) + "\r\n");
  Bindings& bindings = entryOf(identity);
  bindings.dynamic = bindings.dynamic || created;
  bindings.face = face;
  switch (order(bindings, requests, wildcard, message.callid, message.cseq.num)) {
    case Order::OUT_OF_ORDER:
      return exchange.answer(400, "Out of Order");
    case Order::RETRANSMITTED:
      return exchange.answer(200, "OK", bindingHeaders(bindings));
    case Order::NEW:
      // Already applied once, whatever became of its bindings since.
      if (repeated)
        return exchange.answer(200, "OK", bindingHeaders(bindings));
      break;
  }
  size_t const before = bindings.all.size();
  if (wildcard)
    removeAll(bindings);
  for (ContactRequest const& request : requests) {
    Binding* const binding = request.expires == 0 ? find(bindings, request.header) : nullptr;
    if (binding)
      remove(*binding);
  }
  CHostPort const received = sourceOf(message);
  // Named before any newcomer is filed, so that a refresh listed after a
  // new contact never gives way to it.
  std::vector<Binding*> kept;
  for (ContactRequest const& request : requests)
    if (Binding* const binding = request.expires != 0 ? find(bindings, request.header) : nullptr)
      kept.push_back(binding);
  bool added = false;
  for (ContactRequest const& request : requests) {
    if (request.expires == 0)
      continue;
    Binding* binding = find(bindings, request.header);
    if (!binding && bindings.all.size() >= kMaximumBindings)
      giveWay(exchange, bindings, kept, request);
    bool const fresh = !binding;
    binding = add(bindings, request, message, received, binding);
    if (binding)
      kept.push_back(binding);
    added = added || (binding && fresh);
  }
  exchange.answer(200, "OK", bindingHeaders(bindings));
  reportTransition(bindings, before, added);
}

void Registrar::dropRemoved(std::vector<LS_IIdentity const*> const& removed, bool checkAll) {
  // On a store others share, another gateway may still have the identity:
  // its bindings go from memory only, and their rows run out in the store.
  struct Restore {
    bool& flag;
    bool const saved;
    ~Restore() { flag = saved; }
  } const restore{m_replacing, m_replacing};
  m_replacing = m_replacing || (m_store && m_store->shared());
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
  uint64_t const now = MonotonicClock::nowMs();
  std::vector<BindingView> views;
  for (auto const& entry : m_bindings) {
    if (identity && entry.first != identity)
      continue;
    for (auto const& held : entry.second.all) {
      Binding const& binding = *held;
      char source[80];
      re_snprintf(source, sizeof source, "%s:%J", sip_transp_name(binding.transport), &binding.source);
      std::string text = source;
      std::transform(text.begin(), text.end(), text.begin(),
                     [](char c) { return static_cast<char>(std::tolower(static_cast<unsigned char>(c))); });
      views.push_back(BindingView{entry.first, binding.uri,
                                  binding.expiresAtMs > now ? binding.expiresAtMs - now : 0, binding.callId,
                                  std::move(text)});
    }
  }
  return views;
}

void Registrar::drop(std::map<LS_IIdentity*, Bindings>::iterator entry) {
  size_t const before = entry->second.all.size();
  m_bindingsDropped += before;
  removeAll(entry->second);
  reportTransition(entry->second, before);
  m_bindings.erase(entry);
}

Registrar::Order Registrar::order(Bindings& bindings,
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
    for (auto const& binding : bindings.all)
      judge(*binding);
  }
  for (ContactRequest const& request : requests)
    if (Binding const* const binding = find(bindings, request.header))
      judge(*binding);
  return verdict;
}

Registrar::Binding* Registrar::find(Bindings& bindings, ContactHeader const& contact) {
  if (!contact.instance.empty())
    for (auto const& binding : bindings.all)
      if (binding->instance == contact.instance && binding->regId == contact.regId)
        return binding.get();
  // A refresh names its binding as it was written, and then the text
  // decides without parsing both URIs again.
  for (auto const& binding : bindings.all)
    if (binding->uri == contact.uri)
      return binding.get();
  pl uri;
  pl_set_str(&uri, contact.uri.c_str());
  for (auto const& binding : bindings.all) {
    pl other;
    pl_set_str(&other, binding->uri.c_str());
    if (SipUriComparison::equal(uri, other))
      return binding.get();
  }
  return nullptr;
}

CNameAddr Registrar::targetOf(ContactHeader const& header,
                              sa const& source,
                              sip_transp transport,
                              std::string& natedTarget) {
  pl uri;
  pl_set_str(&uri, header.uri.c_str());
  CNameAddr target = header.contact;
  if (NatTraversal::natedTarget(uri, source, transport, natedTarget) &&
      !target.Parse(natedTarget.data(), natedTarget.size()))
    target = header.contact;
  return target;
}

Registrar::Binding* Registrar::file(Bindings& bindings,
                                    Binding* binding,
                                    ContactHeader const& header,
                                    CNameAddr const& target,
                                    std::string const& callId,
                                    sa const& source,
                                    CHostPort const& received,
                                    uint32_t expires) {
  // The face knows a contact by its text: one filed under another target
  // (a new NAT mapping, or an instance's new URI) goes first.
  if (binding && binding->contact != target)
    m_clock.measure([&] { bindings.face->removeContact(binding->contact, binding->callId.c_str()); });
  XCode const added = m_clock.measure(
      [&] { return bindings.face->addContact(callId.c_str(), target, received, "", "", header.q, expires); });
  // A contact configured statically on the face stands as registered already.
  if (added.isFailure()) {
    if (binding)
      forget(*binding);
    return nullptr;
  }
  if (!binding) {
    bindings.all.push_back(std::make_unique<Binding>());
    binding = bindings.all.back().get();
    binding->registrar = this;
    binding->owner = &bindings;
  } else {
    unschedule(*binding);
  }
  binding->contact = target;
  binding->uri = header.uri;
  binding->parameters = header.parameters;
  binding->instance = header.instance;
  binding->regId = header.regId;
  binding->callId = callId;
  binding->source = source;
  return binding;
}

Registrar::Binding* Registrar::add(Bindings& bindings,
                                   ContactRequest const& request,
                                   sip_msg const& message,
                                   CHostPort const& received,
                                   Binding* binding) {
  std::string natedTarget;
  CNameAddr const target = targetOf(request.header, message.src, message.tp, natedTarget);
  bool const nated = !natedTarget.empty();
  bool const fresh = !binding;
  binding = file(bindings, binding, request.header, target, textOf(message.callid), message.src, received,
                 request.expires);
  if (!binding)
    return nullptr;
  binding->cseq = message.cseq.num;
  binding->transport = message.tp;
  binding->expiresAtMs = MonotonicClock::nowMs() + uint64_t{request.expires} * 1000;
  schedule(*binding);
  record(fresh ? StoreChange::Kind::ADDED : StoreChange::Kind::REFRESHED, *binding);
  binding->connection = static_cast<sip_keepalive*>(mem_deref(binding->connection));
  if (nated && message.tp != SIP_TRANSP_UDP && m_stack)
    sip_keepalive_start(&binding->connection, m_stack, &message, kConnectionWatchSeconds, onConnectionClosed,
                        binding);
  if (m_pinger) {
    if (nated && message.tp == SIP_TRANSP_UDP)
      m_pinger->watch(binding, natedTarget, message.src, message.sock);
    else
      m_pinger->forget(binding);
  }
  return binding;
}

void Registrar::giveWay(Exchange& exchange,
                        Bindings& bindings,
                        std::vector<Binding*> const& kept,
                        ContactRequest const& newcomer) {
  Binding* stalest = nullptr;
  for (auto const& binding : bindings.all) {
    if (std::find(kept.begin(), kept.end(), binding.get()) != kept.end())
      continue;
    if (!stalest || binding->expiresAtMs < stalest->expiresAtMs)
      stalest = binding.get();
  }
  if (!stalest)
    return;
  exchange.session().flushDebugLines();
  std::cerr << "location-gateway: " << ScriptSession::pathOf(bindings.identity.get()) << ": <" << stalest->uri
            << "> gives way to <" << newcomer.header.uri << ">, " << kMaximumBindings << " bindings at most"
            << std::endl;
  remove(*stalest);
}

void Registrar::forget(Binding& binding) {
  unschedule(binding);
  if (m_pinger)
    m_pinger->forget(&binding);
  std::vector<std::unique_ptr<Binding>>& all = binding.owner->all;
  all.erase(std::find_if(all.begin(), all.end(),
                         [&](std::unique_ptr<Binding> const& each) { return each.get() == &binding; }));
}

void Registrar::remove(Binding& binding) {
  record(StoreChange::Kind::REMOVED, binding);
  Bindings& bindings = *binding.owner;
  m_clock.measure([&] { bindings.face->removeContact(binding.contact, binding.callId.c_str()); });
  forget(binding);
}

void Registrar::removeAll(Bindings& bindings) {
  for (auto const& binding : bindings.all) {
    record(StoreChange::Kind::REMOVED, *binding);
    unschedule(*binding);
    if (m_pinger)
      m_pinger->forget(binding.get());
  }
  bindings.all.clear();
  m_clock.measure([&] { bindings.face->removeContacts(); });
}

void Registrar::reportTransition(Bindings& bindings, size_t before, bool added) {
  size_t const after = bindings.all.size();
  if (before == 0 && after != 0)
    m_clock.measure([&] { bindings.identity->isInboundRegistered(); });
  else if (before != 0 && after == 0)
    m_clock.measure([&] { bindings.identity->isInboundUnregistered(); });
  bool const bound = after != 0 && (added || before == 0);
  bool const unbound = before != 0 && after == 0;
  if (!bound && !unbound)
    return;
  // Held: a listener's work may drop the table's reference.
  RefPtr<LS_IIdentity> const identity = bindings.identity;
  for (BindingListener* listener : m_listeners) {
    if (bound)
      listener->onBound(identity.get(), before == 0);
    else
      listener->onUnbound(identity.get());
  }
}

std::string Registrar::bindingHeaders(Bindings const& bindings) {
  uint64_t const now = MonotonicClock::nowMs();
  std::string headers;
  for (auto const& binding : bindings.all) {
    uint64_t const remainingMs = binding->expiresAtMs > now ? binding->expiresAtMs - now : 0;
    headers += "Contact: <" + binding->uri + ">" + binding->parameters +
               ";expires=" + std::to_string((remainingMs + 999) / 1000) + "\r\n";
  }
  char date[64];
  re_snprintf(date, sizeof date, "Date: %H\r\n", fmt_gmtime, nullptr);
  return headers + date + Capabilities::kAllow + Capabilities::kSupported;
}

void Registrar::schedule(Binding& binding) {
  binding.expiry = m_expiries.emplace(binding.expiresAtMs, &binding);
  if (binding.expiry == m_expiries.begin())
    rearm();
}

// The timer stays set for an earlier binding that went: the sweep it
// then makes finds nothing due and sets it again.
void Registrar::unschedule(Binding& binding) {
  m_expiries.erase(binding.expiry);
}

void Registrar::rearm() {
  if (m_expiries.empty())
    return m_sweep.cancel();
  uint64_t const now = MonotonicClock::nowMs();
  uint64_t const first = m_expiries.begin()->first;
  m_sweep.start(first > now ? first - now : 0, onSweep, this);
}

void Registrar::onSweep(void* argument) {
  Registrar& registrar = *static_cast<Registrar*>(argument);
  uint64_t const now = MonotonicClock::nowMs();
  while (!registrar.m_expiries.empty() && registrar.m_expiries.begin()->first <= now)
    registrar.lose(*registrar.m_expiries.begin()->second, nullptr);
  registrar.rearm();
}

void Registrar::lose(Binding& binding, char const* reason) {
  Bindings& bindings = *binding.owner;
  LS_IIdentity* const identity = bindings.identity.get();
  if (reason)
    std::cerr << "location-gateway: " << ScriptSession::pathOf(identity) << ": <" << binding.uri
              << "> dropped, " << reason << std::endl;
  // Ran out: the store deletes it only if its row ran out too.
  if (!reason) {
    record(StoreChange::Kind::EXPIRED, binding);
    bool const replacing = m_replacing;
    m_replacing = true;
    remove(binding);
    m_replacing = replacing;
  } else {
    remove(binding);
  }
  reportTransition(bindings, 1);
  forgetIfUnbound(identity, false);
}

Registrar::Bindings& Registrar::entryOf(RefPtr<LS_IIdentity> const& identity) {
  Bindings& bindings = m_bindings[identity.get()];
  if (bindings.identity)
    return bindings;
  bindings.identity = identity;
  m_clock.measure([&] {
    bindings.identityName = identity->getName().str();
    RefPtr<LS_ILocationService> service;
    adoptInterface(service,
                   [&](UUID const& iid, void** raw) { return identity->getLocationServiceIf(iid, raw); });
    if (service)
      bindings.serviceName = service->getName().str();
  });
  return bindings;
}

void Registrar::record(StoreChange::Kind kind, Binding const& binding) {
  bool const kept = kind == StoreChange::Kind::ADDED || kind == StoreChange::Kind::REFRESHED;
  if (!m_store || m_replacing || (boundToFlow(binding) && kept))
    return;
  Bindings const& bindings = *binding.owner;
  StoredBinding stored;
  stored.service = bindings.serviceName;
  stored.identity = bindings.identityName;
  stored.uri = binding.uri;
  if (kept) {
    stored.contact = "<" + binding.uri + ">" + binding.parameters;
    stored.callId = binding.callId;
    stored.cseq = binding.cseq;
    char source[64];
    re_snprintf(source, sizeof source, "%J", &binding.source);
    stored.source = source;
    stored.transport = transportName(binding.transport);
    stored.expiresAtMs = binding.expiresAtMs;
    stored.dynamic = bindings.dynamic;
  }
  m_store->record(kind, stored);
}

bool Registrar::replace(RefPtr<LS_IIdentity> const& identity,
                        bool dynamic,
                        std::vector<StoredBinding> const& stored) {
  RefPtr<LS_IRegistrationInbound> face;
  m_clock.measure([&] {
    adoptInterface(face, [&](UUID const& iid, void** raw) {
      return identity->createDynamicFaceIf(LS_IdentityFace::REGISTRATION_INBOUND, iid, raw);
    });
  });
  if (!face)
    return false;
  Bindings& bindings = entryOf(identity);
  bindings.dynamic = bindings.dynamic || dynamic;
  bindings.face = face;
  size_t const before = bindings.all.size();
  m_replacing = true;
  for (size_t i = bindings.all.size(); i-- > 0;) {
    Binding& binding = *bindings.all[i];
    // The store never has a binding bound to its flow: it lives here only.
    bool const wanted = boundToFlow(binding) ||
                        std::any_of(stored.begin(), stored.end(),
                                    [&](StoredBinding const& each) { return each.uri == binding.uri; });
    if (!wanted)
      remove(binding);
  }
  uint64_t const now = MonotonicClock::nowMs();
  for (StoredBinding const& each : stored)
    restore(bindings, each, now);
  m_replacing = false;
  reportTransition(bindings, before);
  forgetIfUnbound(identity.get(), dynamic);
  return true;
}

void Registrar::restore(Bindings& bindings, StoredBinding const& stored, uint64_t now) {
  ContactHeader header;
  pl value;
  pl_set_str(&value, stored.contact.c_str());
  sa source;
  if (stored.expiresAtMs <= now || !ContactHeader::parse(value, header) ||
      sa_decode(&source, stored.source.data(), stored.source.size()) != 0)
    return;
  header.uri = stored.uri;
  uint32_t const expires =
      static_cast<uint32_t>(std::min<uint64_t>((stored.expiresAtMs - now + 999) / 1000, UINT32_MAX));
  sip_transp transport = SIP_TRANSP_UDP;
  for (sip_transp each : {SIP_TRANSP_TCP, SIP_TRANSP_TLS})
    if (stored.transport == transportName(each))
      transport = each;
  std::string natedTarget;
  CNameAddr const target = targetOf(header, source, transport, natedTarget);
  CHostPort received;
  received.Parse(stored.source.data(), stored.source.size());
  Binding* const binding =
      file(bindings, find(bindings, header), header, target, stored.callId, source, received, expires);
  if (!binding)
    return;
  binding->cseq = stored.cseq;
  binding->transport = transport;
  binding->expiresAtMs = stored.expiresAtMs;
  schedule(*binding);
}

std::vector<BindingStore::IdentityName> Registrar::boundIdentities() const {
  std::vector<BindingStore::IdentityName> names;
  for (auto const& entry : m_bindings)
    if (!entry.second.all.empty())
      names.emplace_back(entry.second.serviceName, entry.second.identityName);
  return names;
}

void Registrar::onConnectionClosed(int, void* argument) {
  Binding& binding = *static_cast<Binding*>(argument);
  // libre has freed its keep-alive and cleared binding.connection.
  binding.registrar->lose(binding, "its connection closed");
}

void Registrar::onPingsUnanswered(void const* binding, void* argument) {
  Registrar& registrar = *static_cast<Registrar*>(argument);
  std::string const reason = std::to_string(NatPinger::kMisses) + " NAT pings unanswered";
  registrar.lose(*const_cast<Binding*>(static_cast<Binding const*>(binding)), reason.c_str());
}

std::vector<Registrar::CallTarget> Registrar::callTargets(LS_IIdentity* identity) const {
  std::vector<CallTarget> targets;
  auto const held = m_bindings.find(identity);
  for (FaceContact const& found : m_clock.measure([&] { return faceContacts(identity, kMaximumBindings); })) {
    CBlob text;
    found.contact.Serialize(text);
    // "<uri>" or "display <uri>": the URI holds no angle bracket.
    std::string uri(reinterpret_cast<char const*>(text.GetData()), text.GetSize());
    uri = uri.substr(uri.rfind('<') + 1);
    uri.erase(uri.rfind('>'));
    CallTarget target{uri, "", "", found.callId.empty() ? ContactHeader::kNoQ : found.priority};
    Binding const* binding = nullptr;
    if (!found.callId.empty() && held != m_bindings.end())
      for (auto const& each : held->second.all)
        if (each->contact == found.contact && each->callId == found.callId)
          binding = each.get();
    if (binding) {
      target.uri = binding->uri;
      pl registered;
      pl_set_str(&registered, binding->uri.c_str());
      std::string nated;
      if (binding->transport != SIP_TRANSP_UDP ||
          NatTraversal::natedTarget(registered, binding->source, binding->transport, nated)) {
        char route[96];
        re_snprintf(route, sizeof route, "sip:%J%s", &binding->source, sip_transp_param(binding->transport));
        target.route = route;
        target.flow = NatTraversal::flowTarget(registered, binding->source, binding->transport);
      }
    }
    targets.push_back(std::move(target));
  }
  return targets;
}
