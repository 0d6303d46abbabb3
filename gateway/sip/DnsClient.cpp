#include "sip/DnsClient.h"

#include <cstring>

DnsClient::~DnsClient() {
  mem_deref(m_client);
}

bool DnsClient::open(std::vector<std::string> const& servers, std::string& error) {
  sa addresses[kMaximumServers];
  uint32_t count = 0;
  if (servers.size() > kMaximumServers) {
    error = "at most " + std::to_string(kMaximumServers) + " DNS servers";
    return false;
  }
  for (std::string const& server : servers) {
    if (sa_decode(&addresses[count], server.c_str(), server.size()) != 0) {
      error = "cannot read the DNS server " + server + " (ADDR:PORT)";
      return false;
    }
    ++count;
  }
  if (servers.empty()) {
    char domain[256] = "";
    count = kMaximumServers;
    // No server in the system's configuration leaves the client without
    // any: see the class comment.
    if (dns_srv_get(domain, sizeof domain, addresses, &count) != 0)
      count = 0;
  }
  int const result = dnsc_alloc(&m_client, nullptr, addresses, count);
  if (result != 0) {
    error = std::string("cannot make the DNS client: ") + std::strerror(result);
    return false;
  }
  for (uint32_t i = 0; i < count; ++i) {
    char text[64];
    re_snprintf(text, sizeof text, "%J", &addresses[i]);
    m_servers.push_back(text);
  }
  return true;
}
