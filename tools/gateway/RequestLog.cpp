#include "RequestLog.h"

#include <cstdio>

void RequestLog::write(sip_msg const& request, std::string const& result, uint16_t code) {
  ++m_requests;
  // Method and URI come from the network: libre has bounded the message and
  // parsed both as tokens without blanks, so the line stays one line.
  std::printf("%.*s %.*s %s %u\n", static_cast<int>(request.met.l), request.met.p, static_cast<int>(request.ruri.l),
              request.ruri.p, result.c_str(), static_cast<unsigned int>(code));
  std::fflush(stdout);
}
