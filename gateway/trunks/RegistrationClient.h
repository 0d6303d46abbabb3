// RegistrationClient: one registration of the gateway at a carrier's
// registrar (RFC 3261 section 10), refreshed before it expires, on libre's
// transaction layer, dialog (Call-ID, CSeq, route set) and digest client.
// What the trunk decides (which registrar, when to try again, what to log)
// belongs to TrunkRegistrations, not here.
//
// Decisions, with their reasons:
// - It takes the place of libre's sipreg, whose logic it follows (refresh at
//   90 % of the granted expiry, 401/407 answered once per request, 423
//   answered with the Min-Expires asked for, an unregistration sent and
//   awaited when the owner lets go). sipreg writes its Contact itself, from
//   the local address of the socket at each send, and offers no way to name
//   another address; the address a NAT maps the gateway to (below) could not
//   be registered through it. Only the Contact and the checks differ; the
//   requests remain libre's (sip_drequestf), so retransmission, RFC 3263
//   resolution, connections and digest stay in libre.
// - Address detection (RFC 3581), over UDP: a 2xx whose top Via carries
//   received or rport unlike the Contact's address and port makes the client
//   register again at once, with that address:port in the Contact, and
//   from then on. Not over TCP or TLS: the port a NAT maps a connection to
//   listens for nothing, and the connection itself carries what the
//   registrar sends back.
// - The old Contact goes away in the same REGISTER: without flows it is
//   listed again with expires=0 (RFC 3261 section 10.2.2), so that the
//   registrar never holds a binding to an address that cannot be reached;
//   with flows the new Contact alone is sent, since the registrar replaces
//   the binding of the same +sip.instance and reg-id (RFC 5626 section 6),
//   and would take an expires=0 of that pair as the end of the new one.
// - Flows (RFC 5626): a reg-id other than 0 puts +sip.instance and reg-id in
//   the Contact and "Supported: outbound" in the REGISTER. When the 2xx
//   answers "Require: outbound", the registrar keeps the flow, and libre's
//   keep-alive watches it (sip_keepalive: a CRLF ping awaiting its pong over
//   TCP and TLS, a STUN binding request over UDP, which also fails when the
//   mapped address changes), every Flow-Timer seconds when the 2xx gives
//   one, else every flowInterval. Without that header there is no flow and
//   no keep-alive of the client's own. A flow that breaks is told once
//   through onFlowLost and the registration counts as gone, with no
//   unregistration over a new connection: the registration that forms the
//   next flow replaces its binding.
// - The source check: with checkSource, an answer from an address (the port
//   aside) the request was not sent to, among those libre resolved the next
//   hop to, is not acted upon (a spoofed 401 is not answered, a spoofed 2xx
//   registers nothing) and is reported as EPERM with the answer.
// - A failure (no answer, a transport error, a final non-2xx, a refused
//   source) is reported through onResponse and the client does nothing more:
//   no retry of its own, since the configuration of the trunk says when to
//   try again; the owner releases it.
//
// Ownership: start() hands a new client to the caller, who gives it back
// with release(). A client registered (or with a request pending) then
// lives on by itself until its unregistration is answered or fails, calling
// no handler but the challenge handler, whose argument must outlive it.
// Everything runs on libre's thread; onResponse and onFlowLost may release
// the client.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"

class RegistrationClient {
 public:
  using FlowLostHandler = void (*)(int error, void* argument);

  struct Settings {
    std::string registrarUri;
    std::string addressOfRecord;
    // The user part of the Contact.
    std::string user;
    // The Route set, first hop first (loose routing); empty for none.
    std::vector<std::string> routes;
    uint32_t lifetime = 3600;
    bool detectAddress = false;
    bool checkSource = false;
    // 0: no flow. Else the Contact's reg-id, with instance as +sip.instance.
    int regId = 0;
    std::string instance;
    // Seconds between keep-alives of a flow whose 2xx gives no Flow-Timer.
    uint32_t flowInterval = 0;
  };

  // 0 with client set, or the error of the first REGISTER's sending.
  static int start(RegistrationClient*& client,
                   sip& stack,
                   Settings const& settings,
                   sip_auth_h* onChallenge,
                   sip_resp_h* onResponse,
                   FlowLostHandler onFlowLost,
                   void* argument);
  // Takes client back and nulls it; null is ignored.
  static void release(RegistrationClient*& client);

  // libre's keep-alive watches the registration's flow.
  bool keepsFlowAlive() const { return m_flow != nullptr; }

  // The address:port the top Via of answer says the registrar saw it come
  // from: received, else the sent-by address, with rport, else the sent-by
  // port (RFC 3581). False when the Via has neither, or an rport without a
  // value (what the request itself asked for).
  static bool addressSeenBy(sip_msg const& answer, sa& address);

  RegistrationClient(RegistrationClient const&) = delete;
  RegistrationClient& operator=(RegistrationClient const&) = delete;

 private:
  RegistrationClient(sip& stack, Settings const& settings);
  ~RegistrationClient();

  int request(bool resetLoop);
  // The request ended badly: reported, or the end of a released client.
  void fail(int error, sip_msg const* answer);
  void accepted(sip_msg const& answer);
  bool sentTo(sa const& source) const;
  static int onSend(enum sip_transp transport,
                    sa const* source,
                    sa const* destination,
                    mbuf* message,
                    void* client);
  static void onAnswer(int error, sip_msg const* answer, void* client);
  static bool onContact(sip_hdr const* header, sip_msg const* answer, void* client);
  static void onRefresh(void* client);
  static void onFlow(int error, void* client);

  sip& m_stack;
  Settings const m_settings;
  sip_auth_h* m_onChallenge = nullptr;
  sip_resp_h* m_onResponse = nullptr;
  FlowLostHandler m_onFlowLost = nullptr;
  void* m_argument = nullptr;
  sip_dialog* m_dialog = nullptr;
  sip_auth* m_auth = nullptr;
  // Borrowed from libre while pending; libre nulls it when it ends.
  struct sip_request* m_request = nullptr;
  sip_keepalive* m_flow = nullptr;
  sip_loopstate m_loop{};
  tmr m_timer;
  // The lifetime asked for; the Min-Expires of a 423, 0 once released.
  uint32_t m_expires;
  // The expiry the registrar granted to the Contact, in seconds.
  uint32_t m_granted = 0;
  // The Contact of the last REGISTER sent and its address.
  std::string m_contact;
  sa m_contactAddress{};
  // The address RFC 3581 learnt; unset until then.
  sa m_public{};
  // A Contact registered before the address changed, removed by the next
  // REGISTER; empty when none.
  std::string m_stale;
  // Where the current request went, each address libre tried.
  std::vector<sa> m_destinations;
  bool m_registered = false;
  bool m_released = false;
};
