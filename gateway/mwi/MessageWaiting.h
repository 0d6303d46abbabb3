// MessageWaiting: message waiting on the wire. Every identity (not a group)
// whose message-waiting face ("message-subscription") names a message
// server learns there whether messages wait for it (RFC 3842
// message-summary), and the gateway passes what it learns on to the phones
// registered for the identity. How it learns is the face's mode:
//
// - explicit: the gateway subscribes on the identity's behalf (RFC 6665)
//   through libre's sipevent, which keeps the dialog, refreshes it and
//   matches the notifier's in-dialog NOTIFYs to it. The Request-URI, To and
//   From are the identity's name at the notifier, at its TLS counterpart
//   over TLS when the face prefers TLS. The SUBSCRIBE goes by the face's
//   hops (OutboundRoute: proxies in order, forced destination, transport,
//   penalty box), answers 401 and 407 with the identity's outbound
//   credentials and asks for the face's lifetime in seconds. A failure
//   drops the subscription, which is made anew after the face's retry
//   timeout for the class of the error (in seconds, as the trunks have
//   them): system (no answer, transport, or a hop that cannot be reached,
//   once no hop is left), server (5xx) or client (any other final answer,
//   and a NOTIFY that ends the subscription). A 3xx names a notifier in its
//   Contact: it is recorded on the face (setDynamicMwiNotifier), subscribed
//   at at once, and forgotten (removeDynamicMwiNotifier) when that
//   subscription ends, after which the configured notifier is asked again.
//   A 3xx from the notifier a 3xx named is a client error, so that two
//   servers naming each other cannot keep the gateway busy.
// - implicit: no SUBSCRIBE; the message server sends its NOTIFYs unasked,
//   out of any dialog. One whose Request-URI (or else To) names the
//   identity is accepted when it comes from the notifier's address
//   (configured, TLS or learnt), compared without the port as the trunks'
//   carriers are, since a server sends from other ports than it listens
//   on. A notifier named by host name is known by the addresses the stack's
//   DNS client gives for it (A records), asked when the face is read:
//   until they are known, NOTIFYs for the identity are refused. Any other
//   source gets 403, and a line on standard error.
// - none (the face's default): the gateway does nothing for the identity,
//   and an out-of-dialog NOTIFY for it gets 403 like any stranger's.
//
// Every NOTIFY taken (either mode) is answered 200 and its body kept as the
// identity's state, as received, with what it says (Messages-Waiting and
// the Voice-Message counts) read out for the mwi question. The body goes on
// unchanged in an out-of-dialog NOTIFY (Event: message-summary,
// Subscription-State: active, the summary's Content-Type) to each binding of
// the identity in effect, over the flow it registered on
// (Registrar::callTargets): unsolicited MWI, which phones accept. A phone
// that registers a new contact later is told the state kept (onBound); the
// registrar does not say which contact is new, so every binding of the
// identity is told again, which the summary's idempotence makes harmless.
// A NOTIFY to a phone that fails is not sent again: the next change, or
// the phone's next new registration, brings the state anew.
//
// In-dialog NOTIFYs reach the gateway's front-end first (its listener is
// the stack's first); it passes every NOTIFY with a To tag on as a
// DialogHandler would (inDialog), to sipevent's listener, which answers one
// of no subscription 481 as the front-end would have. Out-of-dialog NOTIFYs
// stay with the front-end, which hands them to handle() by the method table.
//
// A hop naming the gateway itself is not refused, as Calls refuses it: a
// SUBSCRIBE that comes back is answered by the redirect server, and what
// follows from that answer is at worst a failure retried after the face's
// timeout, never a loop without end.
//
// After a change over the control socket, follow() looks at the identities
// touched: a subscription whose notifier, route, lifetime or mode changed
// is ended (unsubscribed, Expires: 0) and made anew; one that is gone is
// ended. stop() ends every subscription: sipevent sends the SUBSCRIBE with
// Expires: 0 and lives on inside libre until it is answered, within the
// gateway's bounded shut-down. libre keeps an ended subscription, and with
// it the stack, until the notifier's final NOTIFY (RFC 6665) or 10 s: a
// notifier that never sends it keeps the stack busy until the shut-down's
// bound, after which libre reports the stack's sockets as still in use.
//
// Owned by the Gateway, which registers it with the registrar as a
// BindingListener; it borrows the registrar, the trunks and the clock, which
// outlive it. Everything runs on libre's thread.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "CNameAddr.h"
#include "LS_IIdentity.h"
#include "LS_IMwiSubscription.h"
#include "RefPtr.h"
#include "ScriptSession.h"
#include "registrar/BindingListener.h"
#include "registrar/Registrar.h"
#include "sip/DialogHandler.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/RequestHandler.h"
#include "trunks/OutboundRoute.h"
#include "trunks/TrunkRegistrations.h"

class Exchange;

class MessageWaiting final : public RequestHandler, public DialogHandler, public BindingListener {
 public:
  MessageWaiting(ScriptSession& session, LibraryClock& clock, Registrar& registrar)
      : m_session(session), m_clock(clock), m_registrar(registrar) {}
  ~MessageWaiting();
  MessageWaiting(MessageWaiting const&) = delete;
  MessageWaiting& operator=(MessageWaiting const&) = delete;

  // Listens for in-dialog NOTIFYs on the stack (behind the front-end's
  // listener) and subscribes every identity in explicit mode. dns: the
  // stack's, for notifiers named by host name. False with an error text
  // when sipevent cannot listen.
  bool start(sip& stack, dnsc* dns, TrunkRegistrations& trunks, std::string& error);
  void follow(std::vector<RefPtr<LS_IIdentity>> const& touched,
              std::vector<LS_IIdentity const*> const& removed);
  void followAll();
  void stop();

  // An out-of-dialog NOTIFY.
  void handle(Exchange& exchange) override;
  Verdict inDialog(sip_msg const& request) override;
  void onBound(LS_IIdentity* identity, bool first) override;
  void onUnbound(LS_IIdentity*) override {}

  // One line per identity with a message-waiting face in explicit or
  // implicit mode: "PATH MODE STATE notifier HOST:PORT [learnt] messages
  // yes|no|unknown [voice NEW/OLD (NEW/OLD)]".
  std::vector<std::string> describe() const;
  // Subscriptions by state (subscribing, subscribed, pending, failed,
  // implicit), and the NOTIFYs sent on to phones since the start.
  std::map<std::string, uint64_t> countByState() const;
  uint64_t notifiesRelayed() const { return m_relayed; }

 private:
  enum class State { SUBSCRIBING, SUBSCRIBED, PENDING, FAILED, IMPLICIT };
  static char const* nameOf(State state);

  // What the message server said last.
  struct Summary {
    bool known = false;
    std::string body;  // as received, passed on unchanged
    std::string contentType;
    std::string waiting;  // "yes" or "no", as the body says it
    std::string voice;    // the Voice-Message value, empty when absent
  };

  struct Subscriber {
    MessageWaiting* owner;
    RefPtr<LS_IIdentity> identity;
    RefPtr<LS_IMwiSubscription> face;
    std::string path;
    std::string user;
    LS_MwiSubscriptionMode::Type mode;
    // The configured notifier and what set() compares: the host-port to
    // subscribe at (the TLS one over TLS), and whether over TLS.
    CHostPort notifier;
    bool tls = false;
    std::string transport;  // ";transport=..." of the preferred transport, or empty
    std::string hops;       // the face's proxies and forced destination, for same()
    uint32_t lifetime;
    // The notifier subscribed at now: the configured one, or one a 3xx named.
    CHostPort current;
    bool learnt = false;
    // Implicit mode: the notifier's addresses, the port aside.
    std::vector<sa> addresses;
    dns_query* lookup = nullptr;
    std::unique_ptr<OutboundRoute> route;
    sipsub* subscription = nullptr;
    State state;
    std::string lastFailure;
    // Drops a failed subscription outside sipevent's own call, then waits
    // retryMs and subscribes anew.
    tmr timer;
    uint64_t retryMs = 0;
    Summary summary;
  };

  std::vector<std::unique_ptr<Subscriber>> findAll();
  std::unique_ptr<Subscriber> find(LS_IIdentity* identity, std::string const& path);
  Subscriber* subscriberOf(LS_IIdentity const* identity) const;
  // The identity's subscriber becomes candidate (none when null): left
  // alone when the same, else the old one ended and the new one begun.
  void replace(LS_IIdentity const* identity, std::unique_ptr<Subscriber> candidate);
  static bool same(Subscriber const& a, Subscriber const& b);
  void begin(Subscriber& subscriber);
  void end(Subscriber& subscriber);
  void subscribe(Subscriber& subscriber);
  void retryLater(Subscriber& subscriber, unsigned int seconds, std::string const& failure);
  void forgetLearnt(Subscriber& subscriber);
  void resolve(Subscriber& subscriber);
  void report(std::string const& line);
  // Keeps the NOTIFY's body as the subscriber's state and sends it on to
  // every binding of the identity.
  void take(Subscriber& subscriber, sip_msg const& notify);
  void relay(Subscriber& subscriber);
  bool fromNotifier(Subscriber const& subscriber, sa const& source) const;

  static void onNotify(sip* stack, sip_msg const* notify, void* subscriber);
  static void onClose(int error, sip_msg const* answer, sipevent_substate const* state, void* subscriber);
  static void onDrop(void* subscriber);
  static void onRetry(void* subscriber);
  static void onResolved(int error,
                         dnshdr const* header,
                         list* answers,
                         list* authorities,
                         list* additionals,
                         void* subscriber);

  ScriptSession& m_session;
  LibraryClock& m_clock;
  Registrar& m_registrar;
  sip* m_stack = nullptr;
  dnsc* m_dns = nullptr;
  TrunkRegistrations* m_trunks = nullptr;
  sipevent_sock* m_events = nullptr;
  std::vector<std::unique_ptr<Subscriber>> m_subscribers;
  // m_subscribers by identity: a REGISTER that adds a contact and every
  // NOTIFY ask for one, which would otherwise walk them all.
  std::unordered_map<LS_IIdentity const*, Subscriber*> m_byIdentity;
  // Subscribers ended while a callback of theirs may still come (a
  // subscription's challenge during its unsubscription): kept until the
  // object dies.
  std::vector<std::unique_ptr<Subscriber>> m_retired;
  uint64_t m_relayed = 0;
  uint32_t m_sequence = 0;
};
