#include "registrar/Authenticator.h"

#include <algorithm>
#include <iostream>

#include "LS_CredentialLookup.h"
#include "LS_ILocationService.h"
#include "LS_IRegistrationInbound.h"
#include "LS_IdentityResolution.h"
#include "sip/Exchange.h"
#include "sip/FieldHash.h"
#include "sip/MonotonicClock.h"
#include "sip/WallClock.h"

namespace {

// Authorization headers looked at per request, and the longest user name
// passed to the library: more is an attack, not a phone.
constexpr unsigned int kMaximumAuthorizations = 8;
constexpr size_t kMaximumUserName = 256;
// A longer From is refused rather than cut, as a longer Request-URI is.
constexpr size_t kMaximumUri = 1024;

template <class Visit>
void forEachHeader(sip_msg const& message, sip_hdrid id, Visit visit) {
  for (le const* entry = list_head(&message.hdrl); entry; entry = entry->next) {
    sip_hdr const* header = static_cast<sip_hdr const*>(entry->data);
    if (header->id == id && !visit(*header))
      return;
  }
}

// Where a request came from: "TRANSPORT ADDR:PORT", the connection over
// TCP, TLS and WebSocket; its length.
constexpr size_t kSourceText = 80;
size_t connectionOf(sip_msg const& message, char (&text)[kSourceText]) {
  int const length = re_snprintf(text, sizeof text, "%s %J", sip_transp_name(message.tp), &message.src);
  return length > 0 ? static_cast<size_t>(length) : 0;
}

// What a REGISTER would change and where it came from, digested: a
// retransmission has the same, a replay with another Contact, CSeq, To or
// Expires, or from another address, port or transport, does not.
uint64_t fingerprintOf(sip_msg const& message) {
  FieldHash hash;
  hash.add(message.to.auri.p, message.to.auri.l)
      .add(message.cseq.num)
      .add(message.expires.p, message.expires.l);
  forEachHeader(message, SIP_HDR_CONTACT, [&](sip_hdr const& header) {
    hash.add(header.val.p, header.val.l);
    return true;
  });
  char source[kSourceText];
  return hash.add(source, connectionOf(message, source)).value();
}

// A user name from the network as a log line may show it: no line breaks
// or quotes that could forge another line or field.
std::string printable(pl const& text) {
  std::string result;
  for (size_t i = 0; i < text.l && i < kMaximumUserName; ++i) {
    unsigned char const c = static_cast<unsigned char>(text.p[i]);
    result += c < 0x20 || c == 0x7f || c == '"' || c == '\\' ? '?' : static_cast<char>(c);
  }
  return result;
}

// What a nonce is bound to: the address over UDP, where a spoofed source
// costs nothing and a NAT may move the port; the connection (transport,
// address and port) over the others, which cannot be spoofed.
std::string nonceSourceOf(sip_msg const& message) {
  char text[kSourceText];
  if (message.tp == SIP_TRANSP_UDP)
    re_snprintf(text, sizeof text, "udp %j", &message.src);
  else
    connectionOf(message, text);
  return text;
}

// A registration as UnansweredChallenges knows it: its Call-ID and where
// it comes from, port included (phones behind one NAT share the address).
uint64_t registrationOf(sip_msg const& message) {
  char source[kSourceText];
  return FieldHash()
      .add(message.callid.p, message.callid.l)
      .add(source, connectionOf(message, source))
      .value();
}

bool hasCredentials(sip_msg const& message) {
  bool found = false;
  forEachHeader(message, SIP_HDR_AUTHORIZATION, [&](sip_hdr const&) {
    found = true;
    return false;
  });
  return found;
}

// What a challenger sends and where the answer to it comes.
struct ChallengeForm {
  uint16_t code;
  char const* reason;
  char const* header;
  sip_hdrid credentials;
};

ChallengeForm const& formOf(Authenticator::Challenger challenger) {
  static ChallengeForm const kRegistrar{401, "Unauthorized", "WWW-Authenticate", SIP_HDR_AUTHORIZATION};
  static ChallengeForm const kProxy{407, "Proxy Authentication Required", "Proxy-Authenticate",
                                    SIP_HDR_PROXY_AUTHORIZATION};
  return challenger == Authenticator::Challenger::PROXY ? kProxy : kRegistrar;
}

std::string addressOf(sa const& source) {
  char text[64];
  re_snprintf(text, sizeof text, "%j port %u", &source, static_cast<unsigned int>(sa_port(&source)));
  return text;
}

}  // namespace

Authenticator::Authenticator(LibraryClock& clock) : m_clock(clock) {}

bool Authenticator::refuseHeldSource(Exchange& exchange) {
  if (!m_failingSources.held(exchange.request().src, MonotonicClock::nowMs()))
    return false;
  exchange.answer(403, "Forbidden");
  return true;
}

Authenticator::Admission Authenticator::admit(Exchange& exchange,
                                              LS_IIdentity* identity,
                                              CNameAddr const& named,
                                              Challenger challenger) {
  if (challenger == Challenger::REGISTRAR)
    followChallenges(exchange);
  String error;
  Outcome const quick =
      evaluate(exchange.request(), challenger, nullptr, [&](String const& realm, String const& user) {
        Vector<String> passwords;
        m_clock.measure([&] {
          LS_getInboundAuthenticationResponse(error, passwords, identity, named,
                                              LS_AuthenticationProtocol::HTTP, realm, user, nullptr);
        });
        return passwords;
      });
  if (quick.accepted)
    return quick.repeated ? Admission::REPEATED : Admission::ACCEPTED;
  Vector<LS_ProtocolRealm> realms;
  m_clock.measure([&] { LS_getInboundAuthenticationChallenge(error, realms, identity, nullptr); });
  if (realms.isEmpty()) {
    RefPtr<LS_IRegistrationInbound> face;
    m_clock.measure([&] { LS_getFaceIf(identity, LS_IdentityFace::REGISTRATION_INBOUND, face); });
    if (face)
      return Admission::ACCEPTED;
    exchange.answer(403, "Forbidden");
    return Admission::REFUSED;
  }
  std::vector<std::string> names;
  for (LS_ProtocolRealm const& realm : realms)
    names.push_back(realm.realm.str());
  RefPtr<LS_ILocationService> service;
  m_clock.measure([&] {
    adoptInterface(service,
                   [&](UUID const& iid, void** raw) { return identity->getLocationServiceIf(iid, raw); });
  });
  if (service && m_realmsByService.count(service.get()) == 0)
    m_realmsByService.emplace(service.get(), names);
  return check(exchange, challenger, names, [&](String const& realm, String const& user) {
    Vector<String> passwords;
    auto const found = std::find_if(realms.begin(), realms.end(), [&](LS_ProtocolRealm const& candidate) {
      return candidate.realm == realm;
    });
    if (found == realms.end())
      return passwords;
    m_clock.measure([&] {
      LS_getInboundAuthenticationResponse(error, passwords, identity, named, found->protocol, realm, user,
                                          nullptr);
    });
    return passwords;
  });
}

RefPtr<LS_ILocationService> Authenticator::serviceOf(Exchange& exchange,
                                                     CNameAddr const& named,
                                                     CHostPort& host) {
  String error;
  String user;
  return m_clock.measure([&]() -> RefPtr<LS_ILocationService> {
    if (LS_splitNameAddr(error, user, host, named).isFailure())
      return nullptr;
    return exchange.session().serviceFor(error, host);
  });
}

void Authenticator::refuseUnknown(Exchange& exchange, CNameAddr const& named, Challenger challenger) {
  CHostPort host;
  RefPtr<LS_ILocationService> const service = serviceOf(exchange, named, host);
  if (!service)
    return exchange.answer(404, "Not Found");
  challengeUnknown(exchange, *service, host, challenger);
}

void Authenticator::challengeUnknown(Exchange& exchange,
                                     LS_ILocationService const& service,
                                     CHostPort const& host,
                                     Challenger challenger) {
  auto const known = m_realmsByService.find(&service);
  std::vector<std::string> const realms =
      known != m_realmsByService.end() ? known->second : std::vector<std::string>{host.GetHost().c_str()};
  check(exchange, challenger, realms, [](String const&, String const&) { return Vector<String>(); });
}

bool Authenticator::admitCaller(Exchange& exchange, RefPtr<LS_IIdentity>& caller) {
  caller = nullptr;
  if (refuseHeldSource(exchange))
    return false;
  pl const& from = exchange.request().from.auri;
  CNameAddr named;
  if (from.l > kMaximumUri || !named.Parse(from.p, from.l)) {
    exchange.answer(400, "Bad From");
    return false;
  }
  CHostPort host;
  RefPtr<LS_ILocationService> const service = serviceOf(exchange, named, host);
  if (!service)
    return true;
  String error;
  RefPtr<LS_IIdentity> identity = m_clock.measure([&] { return exchange.session().resolve(error, named); });
  if (!identity) {
    challengeUnknown(exchange, *service, host, Challenger::PROXY);
    return false;
  }
  if (admit(exchange, identity.get(), named, Challenger::PROXY) == Admission::REFUSED)
    return false;
  caller = std::move(identity);
  return true;
}

Authenticator::Outcome Authenticator::evaluate(sip_msg const& message,
                                               Challenger challenger,
                                               std::vector<std::string> const* realms,
                                               Passwords const& passwordsOf) {
  uint64_t const now = MonotonicClock::nowMs();
  uint64_t const wallNow = WallClock::nowMs();
  std::string const source = nonceSourceOf(message);
  unsigned int looked = 0;
  Outcome outcome;
  forEachHeader(message, formOf(challenger).credentials, [&](sip_hdr const& header) {
    if (++looked > kMaximumAuthorizations)
      return false;
    DigestResponse response;
    if (!decodeDigestResponse(header.val, response) || response.fields.username.l > kMaximumUserName)
      return true;
    httpauth_digest_resp const& fields = response.fields;
    if (realms && std::none_of(realms->begin(), realms->end(), [&](std::string const& candidate) {
          return pl_strcmp(&fields.realm, candidate.c_str()) == 0;
        }))
      return true;
    switch (m_nonces.check(fields.nonce, fields.realm, message.callid, source, wallNow)) {
      case NonceGenerator::Check::UNKNOWN:
        return true;
      case NonceGenerator::Check::STALE:
      case NonceGenerator::Check::FOREIGN:
        outcome.stale = true;
        return true;
      case NonceGenerator::Check::VALID:
        break;
    }
    outcome.user = fields.username;
    if (pl_cmp(&fields.uri, &message.ruri) != 0) {
      outcome.failure = "digest uri is not the request URI";
      return false;
    }
    Vector<String> const passwords =
        passwordsOf(String(fields.realm.p, fields.realm.l), String(fields.username.p, fields.username.l));
    bool const matches = std::any_of(passwords.begin(), passwords.end(), [&](String const& password) {
      return m_digest.matches(response, message.met, password.c_str());
    });
    if (!matches) {
      outcome.failure = "wrong user or password";
      return false;
    }
    uint32_t const count = pl_isset(&fields.qop) ? pl_x32(&fields.nc) : 0;
    if (pl_isset(&fields.qop) && count == 0) {
      outcome.failure = "no nonce-count";
      return false;
    }
    switch (
        m_used.use(fields.nonce, NonceGenerator::madeAt(fields.nonce), count, fingerprintOf(message), now)) {
      case NonceTable::Use::FORGOTTEN:
      case NonceTable::Use::REPLAYED:
        outcome.stale = true;
        return true;
      case NonceTable::Use::REPEATED:
        outcome.repeated = true;
        outcome.accepted = true;
        return false;
      case NonceTable::Use::FIRST_OR_NEWER:
        outcome.accepted = true;
        return false;
    }
    return false;
  });
  return outcome;
}

Authenticator::Admission Authenticator::check(Exchange& exchange,
                                              Challenger challenger,
                                              std::vector<std::string> const& realms,
                                              Passwords const& passwordsOf) {
  Outcome const outcome = evaluate(exchange.request(), challenger, &realms, passwordsOf);
  if (outcome.accepted)
    return outcome.repeated ? Admission::REPEATED : Admission::ACCEPTED;
  if (outcome.failure) {
    fail(exchange, outcome.user, outcome.failure);
    return Admission::REFUSED;
  }
  challenge(exchange, challenger, realms, outcome.stale);
  return Admission::REFUSED;
}

void Authenticator::followChallenges(Exchange& exchange) {
  sip_msg const& message = exchange.request();
  uint64_t const registration = registrationOf(message);
  if (hasCredentials(message))
    return m_unanswered.answered(registration);
  if (!m_unanswered.gaveUp(registration, message.cseq.num))
    return;
  uint64_t const now = MonotonicClock::nowMs();
  if (m_algorithmWarned && now - m_algorithmWarnedMs < kAlgorithmWarningMs)
    return;
  m_algorithmWarned = true;
  m_algorithmWarnedMs = now;
  exchange.session().flushDebugLines();
  std::cerr << "location-gateway: \"" << printable(message.to.uri.user) << "\" from "
            << addressOf(message.src)
            << " registers again without answering a challenge that offered SHA-256 first: it seems to read"
               " only the first challenge and to know only MD5, as PJSIP before 2.12, Asterisk 18 and"
               " FreeSWITCH 1.10 registering, and SIPp do; such phones need --digest MD5,SHA-256"
            << std::endl;
}

void Authenticator::challenge(Exchange& exchange,
                              Challenger challenger,
                              std::vector<std::string> const& realms,
                              bool stale) {
  ChallengeForm const& form = formOf(challenger);
  uint64_t const now = WallClock::nowMs();
  std::string const source = nonceSourceOf(exchange.request());
  std::string challenges;
  for (std::string const& realm : realms) {
    pl name;
    pl_set_str(&name, realm.c_str());
    std::string const nonce = m_nonces.make(name, exchange.request().callid, source, now);
    for (DigestAlgorithm algorithm : m_offered)
      challenges += std::string(form.header) + ": " + digestChallenge(name, nonce, algorithm, stale) + "\r\n";
  }
  if (challenger == Challenger::REGISTRAR && m_offered.front() == DigestAlgorithm::SHA256)
    m_unanswered.challenged(registrationOf(exchange.request()), exchange.request().cseq.num);
  exchange.answer(form.code, form.reason, challenges);
}

void Authenticator::fail(Exchange& exchange, pl const& user, char const* reason) {
  ++m_failures;
  sa const& source = exchange.request().src;
  std::cerr << "location-gateway: authentication failed for \"" << printable(user) << "\" from "
            << addressOf(source) << ": " << reason << std::endl;
  if (m_failingSources.count(source, MonotonicClock::nowMs()) == SourceThrottle::Verdict::HELD_NOW)
    std::cerr << "location-gateway: " << addressOf(source) << " refused for " << kFailureHoldMs / 1000
              << " s after " << kFailureLimit << " failed authentications" << std::endl;
  exchange.answer(403, "Forbidden");
}
