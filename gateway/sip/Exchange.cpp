#include "sip/Exchange.h"

namespace {

// Longer URIs are refused rather than cut: no phone sends one, and a cut
// URI could denote someone else.
constexpr size_t kMaximumUriLength = 1024;

}  // namespace

RefPtr<LS_IIdentity> Exchange::resolveOrAnswer(pl const& uri, CNameAddr& nameAddr) {
  if (uri.l > kMaximumUriLength || !nameAddr.Parse(uri.p, uri.l)) {
    answer(400, "Bad URI");
    return nullptr;
  }
  String error;
  RefPtr<LS_IIdentity> const identity = m_clock.measure([&] { return m_session.resolve(error, nameAddr); });
  if (identity) {
    m_result = m_clock.measure([&] { return ScriptSession::pathOf(identity.get()); });
    return identity;
  }
  m_result = "\"" + error.str() + "\"";
  if (nameAddr.GetUriKind() == CNameAddr::URI_OTHER)
    answer(416, "Unsupported URI Scheme");
  else
    answer(404, "Not Found");
  return nullptr;
}

void Exchange::answer(uint16_t code, char const* reason, std::string const& headers) {
  // An INVITE is answered without a transaction, as a stateless redirect
  // server may: its final answer would be retransmitted on a timer every
  // half second until the ACK, and the stack files each such timer by
  // walking its sorted list past every transaction of the last 32 seconds,
  // which made each INVITE cost as much as the recent traffic. A lost answer
  // brings the INVITE again, and it is answered again the same way.
  if (pl_strcmp(&m_request.met, "INVITE") == 0) {
    sip_replyf(&m_stack, &m_request, code, reason, "%sContent-Length: 0\r\n\r\n", headers.c_str());
  } else {
    // The stack owns the transaction once it has answered.
    sip_strans* transaction = nullptr;
    sip_treplyf(&transaction, nullptr, &m_stack, &m_request, false, code, reason,
                "%sContent-Length: 0\r\n\r\n", headers.c_str());
  }
  m_log.write(m_request, m_result, code);
  m_session.flushDebugLines();
}
