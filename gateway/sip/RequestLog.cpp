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

// The Request-URI, with the password of a "user:password@" part masked:
// RFC 3261 advises against one, which does not keep a phone from sending it.
void writeUri(sip_msg const& request) {
  pl const& password = request.uri.password;
  if (!pl_isset(&password) || password.p < request.ruri.p ||
      password.p + password.l > request.ruri.p + request.ruri.l)
    return writeToken(request.ruri);
  writeToken(pl{request.ruri.p, static_cast<size_t>(password.p - request.ruri.p)});
  std::fputs("****", stdout);
  char const* const rest = password.p + password.l;
  writeToken(pl{rest, static_cast<size_t>(request.ruri.p + request.ruri.l - rest)});
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
  writeUri(request);
  std::printf(" %s %u\n", result.c_str(), static_cast<unsigned int>(code));
  if (!tmr_isrunning(&m_flush))
    tmr_start(&m_flush, kFlushMs, onFlush, this);
}
