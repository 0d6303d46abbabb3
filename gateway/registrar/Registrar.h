// Registrar: REGISTER as a registrar answers it. The To URI names the
// identity; the library gives the realms to challenge with and the passwords
// to check a digest response against; accepted contacts are recorded on the
// identity's own inbound-registration face (a dynamic one is created when it
// has none), each removed when its time runs out.
//
// Decisions, with their reasons:
// - Expiry: the contact's "expires" parameter, else the Expires header,
//   else the default lifetime of the face's range, or of the gateway's own
//   when the face has none (ExpiryRange); above the maximum it is cut to
//   the maximum; a non-zero value below the minimum gets 423 with
//   Min-Expires (RFC 3261 section 10.3, step 7), and then no contact of the
//   request is applied.
// - The binding a Contact names: with +sip.instance, the binding of that
//   instance (and reg-id, when given), whatever its URI or Call-ID, so that
//   a phone rebooted onto another port or address replaces its binding
//   instead of leaving a dead one in front of callers (RFC 5626 section 6,
//   RFC 5627); otherwise the binding whose URI is equal by RFC 3261 section
//   19.1.4 (SipUriComparison).
// - A binding keeps its Contact's parameters but expires (ContactHeader):
//   the 200 lists the identity's own bindings in effect (the ones this
//   gateway holds for it), each as registered with its parameters and its
//   remaining seconds, with a Date (section 10.3, step 8). Its q goes to
//   the face as the contact's priority, in thousandths, for the Redirector.
// - NAT (NatTraversal): a Contact no caller can reach, registered from
//   elsewhere, is filed on the face with the source's address and port,
//   and the 302 names that. Over UDP, --nat-ping keeps the mapping open
//   (NatPinger) and drops a binding whose phone stops answering. Over TCP
//   and TLS such a binding lives as long as the connection it came on, the
//   one way in to the phone: libre tells a connection's keep-alives when it
//   closes, so one is attached with an interval of kConnectionWatchSeconds
//   (46 days), which no phone is pinged at, since most do not answer CRLF
//   pings (only RFC 5626 asks them to). libre closes a connection idle for
//   15 minutes, and the binding goes with it.
// - The identity is told it is registered when its first binding comes and
//   unregistered when its last one goes (removed, expired or shut down).
// - At most kMaximumContacts per request (400 beyond) and kMaximumBindings
//   per identity, so that no phone can grow the gateway's memory at will.
//   The request's removals are applied first and its refreshes and
//   replacements take no room; a new binding beyond the limit takes the
//   place of the identity's binding that would expire first among those
//   the request does not touch, and the replacement is logged, as
//   Asterisk's remove_existing does: phones take a 403 as final and would
//   stop registering, whereas the binding given up is the stalest.
// - A user that only the "DEFAULT" group answers registers as a dynamic
//   identity of the user's name, which its location service bases on the
//   group: a contact on the group's own face would be inherited by every
//   member. The registrar removes that identity again when its last binding
//   goes, so that the group answers the user as before. The group's own
//   name cannot register (403).
// - Who may register, and with what credentials, is the Authenticator's
//   to decide; a To that denotes no identity is answered by it too. Before
//   it, the filter rules of the resolved identity's inbound-registration
//   face (the group's, for a user only "DEFAULT" answers) may deny the
//   source (InboundFilter): 403, and no nonce is spent on it.
// - Stateless, as RFC 3261 section 10.3 lets a registrar be: nothing is kept
//   for a request until it is authenticated, and its answer leaves without a
//   server transaction. A contact whose binding has the request's Call-ID
//   is checked against the binding's CSeq: the same CSeq is a retransmission,
//   answered again with the bindings in effect and changing nothing; a lower
//   one fails the whole request with 400 (the section says only that it
//   fails; 400 is what peers answer). Another Call-ID replaces the binding.
//   That alone cannot tell a retransmission once its binding is gone: a
//   request the Authenticator admits as REPEATED (its credentials used by
//   the same request from the same source moments ago) is answered as a
//   retransmission whatever the bindings say, and never applied again.
// - A Contact value longer than kMaximumContactText is refused (400): each
//   200 lists every binding with its parameters, and an answer a query can
//   make many kilobytes long is an amplifier. 1 KiB leaves room for the
//   push-notification parameters (pn-prid, pn-param, pn-provider) that
//   mobile phones put in their Contact, several hundred bytes of them.
//
// - Every binding added, refreshed or removed (by a REGISTER, by running
//   out, or by losing its way in) is reported to the binding store when
//   there is one, except one bound to its connection (an outbound flow over
//   TCP, TLS or WebSocket, with a reg-id), which dies with the process and
//   which replace() therefore leaves in place. What the store hands back
//   (at start, or another gateway's changes) comes in through replace(),
//   which reports nothing back; a binding restored so resumes NAT pings and
//   connection watches only when its phone next registers. A Call-ID or
//   Contact the store could not hold (StorableText) gets 400. Identities a
//   change removed are let go of in memory only when others share the
//   store, whose configuration may still have them.
//
// Owns the bindings' timers: destroying the registrar removes every binding
// from its face first, so that the global count of registered contacts
// comes back to where it started. Everything runs on libre's thread.
#pragma once

#include <algorithm>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "CNameAddr.h"
#include "LS_IIdentity.h"
#include "LS_IRegistrationInbound.h"
#include "RefPtr.h"
#include "registrar/Authenticator.h"
#include "registrar/BindingListener.h"
#include "registrar/ContactHeader.h"
#include "registrar/ExpiryRange.h"
#include "registrar/NatPinger.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/MonotonicTimer.h"
#include "sip/RequestHandler.h"
#include "store/BindingStore.h"

class Exchange;

class Registrar final : public RequestHandler {
 public:
  static constexpr size_t kMaximumBindings = 32;
  static constexpr size_t kMaximumContacts = 16;
  // The longest Contact value kept (URI and parameters): with
  // kMaximumBindings, what one 200 can list stays within 16 KiB.
  static constexpr size_t kMaximumContactText = 1024;

  static constexpr uint32_t kConnectionWatchSeconds = 4000000;

  explicit Registrar(LibraryClock& clock) : m_clock(clock), m_authenticator(clock) {}
  ~Registrar();
  Registrar(Registrar const&) = delete;
  Registrar& operator=(Registrar const&) = delete;

  // Before the first request: the stack that connections and NAT pings
  // belong to, the range for faces that give none, and the NAT ping
  // interval (0 for none).
  void start(sip& stack, ExpiryRange const& expiry, uint32_t natPingSeconds);
  void handle(Exchange& exchange) override;
  Authenticator& authenticator() { return m_authenticator; }

  size_t bindingCount() const { return m_expiries.size(); }

  // Borrowed; null for none. Set before the first request; the registrar
  // reports nothing to it once it is being destroyed.
  void setStore(BindingStore* store) { m_store = store; }
  BindingStore* store() const { return m_store; }
  // Borrowed; each must outlive the registrar or be added to no registrar.
  void addListener(BindingListener* listener) { m_listeners.push_back(listener); }
  // For a listener that dies first; not from inside a notice, which still
  // reaches every listener it began with.
  void removeListener(BindingListener* listener) {
    m_listeners.erase(std::remove(m_listeners.begin(), m_listeners.end(), listener), m_listeners.end());
  }
  // Makes the identity's bindings exactly these (on MonotonicClock),
  // without reporting to the store; dynamic: the identity was created for
  // them. False when the identity has no registration face to hold them.
  bool replace(RefPtr<LS_IIdentity> const& identity,
               bool dynamic,
               std::vector<StoredBinding> const& bindings);
  // The identities holding bindings, as (service, identity) names.
  std::vector<BindingStore::IdentityName> boundIdentities() const;
  uint64_t failedAuthentications() const { return m_authenticator.failures(); }
  uint64_t bindingsDropped() const { return m_bindingsDropped; }
  // Lets go of the bindings of identities a change removed (counted in
  // bindingsDropped): those listed, or, when checkAll (a whole location
  // service went), every identity no longer found under its name in its
  // service. Bindings of identities that remain are kept as they are.
  void dropRemoved(std::vector<LS_IIdentity const*> const& removed, bool checkAll);

  // Where a call to an identity goes: each contact in effect on its face,
  // the static ones as configured, the registered ones with the flow they
  // registered on. route is empty when the URI itself is the way in;
  // otherwise it names the flow: the connection (TCP, TLS, WebSocket),
  // which a phone's listening port never is, or the NATed UDP source.
  struct CallTarget {
    std::string uri;    // the Request-URI: the contact as registered
    std::string route;  // "sip:ADDR:PORT;transport=..." or empty
    // With a route: the contact URI over the flow, the target of the
    // dialog's later requests (NatTraversal::flowTarget).
    std::string flow;
    unsigned int q;  // thousandths
  };
  std::vector<CallTarget> callTargets(LS_IIdentity* identity) const;

  // One binding as the bindings question shows it.
  struct BindingView {
    LS_IIdentity const* identity;
    std::string contact;  // as the REGISTER wrote it
    uint64_t remainingMs;
    std::string callId;
    std::string source;  // "udp:ADDR:PORT": where the REGISTER came from
  };
  // The bindings held now; only the identity's when one is given.
  std::vector<BindingView> bindings(LS_IIdentity const* identity) const;

 private:
  struct Bindings;
  struct Binding;
  // Every binding by the time it runs out, earliest first. One timer
  // serves them all, set for the earliest: a timer per binding would cost a
  // descriptor each, or on the stack's timers, which it keeps on one sorted
  // list that each new timer walks, make every transaction's own timers
  // cost as many steps as there are bindings.
  using Expiries = std::multimap<uint64_t, Binding*>;
  // What a binding holds: what the registration said and where it came from.
  struct Binding {
    Binding() = default;
    ~Binding() { mem_deref(connection); }
    Binding(Binding const&) = delete;
    Binding& operator=(Binding const&) = delete;

    Registrar* registrar;
    Bindings* owner;
    CNameAddr contact;  // as filed on the face: where calls go
    std::string uri;    // the Contact's URI as registered
    std::string parameters;
    std::string instance;
    std::string regId;
    std::string callId;
    uint32_t cseq;
    uint64_t expiresAtMs;       // on MonotonicClock
    sa source;                  // where the REGISTER came from
    sip_transp transport;       // and over what
    Expiries::iterator expiry;  // its entry in m_expiries
    // Over TCP or TLS, for a NATed contact: the watch on its connection.
    sip_keepalive* connection = nullptr;
  };
  // One identity's bindings, oldest first.
  struct Bindings {
    RefPtr<LS_IIdentity> identity;
    bool dynamic = false;  // created by this registrar for a "DEFAULT" user
    RefPtr<LS_IRegistrationInbound> face;
    std::vector<std::unique_ptr<Binding>> all;
    // The names the store files the bindings under, read once.
    std::string serviceName;
    std::string identityName;
  };
  // One Contact of a REGISTER, checked and with its expiry worked out.
  struct ContactRequest {
    ContactHeader header;
    uint32_t expires;
  };

  // The identity whose face takes the contacts: resolved itself, or for a
  // user the group answers, a dynamic identity of the user's name (created
  // set then). Null when there is none.
  RefPtr<LS_IIdentity> registering(LS_IIdentity* resolved, CNameAddr const& to, bool& created);
  // The contacts of one accepted REGISTER applied and answered; repeated:
  // the Authenticator found it applied already, and it is only answered.
  void update(Exchange& exchange, RefPtr<LS_IIdentity> const& identity, bool created, bool repeated);
  // Drops the identity's table entry when it holds no binding, and a
  // dynamic identity made for it with it.
  void forgetIfUnbound(LS_IIdentity* identity, bool created);
  // What the request's CSeq makes of it against the bindings it names (all
  // of them for a wildcard) that carry its Call-ID.
  enum class Order { NEW, RETRANSMITTED, OUT_OF_ORDER };
  static Order order(Bindings& bindings,
                     std::vector<ContactRequest> const& requests,
                     bool wildcard,
                     pl const& callId,
                     uint32_t cseq);
  // The binding a contact names, or null.
  static Binding* find(Bindings& bindings, ContactHeader const& contact);
  // Files the contact on the face as binding (null for a new one); the
  // binding, or null when the face refused it.
  Binding* add(Bindings& bindings,
               ContactRequest const& request,
               sip_msg const& message,
               CHostPort const& received,
               Binding* binding);
  // Makes room for one more binding: removes the one that expires first
  // among those not in kept, and logs it.
  void giveWay(Exchange& exchange,
               Bindings& bindings,
               std::vector<Binding*> const& kept,
               ContactRequest const& newcomer);
  // The table entry for identity, its names read when it is new.
  Bindings& entryOf(RefPtr<LS_IIdentity> const& identity);
  // Where calls to a contact registered from source over transport go:
  // the contact, or for a NATed one the source, whose URI natedTarget then
  // receives (it stays empty otherwise).
  static CNameAddr targetOf(ContactHeader const& header,
                            sa const& source,
                            sip_transp transport,
                            std::string& natedTarget);
  // What add() and restore() share: files header on the face under target
  // as binding (null for a new one) and records what it says and where it
  // came from. Null when the face refused it. The caller sets the rest
  // (CSeq, transport, expiry) and schedules the binding.
  Binding* file(Bindings& bindings,
                Binding* binding,
                ContactHeader const& header,
                CNameAddr const& target,
                std::string const& callId,
                sa const& source,
                CHostPort const& received,
                uint32_t expires);
  // Files a stored binding on the face as add() files a REGISTER's.
  void restore(Bindings& bindings, StoredBinding const& stored, uint64_t now);
  void record(StoreChange::Kind kind, Binding const& binding);
  static bool boundToFlow(Binding const& binding) {
    return !binding.regId.empty() && binding.transport != SIP_TRANSP_UDP;
  }
  // Drops the binding from the table only, when its face no longer has it.
  void forget(Binding& binding);
  // Leaves telling the identity to the caller.
  void removeAll(Bindings& bindings);
  // Removes one binding from its face and the table; tells the identity when
  // it was its last. Invalidates binding.
  void remove(Binding& binding);
  // Tells the identity when its first binding came or its last went, and
  // the listeners that and whether a new one came (added).
  void reportTransition(Bindings& bindings, size_t before, bool added = false);
  // The 200's own header lines: the bindings, the date, what is supported.
  static std::string bindingHeaders(Bindings const& bindings);
  // (Re)files the binding under its time; sets the timer when it is now
  // the earliest.
  void schedule(Binding& binding);
  void unschedule(Binding& binding);
  // Sets the timer for the earliest expiry, or stops it.
  void rearm();
  // Drops every binding of the table entry's identity, and the entry.
  void drop(std::map<LS_IIdentity*, Bindings>::iterator entry);
  // Removes every binding whose time has run out.
  static void onSweep(void* registrar);
  // Removes a binding outside a request: expired (reason null), or its way
  // in gone, its connection closed or its NAT pings unanswered (logged with
  // reason).
  void lose(Binding& binding, char const* reason);
  static void onConnectionClosed(int error, void* binding);
  static void onPingsUnanswered(void const* binding, void* registrar);

  LibraryClock& m_clock;
  BindingStore* m_store = nullptr;
  bool m_replacing = false;  // in replace(): changes come from the store
  sip* m_stack = nullptr;
  ExpiryRange m_expiry;
  std::unique_ptr<NatPinger> m_pinger;
  Authenticator m_authenticator;
  std::map<LS_IIdentity*, Bindings> m_bindings;
  Expiries m_expiries;
  MonotonicTimer m_sweep;
  uint64_t m_bindingsDropped = 0;
  std::vector<BindingListener*> m_listeners;
};
