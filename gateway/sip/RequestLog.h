// RequestLog: the one line on standard output for each request the gateway
// answers, "METHOD REQUEST-URI RESULT CODE". RESULT is the identity found
// ("service/identity"), the library's error text in double quotes, or "-"
// when no identity was looked up. A password in the Request-URI's user
// part ("sip:alice:secret@host") is written as ****.
//
// Decision: the lines go through stdio's buffer and are flushed kFlushMs
// after the first line that found it empty, and when the log dies, rather
// than after every line: a flush is a system call, which under a storm cost
// as much as the library's part of the answer. A reader of the pipe sees a
// line at most kFlushMs after its answer left; none is lost at exit.
#pragma once

#include <string>

#include "sip/AnswerCounters.h"
#include "sip/Libre.h"

class RequestLog {
 public:
  static constexpr uint64_t kFlushMs = 50;

  RequestLog() { tmr_init(&m_flush); }
  ~RequestLog();
  RequestLog(RequestLog const&) = delete;
  RequestLog& operator=(RequestLog const&) = delete;

  void write(sip_msg const& request, std::string const& result, uint16_t code);
  unsigned long requests() const { return m_requests; }
  AnswerCounters const& answers() const { return m_answers; }

 private:
  static void onFlush(void* log);

  unsigned long m_requests = 0;
  AnswerCounters m_answers;
  tmr m_flush;
};
