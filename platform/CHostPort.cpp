#include "CHostPort.h"

#include <arpa/inet.h>

#include <cstring>

#include "SipGrammar.h"

unsigned short const CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT = 0;

namespace {

bool isHostNameCharacter(unsigned char c) {
  return SipGrammar::isAlphaNum(c) || c == '-' || c == '.' || c == '_' || c == '*';
}

// inet_pton reads up to a zero byte, so the text is checked byte by byte
// first: a zero byte inside the brackets must not cut the address short.
bool isIpv6Address(char const* text, size_t length) {
  char buffer[INET6_ADDRSTRLEN];
  if (length == 0 || length >= sizeof(buffer))
    return false;
  for (size_t i = 0; i < length; ++i) {
    unsigned char const c = static_cast<unsigned char>(text[i]);
    if (!SipGrammar::isHexDigit(c) && c != ':' && c != '.')
      return false;
  }
  std::memcpy(buffer, text, length);
  buffer[length] = '\0';
  unsigned char address[16];
  return inet_pton(AF_INET6, buffer, address) == 1;
}

bool parsePort(char const* text, size_t length, unsigned short& port) {
  if (length == 0)
    return false;
  unsigned long value = 0;
  for (size_t i = 0; i < length; ++i) {
    unsigned char const c = static_cast<unsigned char>(text[i]);
    if (!SipGrammar::isDigit(c))
      return false;
    value = value * 10 + (c - '0');
    if (value > 65535)
      return false;
  }
  port = static_cast<unsigned short>(value);
  return true;
}

}  // namespace

CHostPort& CHostPort::operator=(CString const& text) {
  Parse(text.c_str(), text.length());
  return *this;
}

bool CHostPort::Parse(char const* text, size_t length) {
  return parse(text, length, false);
}

bool CHostPort::ParseUriHostPort(char const* text, size_t length) {
  return parse(text, length, true);
}

bool CHostPort::parse(char const* text, size_t length, bool uriHost) {
  if (!text || length == 0) {
    Reset();
    return false;
  }
  size_t hostEnd = 0;
  if (text[0] == '[') {
    size_t const closing = SipGrammar::find(text, 1, length, ']');
    if (closing == length || !isIpv6Address(text + 1, closing - 1)) {
      Reset();
      return false;
    }
    hostEnd = closing + 1;
  } else {
    hostEnd = SipGrammar::find(text, 0, length, ':');
    bool valid = hostEnd > 0;
    for (size_t i = 0; valid && i < hostEnd; ++i)
      valid = isHostNameCharacter(static_cast<unsigned char>(text[i]));
    if (valid && uriHost)
      valid = SipGrammar::isHostName(text, hostEnd) || SipGrammar::isIpv4Address(text, hostEnd);
    if (!valid) {
      Reset();
      return false;
    }
  }
  unsigned short port = 0;
  if (hostEnd < length &&
      (text[hostEnd] != ':' || !parsePort(text + hostEnd + 1, length - hostEnd - 1, port))) {
    Reset();
    return false;
  }
  // Built before it is stored: text may point into m_host.
  CString host(text, hostEnd);
  m_host = host;
  m_port = port;
  return true;
}

void CHostPort::Reset() {
  m_host = CString();
  m_port = 0;
}
