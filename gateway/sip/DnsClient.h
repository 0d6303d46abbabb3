// DnsClient: the stack's DNS client (libre's dnsc), through which the stack
// resolves every host name it sends to as RFC 3263 says: NAPTR, then SRV,
// then A and AAAA. Without one, a registrar or proxy named by host name can
// never be reached, and real carriers are always names.
//
// The servers are the ones given (--dns-server ADDR:PORT), else the system
// resolver's (/etc/resolv.conf, through libre's dns_srv_get, which also reads
// it when the C library's resolver is not built in). A machine with none
// still starts: numeric addresses need no DNS, and a name then fails to
// resolve on each attempt and says so. Nothing is cached here; libre's
// client asks the servers at every lookup, so a re-registration follows a
// carrier's changed records.
//
// Owned by the front-end; the stack holds its own reference to the dnsc, so
// the two may die in either order. Everything runs on libre's thread.
#pragma once

#include <string>
#include <vector>

#include "sip/Libre.h"

class DnsClient {
 public:
  // libre's client keeps at most this many; more given is a usage error.
  static constexpr size_t kMaximumServers = 8;

  DnsClient() = default;
  ~DnsClient();
  DnsClient(DnsClient const&) = delete;
  DnsClient& operator=(DnsClient const&) = delete;

  // servers: "ADDR:PORT" each ("[IPv6]:PORT" too); empty for the system's.
  // False with the reason in error when a server is not an address or the
  // client cannot be made.
  bool open(std::vector<std::string> const& servers, std::string& error);

  // Null until open() has succeeded.
  dnsc* client() const { return m_client; }
  // The servers asked, "ADDR:PORT" each, for the start-up line; empty when
  // the system gave none.
  std::vector<std::string> const& servers() const { return m_servers; }

 private:
  dnsc* m_client = nullptr;
  std::vector<std::string> m_servers;
};
