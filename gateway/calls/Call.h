// Call: one call the gateway relays, as a back-to-back user agent on libre's
// session layer: the caller's INVITE ends here (the caller leg, a dialog of
// the gateway's with the caller), and the gateway places its own INVITE to
// each target (a branch, a dialog of the gateway's with the callee). libre
// keeps the transactions, dialogs, retransmissions, ACK and CANCEL of both;
// this class only carries what one leg says to the other.
//
// Decisions, with their reasons:
// - Forking (RFC 3261 section 16.6): targets of equal q ring together, a
//   lower q only once every higher one failed. The first 2xx wins and every
//   other branch is cancelled. Otherwise the best final answer goes back
//   (section 16.7: a 6xx at once; else the lowest class, 503 becoming 500).
// - The caller leg is accepted (libre's server transaction made) with the
//   first provisional answer of a branch, early SDP included, or with the
//   2xx. Until then the gateway has answered 100 Trying statelessly, and a
//   retransmitted INVITE or a CANCEL reaches Calls, which finds this call by
//   its Call-ID, From tag and CSeq: libre's session layer can only accept an
//   INVITE with an answer above 100, and a 180 sent before any phone rings
//   would tell the caller a lie.
// - SDP passes through unchanged: the caller's offer goes to every branch,
//   the winner's answer back. An INVITE without an offer is refused (488)
//   before any branch: libre's session layer answers an offer in a 2xx at
//   once, in the ACK, which a relay cannot (the answer is the caller's).
// - Early SDP goes back from one branch only, the first that sends it:
//   a caller can play one early media stream.
// - A branch that has not answered finally within the INVITE transaction
//   timeout is cancelled and counts as 408: libre waits for ever once a
//   phone rings.
// - A re-INVITE or UPDATE (hold, resume, a codec change) goes to the other
//   leg as the same request with the same body, and the final answer comes
//   back with its body; a 2xx to a relayed re-INVITE is acknowledged at once
//   on the leg that gave it. libre's session layer would answer a re-INVITE
//   itself, at once, which a relay cannot: the answer is the other phone's.
//   libre's server and client transactions carry them; one at a time per
//   call (491 to a second, RFC 3261 section 14.2).
// - A leg reached over a connection (TCP, TLS, WebSocket) or through NAT
//   keeps being reached that way: the dialog's remote target is its
//   Contact at the address the flow came from, as Kamailio's
//   fix_nated_contact makes it, set the moment libre makes the dialog, so
//   that the ACK of the 2xx, a re-INVITE and the BYE find the phone. The
//   branch's INVITE reaches the flow through a Route header naming it
//   (libre sends a dialog's first request where its first route points),
//   which the phone, a user agent, ignores.
// - libre's session layer writes a branch's Request-URI into its To as well:
//   the callee sees its contact there, not its address of record. Phones
//   match a request by its Request-URI and tags, not by its To URI.
// - Either leg ending (BYE, CANCEL, a transport error, a timeout) ends the
//   other: libre sends the BYE or the CANCEL.
// - A call that leaves the gateway has one target, its Request-URI, and an
//   OutboundRoute: its branch goes through the route's current hop, answers
//   the carrier's challenges with the route's credentials, and when the
//   route gives a hop up, a new branch goes to the next hop. A 401 or 407
//   that ends such a branch reaches the caller as 403: the challenge was
//   the gateway's to answer, and a caller cannot answer it.
//
// Owned by Calls; it dies only from its own timer (finish()), never inside
// a libre callback, since libre still touches the session after calling it.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "LS_IIdentity.h"
#include "RefPtr.h"
#include "trunks/OutboundRoute.h"
#include "registrar/Registrar.h"
#include "sip/Libre.h"

class Calls;

class Call {
 public:
  enum class State { TRYING, EARLY, ANSWERED, ESTABLISHED, ENDED };

  // invite stays referenced while the call needs it. caller: the identity
  // the caller authenticated as, null for an outside caller. targets: in
  // the order they ring, highest q first. route: for a call that leaves the
  // gateway, with the one target.
  Call(Calls& calls,
       sip_msg const& invite,
       std::string result,
       RefPtr<LS_IIdentity> caller,
       std::vector<Registrar::CallTarget> targets,
       uint32_t inviteTimeoutMs,
       std::unique_ptr<OutboundRoute> route = nullptr);
  ~Call();
  Call(Call const&) = delete;
  Call& operator=(Call const&) = delete;

  // Sends the first group of branches; false when none could be sent (the
  // caller is then answered).
  void start();
  // Whether request is the caller's INVITE (the same transaction) or a
  // CANCEL of it.
  bool isInvite(sip_msg const& request) const;
  // A CANCEL of the INVITE before the caller leg exists: 487 and the end.
  void cancel(sip_msg const& cancel);
  void retransmitted() const;
  // Ends the call from the gateway's side: a caller still waiting gets
  // 503, the legs that exist get BYE or CANCEL.
  void hangUp();
  // A re-INVITE or UPDATE in one of the call's dialogs, relayed to the
  // other leg and its answer back (see relay below); false when the
  // request is not in either dialog.
  bool relayInDialog(sip_msg const& request);

  State state() const { return m_state; }
  sip_msg const& invite() const { return *m_invite; }
  LS_IIdentity* caller() const { return m_callerIdentity.get(); }
  // What the control socket shows of the call.
  std::string describe() const;
  uint64_t startedMs() const { return m_startedMs; }
  // The Call-IDs of the branches sent, each a dialog of the gateway's.
  std::vector<std::string> const& branchCallIds() const { return m_branchCallIds; }

 private:
  struct Branch {
    Call* call;
    sipsess* session = nullptr;
    Registrar::CallTarget target;
    tmr timeout;
    bool heard = false;  // any answer came, a provisional one included
  };

  void startGroup();
  // Sends a branch to target; false when libre refused it.
  bool launch(Registrar::CallTarget const& target);
  // The route's next hop for a branch that failed with code, when the
  // route gives the branch's hop up; true when a branch went there.
  bool failOver(Branch const& failed, uint16_t code);
  // The branch's hop answered something: it is alive.
  void heard(Branch& branch);
  // Keeps the best final answer so far (RFC 3261 section 16.7).
  void noteFailure(uint16_t code, std::string const& reason);
  void failed(Branch& branch, uint16_t code, std::string const& reason);
  void dropBranchesBut(Branch const* keep);
  // The caller gets the best final answer; the call ends.
  void answerFailure();
  void end();
  // Sends the branch's INVITE; false when libre refused it.
  bool send(Branch& branch);
  bool acceptCaller(uint16_t code, pl const& reason, mbuf* description);
  static std::string contactUser(pl const& user);
  static std::string contentType(sip_msg const& message);
  void relayInfo(sipsess* to, sip_msg const& message);
  // The other leg's session of a request in one of the call's dialogs.
  sipsess* otherLeg(sip_msg const& request) const;
  void followFlow(sipsess* session, std::string const& flowUri);
  void followCallerFlow();
  static void onRelayAnswered(int error, sip_msg const* message, void* call);
  static int onRelaySent(sip_transp transport,
                         sa const* source,
                         sa const* destination,
                         mbuf* message,
                         void* call);
  static mbuf* bodyOf(sip_msg const& message);

  static void onBranchProgress(sip_msg const* message, void* branch);
  static int onBranchAnswer(sip_msg const* message, void* branch);
  static void onBranchEstablished(sip_msg const* message, void* branch);
  static void onBranchClosed(int error, sip_msg const* message, void* branch);
  static void onBranchInfo(sip* stack, sip_msg const* message, void* branch);
  static void onBranchTimeout(void* branch);
  static void onCallerEstablished(sip_msg const* message, void* call);
  static void onCallerClosed(int error, sip_msg const* message, void* call);
  static void onCallerInfo(sip* stack, sip_msg const* message, void* call);
  static void onInfoAnswered(int error, sip_msg const* message, void* pending);

  Calls& m_calls;
  sip_msg const* m_invite;
  std::string m_result;
  RefPtr<LS_IIdentity> m_callerIdentity;
  std::vector<Registrar::CallTarget> m_targets;
  size_t m_next = 0;  // the first target not yet rung
  uint32_t m_inviteTimeoutMs;
  State m_state = State::TRYING;
  sipsess* m_caller = nullptr;
  // Every branch sent, kept to the end of the call: libre's sessions call
  // back with their branch.
  std::vector<std::unique_ptr<Branch>> m_branches;
  Branch* m_winner = nullptr;  // the branch whose 2xx went to the caller
  std::vector<std::string> m_branchCallIds;
  bool m_earlyMedia = false;  // a branch's early SDP went to the caller
  uint16_t m_bestCode = 0;
  std::string m_bestReason;
  std::string m_answer;  // the winning branch's SDP
  uint64_t m_startedMs;
  // The re-INVITE or UPDATE being relayed, its server transaction and the
  // other leg's request.
  sip_msg const* m_relayed = nullptr;
  sip_strans* m_relayedTransaction = nullptr;
  struct sip_request* m_relay = nullptr;
  sipsess* m_relayTo = nullptr;
  std::unique_ptr<OutboundRoute> m_route;  // null for a call to a subscriber
};
