#include "sip/SourceFilter.h"

#include <netinet/in.h>
#include <sys/socket.h>

#include <cstdlib>

std::array<uint8_t, 16> SourceFilter::bytesOf(sa const& address) {
  std::array<uint8_t, 16> bytes{};
  if (sa_af(&address) == AF_INET6) {
    sa_in6(&address, bytes.data());
    return bytes;
  }
  uint32_t const ip = sa_in(&address);
  bytes[10] = 0xff;
  bytes[11] = 0xff;
  bytes[12] = static_cast<uint8_t>(ip >> 24);
  bytes[13] = static_cast<uint8_t>(ip >> 16);
  bytes[14] = static_cast<uint8_t>(ip >> 8);
  bytes[15] = static_cast<uint8_t>(ip);
  return bytes;
}

bool SourceFilter::allow(std::string const& cidr) {
  size_t const slash = cidr.find('/');
  std::string const host = cidr.substr(0, slash);
  sa address;
  if (sa_set_str(&address, host.c_str(), 0) != 0)
    return false;
  bool const ipv4 = sa_af(&address) == AF_INET;
  unsigned int const width = ipv4 ? 32 : 128;
  unsigned long bits = width;
  if (slash != std::string::npos) {
    std::string const length = cidr.substr(slash + 1);
    char* end = nullptr;
    bits = std::strtoul(length.c_str(), &end, 10);
    if (length.empty() || *end != '\0' || bits > width)
      return false;
  }
  m_networks.push_back(Network{bytesOf(address), static_cast<unsigned int>(bits) + (ipv4 ? 96 : 0)});
  return true;
}

bool SourceFilter::admits(sa const& source) const {
  if (m_networks.empty())
    return true;
  std::array<uint8_t, 16> const bytes = bytesOf(source);
  for (Network const& network : m_networks) {
    unsigned int bits = network.bits;
    size_t i = 0;
    for (; bits >= 8; bits -= 8, ++i)
      if (bytes[i] != network.address[i])
        break;
    if (bits >= 8)
      continue;
    uint8_t const mask = static_cast<uint8_t>(0xff00u >> bits);
    if (bits == 0 || ((bytes[i] ^ network.address[i]) & mask) == 0)
      return true;
  }
  return false;
}
