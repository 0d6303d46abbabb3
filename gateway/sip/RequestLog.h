// RequestLog: the one line on standard output for each request the gateway
// answers, "METHOD REQUEST-URI RESULT CODE", flushed at once so that a test
// harness reading the pipe sees it when the answer leaves. RESULT is the
// identity found ("service/identity"), the library's error text in double
// quotes, or "-" when no identity was looked up.
#pragma once

#include <string>

#include "metrics/AnswerCounters.h"
#include "sip/Libre.h"

class RequestLog {
 public:
  void write(sip_msg const& request, std::string const& result, uint16_t code);
  unsigned long requests() const { return m_requests; }
  AnswerCounters const& answers() const { return m_answers; }

 private:
  unsigned long m_requests = 0;
  AnswerCounters m_answers;
};
