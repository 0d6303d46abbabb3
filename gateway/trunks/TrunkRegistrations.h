// TrunkRegistrations: the gateway's own registrations. At start every identity
// (not a group) whose outbound-registration face has a registrar, configured
// or else learnt, registers there through a RegistrationClient: the address of
// record is the face's URI scheme with the identity's name at the registrar's
// host, the lifetime is the face's, and the face's first proxy, when there is
// one, is the route (libre routes loosely only, so a proxy configured for
// strict routing is routed loosely too). A 401 or 407 is answered with the
// library's outbound credentials for the challenge's realm; the client
// refreshes a registration before it expires.
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
// decides. The registrar's address (where the 2xx came from) is recorded with
// setRegistrarAddr. Progress goes to standard error, one line per event; a
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
// registrar) unregisters, one whose registrar, address of record, route,
// lifetime, NAT traversal or DNS check changed unregisters and registers
// anew, and the rest are left alone, registered as they are. follow()
// looks only at the identities the change touched (see ModelChanges);
// followAll() at every identity, which with 100,000 subscribers takes a
// quarter of a second, for the rare change that adds or removes a whole
// location service.
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
// the stack run for a bounded time. Owned by the Gateway; everything runs on
// libre's thread.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "LS_IIdentity.h"
#include "LS_IOutbound.h"
#include "LS_IRegistrationOutbound.h"
#include "RefPtr.h"
#include "ScriptSession.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "trunks/RegistrationClient.h"
#include "trunks/TrunkKeepAlive.h"
#include "trunks/TrunkTls.h"

class TrunkRegistrations {
 public:
  TrunkRegistrations(sip& stack, ScriptSession& session, LibraryClock& clock)
      : m_stack(stack), m_session(session), m_clock(clock) {}
  ~TrunkRegistrations();
  TrunkRegistrations(TrunkRegistrations const&) = delete;
  TrunkRegistrations& operator=(TrunkRegistrations const&) = delete;

  // The CA certificates a TLS carrier is verified against instead of the
  // system's; before start().
  void useCaFile(std::string const& file) { m_caFile = file; }
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
    // The identity's name, the user part of the contact registered.
    std::string user;
    std::string registrarUri;
    std::string addressOfRecord;
    std::string route;
    // The host the stack resolves: the proxy's when there is one, else the
    // registrar's.
    std::string nextHop;
    // The last failure reported, empty once registered.
    std::string lastFailure;
    // The host whose certificate a TLS registration verifies; empty when
    // the trunk registers over a plain transport.
    std::string tlsHost;
    // For trunkAt(): the face's numeric registrar and proxy hosts, and the
    // addresses registrations were answered from.
    std::vector<sa> carrierAddresses;
    uint32_t lifetime;
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
    std::unique_ptr<TrunkKeepAlive> keepAlive;
  };

  // Every trunk the model describes now, none registering yet.
  std::vector<std::unique_ptr<Trunk>> findTrunks();
  std::unique_ptr<Trunk> findTrunk(LS_IIdentity* identity, std::string const& path);
  void registerTrunk(Trunk& trunk);
  void unregisterTrunk(Trunk& trunk);
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
  std::string m_instanceFile;
  // Read at the first trunk with flows; empty until then, or when it
  // cannot be had (told once).
  std::string m_instance;
  bool m_instanceTried = false;
};
