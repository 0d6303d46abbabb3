#include "trunks/RegistrationClient.h"

#include <algorithm>

namespace {

constexpr uint32_t kDefaultExpires = 3600;

}  // namespace

RegistrationClient::RegistrationClient(sip& stack, Settings const& settings)
    : m_stack(stack), m_settings(settings), m_expires(settings.lifetime) {
  tmr_init(&m_timer);
}

RegistrationClient::~RegistrationClient() {
  tmr_cancel(&m_timer);
  // A request still pending is cancelled without calling back.
  mem_deref(m_request);
  mem_deref(m_flow);
  mem_deref(m_dialog);
  mem_deref(m_auth);
}

int RegistrationClient::start(RegistrationClient*& client,
                              sip& stack,
                              Settings const& settings,
                              sip_auth_h* onChallenge,
                              sip_resp_h* onResponse,
                              FlowLostHandler onFlowLost,
                              void* argument) {
  auto* const made = new RegistrationClient(stack, settings);
  made->m_onChallenge = onChallenge;
  made->m_onResponse = onResponse;
  made->m_onFlowLost = onFlowLost;
  made->m_argument = argument;
  std::vector<char const*> routes;
  for (std::string const& route : settings.routes)
    routes.push_back(route.c_str());
  int error =
      sip_dialog_alloc(&made->m_dialog, settings.registrarUri.c_str(), settings.addressOfRecord.c_str(),
                       nullptr, settings.addressOfRecord.c_str(), routes.empty() ? nullptr : routes.data(),
                       static_cast<uint32_t>(routes.size()));
  if (error == 0)
    error = sip_auth_alloc(&made->m_auth, onChallenge, argument, false);
  if (error == 0)
    error = made->request(true);
  if (error != 0) {
    delete made;
    return error;
  }
  client = made;
  return 0;
}

void RegistrationClient::release(RegistrationClient*& client) {
  RegistrationClient* const released = client;
  client = nullptr;
  if (!released)
    return;
  released->m_released = true;
  released->m_expires = 0;
  tmr_cancel(&released->m_timer);
  released->m_flow = static_cast<sip_keepalive*>(mem_deref(released->m_flow));
  // The pending request's answer decides; see onAnswer.
  if (released->m_request)
    return;
  if (released->m_registered && released->request(true) == 0)
    return;
  delete released;
}

int RegistrationClient::request(bool resetLoop) {
  if (resetLoop) {
    sip_loopstate_reset(&m_loop);
    sip_auth_reset(m_auth);
  }
  m_destinations.clear();
  return sip_drequestf(&m_request, &m_stack, true, "REGISTER", m_dialog, 0, m_auth, onSend, onAnswer, this,
                       "%s"
                       "Content-Length: 0\r\n"
                       "\r\n",
                       m_settings.regId > 0 ? "Supported: outbound\r\n" : "");
}

int RegistrationClient::onSend(enum sip_transp transport,
                               sa const* source,
                               sa const* destination,
                               mbuf* message,
                               void* argument) {
  RegistrationClient& client = *static_cast<RegistrationClient*>(argument);
  Settings const& settings = client.m_settings;
  client.m_destinations.push_back(*destination);
  bool const learnt = transport == SIP_TRANSP_UDP && sa_isset(&client.m_public, SA_ALL);
  client.m_contactAddress = learnt ? client.m_public : *source;
  char contact[256];
  if (re_snprintf(contact, sizeof contact, "sip:%s@%J%s", settings.user.c_str(), &client.m_contactAddress,
                  sip_transp_param(transport)) < 0)
    return ENOMEM;
  client.m_contact = contact;
  int error = mbuf_printf(message, "Contact: <%s>;expires=%u", contact, client.m_expires);
  if (settings.regId > 0)
    error |=
        mbuf_printf(message, ";+sip.instance=\"<%s>\";reg-id=%d", settings.instance.c_str(), settings.regId);
  error |= mbuf_printf(message, "\r\n");
  if (!client.m_stale.empty() && client.m_stale != client.m_contact)
    error |= mbuf_printf(message, "Contact: <%s>;expires=0\r\n", client.m_stale.c_str());
  return error;
}

bool RegistrationClient::sentTo(sa const& source) const {
  return std::any_of(m_destinations.begin(), m_destinations.end(),
                     [&](sa const& destination) { return sa_cmp(&destination, &source, SA_ADDR); });
}

void RegistrationClient::onAnswer(int error, sip_msg const* answer, void* argument) {
  RegistrationClient& client = *static_cast<RegistrationClient*>(argument);
  if (error == 0 && answer && client.m_settings.checkSource && !client.sentTo(answer->src))
    return client.fail(EPERM, answer);
  if (error != 0 || !answer || sip_request_loops(&client.m_loop, answer->scode))
    return client.fail(error, answer);
  if (answer->scode < 200)
    return;
  if (answer->scode < 300)
    return client.accepted(*answer);
  switch (answer->scode) {
    case 401:
    case 407: {
      sip_auth_reset(client.m_auth);
      int const refused = sip_auth_authenticate(client.m_auth, answer);
      if (refused != 0)
        return client.fail(refused == EAUTH ? 0 : refused, answer);
      int const unsent = client.request(false);
      if (unsent != 0)
        client.fail(unsent, answer);
      return;
    }
    case 423: {
      sip_hdr const* const minimum = sip_msg_hdr(answer, SIP_HDR_MIN_EXPIRES);
      if (!minimum || pl_u32(&minimum->val) == 0 || client.m_expires == 0)
        break;
      client.m_expires = pl_u32(&minimum->val);
      int const unsent = client.request(false);
      if (unsent != 0)
        client.fail(unsent, answer);
      return;
    }
    default:
      break;
  }
  client.fail(0, answer);
}

void RegistrationClient::fail(int error, sip_msg const* answer) {
  if (m_released) {
    delete this;
    return;
  }
  m_onResponse(error, answer, m_argument);
}

bool RegistrationClient::addressSeenBy(sip_msg const& answer, sa& address) {
  pl received;
  pl rport;
  bool const hasReceived = msg_param_decode(&answer.via.params, "received", &received) == 0;
  bool const hasPort = msg_param_decode(&answer.via.params, "rport", &rport) == 0 && pl_u32(&rport) != 0;
  if (!hasReceived && !hasPort)
    return false;
  address = answer.via.addr;
  if (hasReceived && sa_set(&address, &received, sa_port(&answer.via.addr)) != 0)
    return false;
  if (hasPort)
    sa_set_port(&address, static_cast<uint16_t>(pl_u32(&rport)));
  return true;
}

bool RegistrationClient::onContact(sip_hdr const* header, sip_msg const* answer, void* argument) {
  RegistrationClient& client = *static_cast<RegistrationClient*>(argument);
  sip_addr contact;
  if (sip_addr_decode(&contact, &header->val) != 0 || pl_strcmp(&contact.auri, client.m_contact.c_str()) != 0)
    return false;
  pl expires;
  if (msg_param_decode(&contact.params, "expires", &expires) == 0)
    client.m_granted = pl_u32(&expires);
  else if (pl_isset(&answer->expires))
    client.m_granted = pl_u32(&answer->expires);
  else
    client.m_granted = kDefaultExpires;
  return true;
}

void RegistrationClient::accepted(sip_msg const& answer) {
  m_granted = m_expires;
  sip_msg_hdr_apply(&answer, true, SIP_HDR_CONTACT, onContact, this);
  m_stale.clear();
  m_registered = m_expires > 0 && m_granted > 0;
  if (m_released) {
    // The answer to a REGISTER sent before the release: unregister now.
    if (!m_registered || request(true) != 0)
      delete this;
    return;
  }
  sa learnt;
  if (m_settings.detectAddress && answer.tp == SIP_TRANSP_UDP && addressSeenBy(answer, learnt) &&
      !sa_cmp(&learnt, &m_contactAddress, SA_ALL)) {
    if (m_settings.regId == 0)
      m_stale = m_contact;
    m_public = learnt;
    int const unsent = request(true);
    if (unsent != 0)
      return fail(unsent, nullptr);
  } else if (m_registered) {
    tmr_start(&m_timer, uint64_t{m_granted} * 900, onRefresh, this);
  }
  if (m_settings.regId > 0 && !m_flow && sip_msg_hdr_has_value(&answer, SIP_HDR_REQUIRE, "outbound")) {
    sip_hdr const* const timer = sip_msg_hdr(&answer, SIP_HDR_FLOW_TIMER);
    uint32_t const interval =
        timer && pl_u32(&timer->val) != 0 ? pl_u32(&timer->val) : m_settings.flowInterval;
    (void)sip_keepalive_start(&m_flow, &m_stack, &answer, interval, onFlow, this);
  }
  m_onResponse(0, &answer, m_argument);
}

void RegistrationClient::onRefresh(void* argument) {
  RegistrationClient& client = *static_cast<RegistrationClient*>(argument);
  int const unsent = client.request(true);
  if (unsent != 0)
    client.fail(unsent, nullptr);
}

void RegistrationClient::onFlow(int error, void* argument) {
  RegistrationClient& client = *static_cast<RegistrationClient*>(argument);
  // libre has freed the keep-alive and nulled m_flow. A request in flight
  // on the broken flow fails on its own and is told through onResponse.
  if (client.m_request)
    return;
  tmr_cancel(&client.m_timer);
  client.m_registered = false;
  client.m_onFlowLost(error != 0 ? error : ECONNRESET, client.m_argument);
}
