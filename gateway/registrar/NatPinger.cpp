#include "registrar/NatPinger.h"

#include <vector>

namespace {

// Every ping's Call-ID starts with this, followed by its entry's id in
// hexadecimal.
char const kCallIdPrefix[] = "nat-ping-";

}  // namespace

NatPinger::NatPinger(sip& stack, uint32_t intervalSeconds, Lost lost, void* argument)
    : m_stack(stack), m_intervalMs(uint64_t{intervalSeconds} * 1000), m_lost(lost), m_argument(argument) {
  sip_listen(&m_listener, &m_stack, false, onResponse, this);
  m_timer.start(m_intervalMs, onTick, this);
}

NatPinger::~NatPinger() {
  mem_deref(m_listener);
}

void NatPinger::watch(void const* key, std::string const& target, sa const& address, void* socket) {
  forget(key);
  uint64_t id = rand_u64();
  // 0 is what a Call-ID that is no hexadecimal number reads as.
  while (id == 0 || m_byId.count(id) != 0)
    id = rand_u64();
  m_entries[key] = Entry{target, address, socket, id, 0, false};
  m_byId[id] = key;
}

void NatPinger::forget(void const* key) {
  auto const found = m_entries.find(key);
  if (found == m_entries.end())
    return;
  m_byId.erase(found->second.id);
  m_entries.erase(found);
}

void NatPinger::ping(Entry& entry) {
  sa local;
  if (udp_local_get(static_cast<udp_sock*>(entry.socket), &local) != 0)
    return;
  mbuf* message = mbuf_alloc(512);
  if (!message)
    return;
  int const error = mbuf_printf(message,
                                "OPTIONS %s SIP/2.0\r\n"
                                "Via: SIP/2.0/UDP %J;branch=z9hG4bK%016llx;rport\r\n"
                                "Max-Forwards: 70\r\n"
                                "From: <sip:%J>;tag=%016llx\r\n"
                                "To: <%s>\r\n"
                                "Call-ID: %s%016llx\r\n"
                                "CSeq: 1 OPTIONS\r\n"
                                "Content-Length: 0\r\n"
                                "\r\n",
                                entry.target.c_str(), &local, static_cast<unsigned long long>(rand_u64()),
                                &local, static_cast<unsigned long long>(rand_u64()), entry.target.c_str(),
                                kCallIdPrefix, static_cast<unsigned long long>(entry.id));
  if (error == 0) {
    message->pos = 0;
    sip_send(&m_stack, entry.socket, SIP_TRANSP_UDP, &entry.address, message);
  }
  mem_deref(message);
  entry.outstanding = true;
}

void NatPinger::onTick(void* argument) {
  NatPinger& pinger = *static_cast<NatPinger*>(argument);
  pinger.m_timer.start(pinger.m_intervalMs, onTick, &pinger);
  std::vector<void const*> lost;
  for (auto& entry : pinger.m_entries) {
    Entry& watched = entry.second;
    if (watched.outstanding && ++watched.misses >= kMisses) {
      lost.push_back(entry.first);
      continue;
    }
    pinger.ping(watched);
  }
  // Reported after the walk: lost may forget the entry.
  for (void const* key : lost) {
    pinger.forget(key);
    pinger.m_lost(key, pinger.m_argument);
  }
}

bool NatPinger::onResponse(sip_msg const* response, void* argument) {
  NatPinger& pinger = *static_cast<NatPinger*>(argument);
  pl const& callId = response->callid;
  size_t const prefix = sizeof kCallIdPrefix - 1;
  if (callId.l <= prefix || std::char_traits<char>::compare(callId.p, kCallIdPrefix, prefix) != 0)
    return false;
  pl const digits = {callId.p + prefix, callId.l - prefix};
  auto const key = pinger.m_byId.find(pl_x64(&digits));
  if (key == pinger.m_byId.end())
    return true;
  Entry& entry = pinger.m_entries[key->second];
  if (!sa_cmp(&response->src, &entry.address, SA_ALL))
    return true;
  entry.outstanding = false;
  entry.misses = 0;
  return true;
}
