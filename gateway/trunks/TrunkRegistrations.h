// TrunkRegistrations: the gateway's own registrations. Every identity (not a
// group) whose outbound-registration face has a registrar, configured or
// else learnt, is a trunk and registers there through a RegistrationClient,
// as its registration mode and priority say (below): the address of record
// is the face's URI scheme with the identity's name at the registrar's host,
// the lifetime is the face's, and the face's hops (RegistrationRoute: forced
// destination, proxies, penalty box) are the route (libre routes loosely
// only, so a proxy configured for strict routing is routed loosely too). A
// 401 or 407 is answered with the library's outbound credentials for the
// challenge's realm; the client refreshes a registration before it expires.
//
// The registration mode, with the decision for "none":
// - "auto": the trunk registers from the start, and stays registered.
// - "back-to-back": the trunk registers only while at least one phone of the
//   same identity is registered at the gateway (BindingListener: its first
//   binding registers it, its last binding going unregisters it), so that
//   the carrier reaches the subscriber through the gateway only while the
//   subscriber can answer; the identity is then both a subscriber and a
//   trunk, and a call from its carrier reaches its phones (see Calls).
// - "none" registers as "auto" does. It is the face's default, so every
//   configuration that names a registrar and no mode relies on it to
//   register, as every trunk did before modes were followed; an identity
//   that is not to register has no registrar.
// Among the trunks of one account (identities of the same name), the
// face's priority decides which register (TrunkSelection).
//
// What the registrar's answers teach is written back into the face, and
// forgotten (removed from the face) when the registration that learnt it
// ends: unregistered, failed, standing by, removed or changed by a control
// line, or shut down; a value the operator set is never removed.
// - A 3xx's first Contact becomes the dynamic registrar (setDynamicRegistrar)
//   and the trunk registers there at once (RegistrationRoute says how); at
//   most kMaximumRedirects in a row, then the 3xx counts as a client error.
//   The face's dump does not show it: the control socket's trunks command
//   does, as "(learnt)" after the registrar in use.
// - A 2xx's first Service-Route (RFC 3608) becomes the dynamic proxy
//   (setDynamicProxy, strict unless it has lr), which the face's dump shows
//   as its first Proxy, and which routes the identity's calls out
//   (OutboundRoute). Each 2xx replaces it, one without any removes it. The
//   REGISTER itself does not take it (see RegistrationRoute), and could
//   not: the client refreshes along the route it was made with, and making
//   a new one would unregister the very contact first.
// - The address the 2xx came from is recorded with setRegistrarAddr (the
//   face has no way to remove it).
//
// The face's non-INVITE transaction timeout bounds the first REGISTER of
// each registration, its answer to a challenge included: no final answer
// within it is a system error, as libre's own timeout would be. 0 leaves
// libre's. It does not bound the refreshes, which the client sends on a
// timer of its own, and libre's transactions run on their fixed 64*T1
// (32 s).
//
// A trunk registers over TLS when its face's URI scheme is sips or the face
// names a TLS registrar (which then takes the place of the plain one); its
// proxy is then reached over TLS too, and the carrier's certificate is
// verified (TrunkTls, against --ca-file when given).
//
// On failure the registration is dropped and made anew after the face's
// retry timeout for that class of error: system (no answer, transport
// failure), server (5xx) or client (any other final failure, 4xx and 6xx),
// instead of a back-off of the client's own, so that the configuration
// decides. With the face's penalty box on, a hop that gave no answer or 503
// is boxed (PenaltyBox, shared with the calls) and the next attempt takes
// the next hop. Progress goes to standard error, one line per event; a
// failure like the one before it is not told again, so that a carrier whose
// name does not resolve, retried every few seconds for days, leaves one line
// and not thousands.
//
// A registrar or proxy named by host name is found by the stack's DNS client
// (RFC 3263), anew for every REGISTER the client sends, refreshes included,
// so that a carrier moving its servers is followed without a restart. Between
// registrations a TrunkKeepAlive keeps the path to the registrar open as
// the face's keep-alive settings say; when it finds the registrar gone, the
// trunk registers anew after the retry timeout for system errors.
//
// After a change made while serving, the registrations follow the model:
// a trunk that is new registers, one that is gone (or no longer has a
// registrar) unregisters, one whose registrar, address of record, hops,
// lifetime, mode, priority, NAT traversal or DNS check changed unregisters
// and registers anew, and the rest are left alone, registered as they are.
// follow() looks only at the identities the change touched (see
// ModelChanges); followAll() at every identity, which with 100,000
// subscribers takes a quarter of a second, for the rare change that adds or
// removes a whole location service.
//
// NAT traversal, as the face says (RegistrationClient tells how): with the
// method "address-detection" the Contact carries the address and port the
// registrar saw (RFC 3581); with flows ("nat-traversal-flows" on the face,
// or "use-flows" on its outbound face) the REGISTER asks for an RFC 5626
// flow, with the gateway's instance URN (InstanceId) and reg-id 1, since a
// trunk registers over one flow at a time. While libre's keep-alive watches
// a flow, the trunk's TrunkKeepAlive stays idle, so that one path is never
// kept twice; a flow that breaks counts as a lost registrar. With the DNS
// security check on, an answer from an address the next hop did not
// resolve to is refused: the registration fails as a system error, and the
// line names the address.
//
// stop() unregisters: it releases every RegistrationClient, which sends its
// REGISTER with expiry 0 and lives on until answered; the caller then lets
// the stack run for a bounded time; nothing registers after it. Owned by the
// Gateway; it borrows the registrar it follows the bindings of, which
// outlives it, and leaves its listeners when it dies. Everything runs on
// libre's thread.
#pragma once

#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include "LS_IIdentity.h"
#include "LS_IOutbound.h"
#include "LS_IRegistrationOutbound.h"
#include "RefPtr.h"
#include "ScriptSession.h"
#include "registrar/BindingListener.h"
#include "registrar/Registrar.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "trunks/PenaltyBox.h"
#include "trunks/RegistrationClient.h"
#include "trunks/RegistrationRoute.h"
#include "trunks/TrunkKeepAlive.h"
#include "trunks/TrunkTls.h"

class TrunkRegistrations final : private BindingListener {
 public:
  static constexpr unsigned int kMaximumRedirects = 4;

  TrunkRegistrations(sip& stack, ScriptSession& session, LibraryClock& clock)
      : m_stack(stack), m_session(session), m_clock(clock) {}
  ~TrunkRegistrations();
  TrunkRegistrations(TrunkRegistrations const&) = delete;
  TrunkRegistrations& operator=(TrunkRegistrations const&) = delete;

  // The CA certificates a TLS carrier is verified against instead of the
  // system's; before start().
  void useCaFile(std::string const& file) { m_caFile = file; }
  // The registrar whose bindings back-to-back trunks follow; before
  // start(). Without it a back-to-back trunk never registers.
  void followBindings(Registrar& registrar);
  // Where the instance URN of trunks registering with flows is kept
  // (InstanceId); before start().
  void useInstanceFile(std::string const& file) { m_instanceFile = file; }
  void start();
  void follow(std::vector<RefPtr<LS_IIdentity>> const& touched,
              std::vector<LS_IIdentity const*> const& removed);
  void followAll();
  void stop();

  // The identity of the trunk whose carrier sent a request from source:
  // one of its registrar's or proxies' addresses, or the address its
  // registrar answered from. Addresses are compared without the port, since
  // a carrier's servers send from other ports than they listen on (every
  // connection they open has a port of its own); a registrar or proxy named
  // by host name is known by the address that answered the registration.
  // Null for any other source.
  RefPtr<LS_IIdentity> trunkAt(sa const& source) const;
  // The registrar URI identity registers at, transport=tls included, as
  // the trunk's REGISTER is sent; empty when identity is no trunk.
  std::string registrarOf(LS_IIdentity const* identity) const;
  // Lets a request over TLS to host verify the carrier as the trunks'
  // registrations do (TrunkTls); false with the reason in error.
  bool verifyTls(std::string const& host, std::string& error) {
    return m_tls.verify(m_stack, host, m_caFile, error);
  }

  // Shared with the calls out (OutboundRoute).
  PenaltyBox& penaltyBox() { return m_box; }
  // One line per trunk, for the control socket: its path, its state
  // (registered, registering, retrying, standby: a better trunk of its
  // account is registered, idle: back-to-back with no phone registered),
  // the registrar in use with "(learnt)" for one a 3xx named, and the hop.
  std::vector<std::string> describe() const;

  // Each trunk's "service/identity" path and whether it is registered now.
  template <class Visit>
  void forEach(Visit visit) const {
    for (std::unique_ptr<Trunk> const& trunk : m_trunks)
      visit(trunk->path, trunk->registered);
  }

 private:
  struct Trunk {
    TrunkRegistrations* owner;
    RefPtr<LS_IIdentity> identity;
    RefPtr<LS_IRegistrationOutbound> face;
    std::string path;
    // The identity's name, the user part of the contact registered, and
    // the account its trunks share (TrunkSelection).
    std::string user;
    std::string registrarUri;
    std::string addressOfRecord;
    RegistrationRoute::Configured configured;
    LS_RegistrationMode::Type mode = LS_RegistrationMode::NONE;
    uint32_t priority = 0;
    // Back-to-back: a phone of the identity is registered here.
    bool bound = false;
    // A registration is made or being made, or waits for its retry.
    bool active = false;
    // The last attempt failed and the retry waits.
    bool failed = false;
    // Where the current attempt went.
    RegistrationRoute::Attempt attempt;
    // The host the stack resolves: the first Route's, else the
    // Request-URI's.
    std::string nextHop;
    // The last failure reported, empty once registered.
    std::string lastFailure;
    // The host whose certificate a TLS registration verifies; empty when
    // the trunk registers over a plain transport.
    bool secure = false;
    std::string tlsHost;
    // For trunkAt(): the face's numeric registrar and proxy hosts, and the
    // addresses registrations were answered from.
    std::vector<sa> carrierAddresses;
    uint32_t lifetime;
    uint32_t answerTimeoutS = 0;
    // "HOST[:PORT]" of what this registration taught the face; empty when
    // nothing, so that only what it set is removed.
    std::string learntRegistrar;
    std::string learntProxy;
    unsigned int redirects = 0;
    // NAT traversal and the DNS security check, from the face.
    bool detectAddress = false;
    bool flows = false;
    bool checkSource = false;
    RegistrationClient* registration = nullptr;
    bool registered = false;
    // Drops a failed registration outside the client's own call, then waits
    // retryMs and registers anew.
    tmr timer;
    uint64_t retryMs = 0;
    // The face's non-INVITE transaction timeout on the first REGISTER.
    tmr answerTimer;
    std::unique_ptr<TrunkKeepAlive> keepAlive;
  };

  // Every trunk the model describes now, none registering yet.
  std::vector<std::unique_ptr<Trunk>> findTrunks();
  std::unique_ptr<Trunk> findTrunk(LS_IIdentity* identity, std::string const& path);
  void registerTrunk(Trunk& trunk);
  void unregisterTrunk(Trunk& trunk);
  // Registers or unregisters the account's trunks as TrunkSelection says;
  // nothing after stop().
  void reselect(std::string const& account);
  void reselectAll();
  void index(Trunk& trunk);
  void unindex(Trunk& trunk);
  Trunk* trunkOf(LS_IIdentity const* identity) const;
  bool hasPhones(LS_IIdentity* identity) const;
  // The registration failed for cause (system: no answer or a transport
  // error; else the response's code): the hop boxed where that counts,
  // what it taught forgotten, the failure told, the retry set.
  void fail(Trunk& trunk, int error, sip_msg const* response, std::string const& cause);
  // What a 3xx or 2xx taught, written into the face.
  bool learnRedirect(Trunk& trunk, sip_msg const& response);
  void learnServiceRoute(Trunk& trunk, sip_msg const& response);
  void forgetLearnt(Trunk& trunk);
  void onBound(LS_IIdentity* identity, bool first) override;
  void onUnbound(LS_IIdentity* identity) override;
  // The identity's trunk becomes candidate (none when null): left alone
  // when the same, else the old one retired and the new one registered.
  void replace(LS_IIdentity const* identity, std::unique_ptr<Trunk> candidate);
  static bool same(Trunk const& a, Trunk const& b);
  static void readTraversal(Trunk& trunk, LS_IRegistrationOutbound& face, LS_IOutbound* outbound);
  // What the trunk's RegistrationClient is to do; flows only when the
  // instance URN can be had.
  RegistrationClient::Settings clientSettings(Trunk& trunk);
  // Why the registrar's answer was refused, when its source was the fault.
  static std::string refusedSource(Trunk const& trunk, sip_msg const& answer);
  // One progress line on standard error, after the library's debug lines.
  void report(std::string const& line);
  // failure, with the retry time, unless it is the trunk's last one.
  void reportFailure(Trunk& trunk, std::string const& failure, unsigned int seconds);
  static int onChallenge(char** user, char** password, char const* realm, void* trunk);
  static void onResponse(int error, sip_msg const* response, void* trunk);
  static void onDropFailed(void* trunk);
  static void onKeepAliveFailed(int error, void* trunk);
  static void onRetry(void* trunk);
  static void onAnswerTimeout(void* trunk);

  sip& m_stack;
  ScriptSession& m_session;
  LibraryClock& m_clock;
  std::vector<std::unique_ptr<Trunk>> m_trunks;
  // Trunks follow() unregistered: their client lives on by itself until
  // the unregistration is answered, and may still ask its challenge
  // handler for credentials with the trunk as argument.
  std::vector<std::unique_ptr<Trunk>> m_retired;
  std::string m_caFile;
  TrunkTls m_tls;
  PenaltyBox m_box;
  Registrar* m_registrar = nullptr;
  bool m_stopped = false;
  // m_trunks by identity and by account, for the bindings' news and the
  // choice by priority, which would otherwise walk every trunk.
  std::unordered_map<LS_IIdentity const*, Trunk*> m_byIdentity;
  std::unordered_multimap<std::string, Trunk*> m_byAccount;
  std::string m_instanceFile;
  // Read at the first trunk with flows; empty until then, or when it
  // cannot be had (told once).
  std::string m_instance;
  bool m_instanceTried = false;
};
