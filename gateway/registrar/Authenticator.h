// Authenticator: whether a REGISTER may change the bindings of the identity
// its To names, answering 401 or 403 itself when not, and the same for a
// call from the identity its From names, as a proxy answers (407). The
// library says which realms an identity is challenged in and which
// passwords answer them; the digest arithmetic is DigestAuthentication's,
// the nonces NonceGenerator's and NonceTable's. Nothing here touches a
// binding or a call.
//
// Decisions, with their reasons:
// - Credentials the library takes for the realm they name (HTTP digest) are
//   accepted before the realms to challenge with are asked for: that list
//   only matters when credentials are missing or wrong, and asking for it
//   was the library's largest cost of an authenticated REGISTER. Such a
//   password can only come from the identity's own inbound authentication,
//   so an identity accepted that way is a challenged one.
// - An identity the library does not challenge registers only when it or
//   its group has an inbound-registration face (configured, or dynamic from
//   an earlier registration that passed this same test); any other gets 403.
//   Otherwise an identity configured only to register a trunk upstream would
//   take anyone's unauthenticated REGISTER, and its calls would go to them.
// - A user of a served domain that no identity answers gets the challenge a
//   known user of that location service got last (the realms of the first
//   challenged identity seen there; before any, the domain's host name),
//   and whatever it answers with is a failed authentication (403): a 404
//   before any challenge would tell who exists. A domain served by no
//   location service still gets 404: that says nothing about users.
// - Each challenge offers SHA-256 first and MD5 second for every realm, one
//   nonce per realm shared by both (RFC 8760): a phone takes the first it
//   implements. Some clients read only the first challenge and fail on
//   SHA-256 (PJSIP before 2.12, Asterisk 18 and FreeSWITCH 1.10 as
//   registering clients, SIPp 3.6): --digest MD5,SHA-256 serves them, and
//   offerAlgorithms() changes what is offered, never what is accepted.
// - The digest uri must be the Request-URI, byte for byte (RFC 3261 section
//   22.4, RFC 7616 section 3.4.6): a response computed for another URI is a
//   failed authentication.
// - A nonce is bound to the realm, the Call-ID and the source
//   (NonceGenerator) and used at most once per nonce-count (NonceTable):
//   an authenticated request is applied at most once. The same request
//   again, from the same source within a client transaction's lifetime, is
//   admitted as REPEATED and changes nothing; from anywhere else or later it
//   is a replay. The binding holding the request's Call-ID and CSeq cannot
//   tell a repeat alone: once that binding is gone, a replay would be
//   applied as new, and a query (no Contact) could be sent again from
//   forged sources to have the bindings listed to them. A nonce used again,
//   or one the table no longer remembers, gets 401 with stale=true, like an
//   expired one, as Kamailio answers a nonce-count that did not increase: a replay
//   gains nothing from it, and a phone that reuses its nonce carelessly
//   gets a fresh one instead of a refusal its user would have to clear.
//   Such a request is not a failed authentication: the password was right.
//   The same goes for a nonce made under the shared key by another gateway
//   of the cluster or by this one before a restart (NonceGenerator says why
//   it is never accepted), so that a phone failing over retries at once.
// - A registration challenged with SHA-256 first that answers nothing and
//   starts over without credentials (UnansweredChallenges) gets one line on
//   standard error naming the clients that need --digest MD5,SHA-256, at
//   most once per kAlgorithmWarningMs: such phones take the first challenge
//   whatever it is and give up on SHA-256, and nothing else shows why they
//   never register.
// - Two clocks: the nonces' stamps are the wall clock's (they must mean the
//   same on every gateway), passed to NonceGenerator explicitly; the used
//   nonces' retransmission window and the failure counts are the stack's.
// - A failed authentication (wrong password or user, a digest over another
//   URI) gets 403 and one line on standard error naming the user and the
//   source address, for an operator's fail2ban; a source with kFailureLimit
//   of them within kFailureWindowMs is then refused with 403 for
//   kFailureHoldMs without any lookup (one more line when that starts).
//   Only an answer to a nonce issued to that source can fail: the nonce
//   is bound to it, so a forged UDP source with a nonce obtained elsewhere
//   gets a challenge, and cannot set off the hold of the address it forges
//   (a site's NAT address, and with it every phone behind).
// - A call (admitCaller) is from a subscriber when its From names a user of
//   a domain a location service serves, found as for a REGISTER's
//   Request-URI; only such a caller is challenged, as a proxy challenges,
//   under every rule above but the SHA-256 warning, which follows
//   registrations only. Any other caller (a carrier, an outside phone) is
//   not: it may call subscribers only, which Calls sees to. A location
//   service marked as the default domain serves every host: with one,
//   every caller, a carrier's included, is taken for a subscriber.
// - An identity the library does not challenge calls without credentials
//   when it could register without them (it or its group has an
//   inbound-registration face): whoever may register as it gets its calls
//   already, and calling in its name gives them no more. Any other gets
//   403: a trunk that only registers upstream would otherwise lend its
//   name, and the way out its outbound call face gives, to anyone.
// - An INVITE admitted as REPEATED (the same one again from its source,
//   moments after) is admitted as the first was, and answered as it was:
//   one that set up a call never gets here (Calls, or libre's transaction
//   once the call is over, takes it first), so this is one answered
//   statelessly before any call (480, 482, 488) whose answer was lost, and
//   a fresh challenge would turn a lost answer into another round trip.
// - A source held for its failures gets 403 for every INVITE, before any
//   lookup, as for every REGISTER: the hold spares the gateway a guesser's
//   lookups, and telling its calls apart by the From they name would take
//   the lookup the hold spares.
// - A From the library cannot read (or longer than 1 KiB) gets 400: it
//   cannot be told a subscriber or not, and the callee's phone, which sees
//   it, might read a subscriber in it.
//
// Owned by the Registrar, shared with Calls (one nonce table, one failure
// count, one hold); everything runs on libre's thread.
#pragma once

#include <functional>
#include <map>
#include <string>
#include <vector>

#include "CNameAddr.h"
#include "LS_IIdentity.h"
#include "LS_ILocationService.h"
#include "RefPtr.h"
#include "String.h"
#include "Vector.h"
#include "registrar/DigestAuthentication.h"
#include "registrar/NonceGenerator.h"
#include "registrar/NonceTable.h"
#include "registrar/UnansweredChallenges.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/SourceThrottle.h"

class Exchange;

class Authenticator {
 public:
  // 16 K nonces of 40 bytes: 640 KiB, a few seconds of a storm of new
  // registrations before a phone's own nonce could be pushed out.
  static constexpr size_t kNonceCapacity = 16 * 1024;
  static constexpr uint32_t kFailureLimit = 10;
  static constexpr uint64_t kFailureWindowMs = 60 * 1000;
  static constexpr uint64_t kFailureHoldMs = 60 * 1000;
  static constexpr size_t kFailureSources = 1024;
  static constexpr uint64_t kAlgorithmWarningMs = 60 * 1000;

  explicit Authenticator(LibraryClock& clock);

  // The nonces' key, shared by the gateways of a cluster (--nonce-key-file);
  // before the first request. Without it each process draws its own.
  void useNonceKey(std::vector<uint8_t> const& key) { m_nonces.useKey(key); }
  // What each challenge offers per realm, in this order; not empty.
  void offerAlgorithms(std::vector<DigestAlgorithm> const& algorithms) { m_offered = algorithms; }

  // Failed authentications answered so far (for the statistics).
  uint64_t failures() const { return m_failures; }

  // True, after answering 403, when the request's source is held.
  bool refuseHeldSource(Exchange& exchange);
  // Who asks for the credentials (RFC 3261 sections 22.2 and 22.3): the
  // registrar answers 401 with WWW-Authenticate and reads Authorization,
  // a proxy (the gateway placing a call) 407 with Proxy-Authenticate and
  // Proxy-Authorization. Nothing else differs, but that only a registration
  // is followed for the SHA-256 warning.
  enum class Challenger { REGISTRAR, PROXY };
  // What admit() makes of a request. REPEATED: credentials already used by
  // this very request, from the same source, moments ago; the registrar
  // answers it as the retransmission it is and applies nothing.
  enum class Admission { REFUSED, ACCEPTED, REPEATED };
  // Whether identity, which named (the To of a REGISTER, the From of a
  // call) denotes, may act with this request; REFUSED after answering it.
  Admission admit(Exchange& exchange, LS_IIdentity* identity, CNameAddr const& named, Challenger challenger);
  // Answers a request whose named (parsed) denotes no identity.
  void refuseUnknown(Exchange& exchange, CNameAddr const& named, Challenger challenger);
  // Whether the INVITE's caller may call, answering it when not. caller:
  // the identity its From denotes once authenticated, null for an outside
  // caller.
  bool admitCaller(Exchange& exchange, RefPtr<LS_IIdentity>& caller);

 private:
  // The passwords that answer the realm for the user.
  using Passwords = std::function<Vector<String>(String const& realm, String const& user)>;
  // What the request's credentials headers come to.
  struct Outcome {
    bool accepted = false;
    bool repeated = false;          // accepted as a retransmission
    bool stale = false;             // a nonce expired, used or forgotten
    char const* failure = nullptr;  // why a failed authentication failed
    pl user{};                      // whose it was
  };

  // The first credentials header (the challenger's: Authorization or
  // Proxy-Authorization) with an authentic nonce for one of the realms
  // (for any realm when realms is null) checked, and its nonce used when it
  // passes. Answers nothing, logs nothing: a request may be evaluated again
  // with the realms after failing without them.
  Outcome evaluate(sip_msg const& message,
                   Challenger challenger,
                   std::vector<std::string> const* realms,
                   Passwords const& passwordsOf);
  // The evaluation against realms, answering the challenge or 403 when it
  // does not pass.
  Admission check(Exchange& exchange,
                  Challenger challenger,
                  std::vector<std::string> const& realms,
                  Passwords const& passwords);
  void challenge(Exchange& exchange,
                 Challenger challenger,
                 std::vector<std::string> const& realms,
                 bool stale);
  // The location service serving the host named (set from it); null when
  // none does.
  RefPtr<LS_ILocationService> serviceOf(Exchange& exchange, CNameAddr const& named, CHostPort& host);
  // The challenge for a user of service that no identity answers.
  void challengeUnknown(Exchange& exchange,
                        LS_ILocationService const& service,
                        CHostPort const& host,
                        Challenger challenger);
  // Notes whether the request answers its registration's last challenge,
  // and warns when it starts over instead.
  void followChallenges(Exchange& exchange);
  void fail(Exchange& exchange, pl const& user, char const* reason);

  LibraryClock& m_clock;
  uint64_t m_failures = 0;
  std::vector<DigestAlgorithm> m_offered{DigestAlgorithm::SHA256, DigestAlgorithm::MD5};
  NonceGenerator m_nonces;
  NonceTable m_used{kNonceCapacity};
  DigestAuthentication m_digest;
  UnansweredChallenges m_unanswered{UnansweredChallenges::kCapacity};
  uint64_t m_algorithmWarnedMs = 0;
  bool m_algorithmWarned = false;
  // The throttle passes its limit and holds at the next one.
  SourceThrottle m_failingSources{kFailureLimit - 1, kFailureWindowMs, kFailureHoldMs, kFailureSources};
  // The realms the first challenged identity of each location service was
  // challenged in: as many entries as services configured. The key is only
  // compared, never followed: a service removed and another made at its
  // address would only lend the new one its realms.
  std::map<void const*, std::vector<std::string>> m_realmsByService;
};
