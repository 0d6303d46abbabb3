#include "trunks/TrunkKeepAlive.h"

TrunkKeepAlive::~TrunkKeepAlive() {
  stop();
}

void TrunkKeepAlive::start(sip_msg const& response,
                           LS_KeepAliveMethod::Type method,
                           unsigned int intervalSeconds,
                           std::string const& requestUri,
                           std::string const& addressOfRecord) {
  stop();
  if (method == LS_KeepAliveMethod::NONE || intervalSeconds == 0)
    return;
  if (response.tp != SIP_TRANSP_UDP) {
    // The connection's own keep-alive: libre pings and watches for the pong.
    int const error =
        sip_keepalive_start(&m_connection, &m_stack, &response, intervalSeconds, onConnectionLost, this);
    if (error != 0)
      fail(error);
    return;
  }
  char route[80];
  re_snprintf(route, sizeof route, "sip:%J;transport=udp", &response.src);
  m_routeText = route;
  pl text;
  pl_set_str(&text, m_routeText.c_str());
  if (uri_decode(&m_route, &text) != 0)
    return fail(EINVAL);
  m_requestUri = requestUri;
  m_addressOfRecord = addressOfRecord;
  m_intervalMs = uint64_t{intervalSeconds} * 1000;
  tmr_start(&m_timer, m_intervalMs, onTimer, this);
}

void TrunkKeepAlive::stop() {
  tmr_cancel(&m_timer);
  m_connection = static_cast<sip_keepalive*>(mem_deref(m_connection));
  // libre lets a dropped request finish on its own, without calling back.
  m_pending = static_cast<struct sip_request*>(mem_deref(m_pending));
}

void TrunkKeepAlive::ping() {
  if (m_pending)
    return;
  int const error = sip_requestf(
      &m_pending, &m_stack, true, "OPTIONS", m_requestUri.c_str(), &m_route, nullptr, nullptr, onAnswer, this,
      "From: <%s>;tag=%016llx\r\n"
      "To: <%s>\r\n"
      "Call-ID: %016llx\r\n"
      "CSeq: %u OPTIONS\r\n"
      "Content-Length: 0\r\n"
      "\r\n",
      m_addressOfRecord.c_str(), static_cast<unsigned long long>(rand_u64()), m_addressOfRecord.c_str(),
      static_cast<unsigned long long>(rand_u64()), static_cast<unsigned int>(++m_sequence));
  if (error != 0)
    fail(error);
}

void TrunkKeepAlive::fail(int error) {
  stop();
  m_onFailure(error, m_argument);
}

void TrunkKeepAlive::onTimer(void* argument) {
  TrunkKeepAlive& keepAlive = *static_cast<TrunkKeepAlive*>(argument);
  tmr_start(&keepAlive.m_timer, keepAlive.m_intervalMs, onTimer, &keepAlive);
  keepAlive.ping();
}

void TrunkKeepAlive::onAnswer(int error, sip_msg const* answer, void* argument) {
  TrunkKeepAlive& keepAlive = *static_cast<TrunkKeepAlive*>(argument);
  if (error == 0 && answer)
    return;
  keepAlive.fail(error != 0 ? error : ETIMEDOUT);
}

void TrunkKeepAlive::onConnectionLost(int error, void* argument) {
  TrunkKeepAlive& keepAlive = *static_cast<TrunkKeepAlive*>(argument);
  // libre has already freed its keep-alive and cleared the handle.
  keepAlive.fail(error != 0 ? error : ECONNRESET);
}
