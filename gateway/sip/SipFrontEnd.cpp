#include "sip/SipFrontEnd.h"

#include <algorithm>
#include <cstring>

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
  close();
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
  if (sip_listen(&m_listener, m_stack, true, onRequest, this) != 0) {
    error = "the SIP stack cannot take requests";
    return false;
  }
  for (Listeners::Listener const& listener : m_listeners.listeners()) {
    if (listener.transport != SIP_TRANSP_UDP)
      continue;
    char text[64];
    re_snprintf(text, sizeof text, "%J", &listener.address);
    CHostPort own;
    if (own.Parse(text, std::char_traits<char>::length(text)))
      m_session.stack().localHostPorts.add(own);
  }
  return true;
}

void SipFrontEnd::shutDown() {
  m_listener = static_cast<sip_lsnr*>(mem_deref(m_listener));
  tmr deadline;
  tmr_init(&deadline);
  tmr_start(&deadline, kShutDownMs, stopLoop, nullptr);
  sip_close(m_stack, false);
  re_main(nullptr);
  tmr_cancel(&deadline);
}

void SipFrontEnd::close() {
  m_listener = static_cast<sip_lsnr*>(mem_deref(m_listener));
  if (!m_stack || m_closed)
    return;
  m_closed = true;
  sip_close(m_stack, true);
}

bool SipFrontEnd::onRequest(sip_msg const* request, void* argument) {
  SipFrontEnd& frontEnd = *static_cast<SipFrontEnd*>(argument);
  sip_msg const& message = *request;
  // An ACK gets no answer, the one for a 302 included (every request is
  // answered without a transaction, see Exchange::answer); one in a dialog
  // of the calls is their session layer's, which drops the others.
  if (pl_strcmp(&message.met, "ACK") == 0)
    return !frontEnd.m_dialogs;
  if (frontEnd.m_dialogs && pl_isset(&message.to.tag)) {
    DialogHandler::Verdict const verdict = frontEnd.m_dialogs->inDialog(message);
    if (verdict != DialogHandler::Verdict::UNKNOWN)
      return verdict == DialogHandler::Verdict::ANSWERED;
  }
  if (frontEnd.m_subscriptions && pl_isset(&message.to.tag)) {
    DialogHandler::Verdict const verdict = frontEnd.m_subscriptions->inDialog(message);
    if (verdict != DialogHandler::Verdict::UNKNOWN)
      return verdict == DialogHandler::Verdict::ANSWERED;
  }
  if (message.tp == SIP_TRANSP_UDP)
    frontEnd.enlarge(message.sock);
  if (frontEnd.m_rateLimit && !frontEnd.m_rateLimit->admit(*frontEnd.m_stack, message))
    return true;
  Exchange exchange(*frontEnd.m_stack, message, frontEnd.m_session, frontEnd.m_log, frontEnd.m_clock);
  route(exchange, frontEnd.m_admission, frontEnd.m_methods);
  return true;
}

void SipFrontEnd::route(Exchange& exchange, Admission const& admission, MethodTable const& methods) {
  sip_msg const& message = exchange.request();
  if (SecureTransports::sipsOverPlainTransport(message))
    return exchange.answer(416, "Unsupported URI Scheme");
  if (admission.answered(exchange))
    return;
  if (RequestHandler* const handler = methods.find(message.met))
    return handler->handle(exchange);
  if (pl_strcmp(&message.met, "CANCEL") == 0)
    return exchange.answer(481, "Call/Transaction Does Not Exist");
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
