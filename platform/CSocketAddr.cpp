#include "CSocketAddr.h"

#include <arpa/inet.h>

bool CSocketAddr::Set(char const* address, unsigned short port) {
  *this = CSocketAddr();
  if (!address)
    return false;
  unsigned char bytes[16] = {};
  unsigned int kind = KIND_IPV4;
  if (inet_pton(AF_INET, address, bytes) != 1) {
    if (inet_pton(AF_INET6, address, bytes) != 1)
      return false;
    kind = KIND_IPV6;
  }
  m_kind = kind;
  for (unsigned int i = 0; i < sizeof(bytes); ++i)
    m_address[i] = bytes[i];
  m_port = port;
  return true;
}

CString CSocketAddr::GetAddress(bool /*numeric*/) const {
  char text[INET6_ADDRSTRLEN];
  int const family = m_kind == KIND_IPV6 ? AF_INET6 : AF_INET;
  if (!inet_ntop(family, m_address, text, sizeof(text)))
    return CString();
  return CString(text);
}
