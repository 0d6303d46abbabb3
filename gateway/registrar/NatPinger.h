// NatPinger: OPTIONS requests to the bindings of phones behind NAT over UDP,
// at a fixed interval (--nat-ping SECONDS), so that the NAT keeps the
// mapping the registration came through open for callers redirected to it,
// as Kamailio's nathelper does with its NAT pings; a binding whose phone
// has stopped answering is reported lost, and the registrar drops it.
//
// Decisions, with their reasons:
// - The pings are sent without a client transaction, each through the
//   socket its registration arrived on (the NAT lets answers in only from
//   where the phone sent to), and matched to their binding by Call-ID when
//   answered. A transaction would retransmit for 32 s and cost a timer
//   each, for thousands of bindings, where the next ping serves as the
//   retransmission.
// - An answer counts only when it comes from the address and port its ping
//   went to, and names its binding by an id drawn at random when the
//   binding is watched (64 bits from the stack's generator, which OpenSSL
//   feeds): otherwise anyone could keep a dead binding, and the calls
//   redirected to it, alive by answering for it. An answer that names no
//   watched binding, or comes from elsewhere, is taken and ignored.
// - Any answer counts, an error included: it proves the mapping is open.
//   A ping still unanswered when the next is due counts as missed; after
//   kMisses missed in a row the binding is lost.
// - All watched bindings are pinged on one timer tick; a binding watched
//   anew (its registration refreshed) starts again with no misses. The tick
//   is a MonotonicTimer: on the stack's timers a step of the system clock
//   forward would tick at once and count misses no phone could have
//   avoided, and a step back would hold the pings, and the NAT mappings
//   with them, for as long as the step.
//
// Owned by the registrar, which watches and forgets its bindings by an
// opaque key; the stack outlives it. lost may forget or drop the binding.
// Runs on libre's thread.
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include "sip/Libre.h"
#include "sip/MonotonicTimer.h"

class NatPinger {
 public:
  static constexpr unsigned int kMisses = 3;

  using Lost = void (*)(void const* key, void* argument);

  NatPinger(sip& stack, uint32_t intervalSeconds, Lost lost, void* argument);
  ~NatPinger();
  NatPinger(NatPinger const&) = delete;
  NatPinger& operator=(NatPinger const&) = delete;

  // Pings target (the URI the binding is redirected to) at address through
  // socket, the udp_sock its registration came in on.
  void watch(void const* key, std::string const& target, sa const& address, void* socket);
  void forget(void const* key);
  size_t watched() const { return m_entries.size(); }

 private:
  struct Entry {
    std::string target;
    sa address;
    void* socket;
    uint64_t id;  // random, in the Call-ID of its pings, for matching answers
    unsigned int misses;
    bool outstanding;
  };

  void ping(Entry& entry);
  static void onTick(void* pinger);
  static bool onResponse(sip_msg const* response, void* pinger);

  sip& m_stack;
  uint64_t m_intervalMs;
  Lost m_lost;
  void* m_argument;
  MonotonicTimer m_timer;
  sip_lsnr* m_listener = nullptr;
  std::map<void const*, Entry> m_entries;
  std::map<uint64_t, void const*> m_byId;
};
