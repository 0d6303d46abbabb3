#include "sip/RequestLog.h"

#include <cstdio>

namespace {

// Method and URI come from the network: libre has bounded the message and
// cut both at blanks, but a control byte could still garble a terminal.
void writeToken(pl const& token) {
  for (size_t i = 0; i < token.l; ++i) {
    unsigned char const c = static_cast<unsigned char>(token.p[i]);
    std::putchar(c < 0x20 || c == 0x7f ? '?' : c);
  }
}

}  // namespace

RequestLog::~RequestLog() {
  tmr_cancel(&m_flush);
  std::fflush(stdout);
}

void RequestLog::onFlush(void*) {
  std::fflush(stdout);
}

void RequestLog::write(sip_msg const& request, std::string const& result, uint16_t code) {
  ++m_requests;
  m_answers.count(request.met, code);
  writeToken(request.met);
  std::putchar(' ');
  writeToken(request.ruri);
  std::printf(" %s %u\n", result.c_str(), static_cast<unsigned int>(code));
  if (!tmr_isrunning(&m_flush))
    tmr_start(&m_flush, kFlushMs, onFlush, this);
}
