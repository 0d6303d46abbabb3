#include "sip/SipFrontEnd.h"

#include <algorithm>
#include <cstring>

#include "SipStatistics.h"
#include "sip/Capabilities.h"
#include "sip/Exchange.h"

namespace {

// Hash table sizes of the stack: client transactions, server transactions,
// TCP connections. Every request is answered statelessly (see
// Exchange::answer), so the server-transaction table stays empty; the stack
// still looks each request up in it.
constexpr uint32_t kClientTransactions = 64;
constexpr uint32_t kServerTransactions = 16;
constexpr uint32_t kConnections = 64;

// The receive (and send) buffer of each UDP socket. The kernel's default,
// some 200 KiB, holds about a thousand requests: a burst of a storm that
// arrives while the loop is busy or not scheduled overflows it, and the
// phones retransmit. Kamailio enlarges its sockets likewise. The kernel
// keeps the size within net.core.rmem_max.
constexpr int kUdpBufferBytes = 4 * 1024 * 1024;

void stopLoop(void*) {
  re_cancel();
}

}  // namespace

SipFrontEnd::~SipFrontEnd() {
  m_changes.reset();
  m_calls.reset();
  mem_deref(m_listener);
  // Forced: a registrar that never answered the unregistration must not
  // keep a registration alive that points at a trunk about to die.
  if (m_stack)
    sip_close(m_stack, true);
  m_trunks.reset();
  mem_deref(m_stack);
}

bool SipFrontEnd::start(Settings const& settings, std::string& error) {
  if (!m_dns.open(settings.dnsServers, error))
    return false;
  int const result = sip_alloc(&m_stack, m_dns.client(), kClientTransactions, kServerTransactions,
                               kConnections, "location-gateway", onClosed, this);
  if (result != 0) {
    error = std::string("the SIP stack cannot start: ") + std::strerror(result);
    return false;
  }
  if (!m_listeners.open(*m_stack, settings.listen, error))
    return false;
  m_registrar.start(*m_stack, settings.expiry, settings.natPingSeconds);
  if (sip_listen(&m_listener, m_stack, true, onRequest, this) != 0) {
    error = "the SIP stack cannot take requests";
    return false;
  }
  if (m_calls && !m_calls->start(*m_stack, error))
    return false;
  for (Listeners::Listener const& listener : m_listeners.listeners()) {
    if (listener.transport != SIP_TRANSP_UDP)
      continue;
    char text[64];
    re_snprintf(text, sizeof text, "%J", &listener.address);
    CHostPort own;
    if (own.Parse(text, std::char_traits<char>::length(text)))
      m_session.stack().localHostPorts.add(own);
  }
  m_trunks = std::make_unique<TrunkRegistrations>(*m_stack, m_session, m_clock);
  m_trunks->useCaFile(m_caFile);
  m_trunks->start();
  if (m_calls)
    m_calls->useTrunks(*m_trunks);
  return true;
}

void SipFrontEnd::followChanges() {
  m_changes = std::make_unique<ModelChanges>(*m_session.locationMaster());
}

void SipFrontEnd::beginChange() {
  m_changes->begin();
}

void SipFrontEnd::endChange() {
  m_changes->end();
  m_registrar.dropRemoved(m_changes->removed(), m_changes->anyServiceChanged());
  if (m_changes->anyServiceChanged())
    m_trunks->followAll();
  else
    m_trunks->follow(m_changes->touched(), m_changes->removed());
}

GatewayStatistics SipFrontEnd::statistics() const {
  GatewayStatistics statistics;
  statistics.answers = m_log.answers().counts();
  statistics.failedAuthentications = m_registrar.failedAuthentications();
  statistics.bindings = m_registrar.bindingCount();
  statistics.bindingsDropped = m_registrar.bindingsDropped();
  if (BindingStore const* const store = m_registrar.store()) {
    statistics.storeRowsRefused = store->rowsRefused();
    statistics.storeChangesDropped = store->changesDropped();
  }
  statistics.registeredContacts = s_sipStatistics.getInboundRegistrations();
  m_trunks->forEach([&](std::string const& path, bool registered) {
    statistics.trunks.push_back(GatewayStatistics::Trunk{path, registered});
  });
  statistics.cpuSeconds = LibraryClock::cpuSeconds();
  statistics.librarySeconds = m_clock.librarySeconds();
  return statistics;
}

void SipFrontEnd::shutDown() {
  m_listener = static_cast<sip_lsnr*>(mem_deref(m_listener));
  m_trunks->stop();
  tmr deadline;
  tmr_init(&deadline);
  tmr_start(&deadline, kShutDownMs, stopLoop, nullptr);
  sip_close(m_stack, false);
  re_main(nullptr);
  tmr_cancel(&deadline);
}

bool SipFrontEnd::onRequest(sip_msg const* request, void* argument) {
  SipFrontEnd& frontEnd = *static_cast<SipFrontEnd*>(argument);
  sip_msg const& message = *request;
  // An ACK gets no answer, the one for a 302 included (every request is
  // answered without a transaction, see Exchange::answer).
  if (pl_strcmp(&message.met, "ACK") == 0)
    return !frontEnd.m_calls;
  if (frontEnd.m_calls && pl_isset(&message.to.tag) && Calls::takesInDialog(message))
    return false;
  if (message.tp == SIP_TRANSP_UDP)
    frontEnd.enlarge(message.sock);
  if (frontEnd.m_rateLimit && !frontEnd.m_rateLimit->admit(*frontEnd.m_stack, message))
    return true;
  Exchange exchange(*frontEnd.m_stack, message, frontEnd.m_session, frontEnd.m_log, frontEnd.m_clock);
  route(exchange, frontEnd.m_admission, frontEnd.m_registrar, frontEnd.m_redirector, frontEnd.m_calls.get());
  return true;
}

void SipFrontEnd::route(Exchange& exchange,
                        Admission const& admission,
                        Registrar& registrar,
                        Redirector& redirector,
                        Calls* calls) {
  sip_msg const& message = exchange.request();
  if (SecureTransports::sipsOverPlainTransport(message))
    return exchange.answer(416, "Unsupported URI Scheme");
  if (admission.answered(exchange))
    return;
  if (pl_strcmp(&message.met, "REGISTER") == 0)
    return registrar.handle(exchange);
  if (pl_strcmp(&message.met, "CANCEL") == 0) {
    if (calls && calls->cancelled(message))
      return exchange.handOver();
    return exchange.answer(481, "Call/Transaction Does Not Exist");
  }
  if (calls && pl_strcmp(&message.met, "INVITE") == 0)
    return calls->handle(exchange);
  if (pl_strcmp(&message.met, "INVITE") == 0 || pl_strcmp(&message.met, "MESSAGE") == 0 ||
      pl_strcmp(&message.met, "SUBSCRIBE") == 0 || pl_strcmp(&message.met, "OPTIONS") == 0)
    return redirector.handle(exchange);
  exchange.answer(405, "Method Not Allowed", Capabilities::kAllow);
}

void SipFrontEnd::enlarge(void* udpSocket) {
  if (std::find(m_enlarged.begin(), m_enlarged.end(), udpSocket) != m_enlarged.end())
    return;
  m_enlarged.push_back(udpSocket);
  udp_sockbuf_set(static_cast<udp_sock*>(udpSocket), kUdpBufferBytes);
}

void SipFrontEnd::onClosed(void*) {
  re_cancel();
}
