#include "sip/Exchange.h"

#include "sip/FieldHash.h"

namespace {

// Longer URIs are refused rather than cut: no phone sends one, and a cut
// URI could denote someone else.
constexpr size_t kMaximumUriLength = 1024;

// FNV-1a over the fields that name a request, after a key drawn once per
// process: tags of different requests differ, and nobody outside can make
// two requests share one.
uint64_t toTag(sip_msg const& request) {
  static uint64_t const key = rand_u64();
  FieldHash hash(key);
  for (pl const* field : {&request.callid, &request.from.tag, &request.cseq.met, &request.via.branch})
    hash.add(field->p, field->l);
  return hash.add(request.cseq.num).value();
}

}  // namespace

RefPtr<LS_IIdentity> Exchange::resolveOrAnswer(pl const& uri, CNameAddr& nameAddr, bool answerNotFound) {
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
  else if (answerNotFound)
    answer(404, "Not Found");
  return nullptr;
}

void Exchange::answer(uint16_t code, char const* reason, std::string const& headers) {
  // libre draws the tag it adds at random for every message it receives;
  // the request is the stack's for the length of this call, and the tag is
  // read by nothing but the answer.
  const_cast<sip_msg&>(m_request).tag = toTag(m_request);
  sip_replyf(&m_stack, &m_request, code, reason, "%sContent-Length: 0\r\n\r\n", headers.c_str());
  m_answered = true;
  m_log.write(m_request, m_result, code);
  m_session.flushDebugLines();
}
