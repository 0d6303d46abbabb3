#include "IpAddress.h"

#include <arpa/inet.h>

#include <cstring>

namespace {

// inet_pton reads up to the first zero byte; a String may hold more.
bool parse(String const& text, int family, unsigned char* bytes) {
  if (std::strlen(text.c_str()) != text.length())
    return false;
  return inet_pton(family, text.c_str(), bytes) == 1;
}

bool isContiguous(unsigned char const* mask, size_t length) {
  bool sawZero = false;
  for (size_t i = 0; i < length; ++i) {
    for (int bit = 7; bit >= 0; --bit) {
      bool const one = (mask[i] >> bit) & 1;
      if (one && sawZero)
        return false;
      sawZero = sawZero || !one;
    }
  }
  return true;
}

}  // namespace

bool IpAddress::set(String const& address, String const& netMask) {
  *this = IpAddress();
  if (address.isEmpty())
    return netMask.isEmpty();

  unsigned char bytes[16] = {};
  Family family = Family::V4;
  int addressFamily = AF_INET;
  size_t length = 4;
  if (!parse(address, AF_INET, bytes)) {
    if (!parse(address, AF_INET6, bytes))
      return false;
    family = Family::V6;
    addressFamily = AF_INET6;
    length = 16;
  }
  unsigned char mask[16] = {};
  if (netMask.isEmpty())
    std::memset(mask, 0xff, length);
  else if (!parse(netMask, addressFamily, mask) || !isContiguous(mask, length))
    return false;

  m_family = family;
  std::memcpy(m_address, bytes, sizeof(m_address));
  std::memcpy(m_netMask, mask, sizeof(m_netMask));
  return true;
}

void IpAddress::getIpAddrAsString(String& out) const {
  toString(m_address, out);
}

void IpAddress::getNetMaskAsString(String& out) const {
  toString(m_netMask, out);
}

void IpAddress::toString(unsigned char const* bytes, String& out) const {
  out = String();
  if (m_family == Family::None)
    return;
  char text[INET6_ADDRSTRLEN];
  if (!inet_ntop(m_family == Family::V6 ? AF_INET6 : AF_INET, bytes, text, sizeof(text)))
    return;
  out = String(text);
}

bool IpAddress::operator==(IpAddress const& other) const {
  return m_family == other.m_family && std::memcmp(m_address, other.m_address, sizeof(m_address)) == 0 &&
         std::memcmp(m_netMask, other.m_netMask, sizeof(m_netMask)) == 0;
}
