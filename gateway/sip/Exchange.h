// Exchange: one request being answered. It carries what the answer needs (the
// stack, the request, the session whose library answers, the log and the
// clock) and what the log line says about the lookup, and sends the final
// answer statelessly (see answer()). Each exchange answers exactly once; the
// log line leaves with the answer.
#pragma once

#include <string>

#include "LS_IIdentity.h"
#include "RefPtr.h"
#include "ScriptSession.h"
#include "sip/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/RequestLog.h"

class Exchange {
 public:
  Exchange(sip& stack, sip_msg const& request, ScriptSession& session, RequestLog& log, LibraryClock& clock)
      : m_stack(stack), m_request(request), m_session(session), m_log(log), m_clock(clock) {}
  Exchange(Exchange const&) = delete;
  Exchange& operator=(Exchange const&) = delete;

  sip_msg const& request() const { return m_request; }
  ScriptSession& session() const { return m_session; }
  LibraryClock& clock() const { return m_clock; }

  // The identity that uri (a request URI or a To address, as received)
  // denotes, recorded for the log line; nameAddr receives the parsed URI.
  // Null when there is none, and then answered: 400 for no name-addr, 416
  // for a scheme the library refuses, else 404 unless answerNotFound is
  // false (see answered()).
  RefPtr<LS_IIdentity> resolveOrAnswer(pl const& uri, CNameAddr& nameAddr, bool answerNotFound = true);
  bool answered() const { return m_answered; }
  // What the log line says about the lookup so far.
  std::string const& result() const { return m_result; }
  // The request is answered by a part that outlives the exchange (a call
  // in progress), which writes its log line when its final answer leaves.
  void handOver() { m_answered = true; }

  // What the log line says about the lookup, for a part that looked
  // without resolveOrAnswer: "service/identity" or the error text in quotes.
  void setResult(std::string result) { m_result = std::move(result); }

  // Sends the final answer without a server transaction, as a stateless
  // registrar and redirect server may: the stack keeps nothing once it has
  // left, and a retransmitted request is simply answered again. A server
  // transaction would hold some kilobytes for 32 s after every answer and
  // walk the stack's sorted timer list, so that a registration storm made
  // memory and CPU per request grow with the traffic of the last half
  // minute. The To tag is drawn from the request's Call-ID, From tag, CSeq
  // and branch under a key of this process, so that a retransmission gets
  // the answer it got the first time, tag included (RFC 3261 section
  // 8.2.7). headers: complete header lines, each ending in CRLF.
  void answer(uint16_t code, char const* reason, std::string const& headers = std::string());

 private:
  sip& m_stack;
  sip_msg const& m_request;
  ScriptSession& m_session;
  RequestLog& m_log;
  LibraryClock& m_clock;
  std::string m_result = "-";
  bool m_answered = false;
};
