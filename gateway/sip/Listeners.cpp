#include "sip/Listeners.h"

#include <algorithm>
#include <cstring>

namespace {

bool isLoopback(sa const& address) {
  if (sa_af(&address) == AF_INET)
    return (sa_in(&address) >> 24) == 127;
  return sa_is_loopback(&address);
}

std::string textOf(sip_transp transport, sa const& address) {
  char text[80];
  re_snprintf(text, sizeof text, "%s:%J", transport == SIP_TRANSP_UDP ? "udp" : "tcp", &address);
  return text;
}

struct Enumeration {
  int family;
  std::vector<sa>* addresses;
};

bool collect(char const*, sa const* address, void* argument) {
  Enumeration& enumeration = *static_cast<Enumeration*>(argument);
  if (sa_af(address) != enumeration.family)
    return false;
  if (enumeration.family == AF_INET6 && sa_is_linklocal(address))
    return false;
  auto const known = std::find_if(enumeration.addresses->begin(), enumeration.addresses->end(),
                                  [&](sa const& other) { return sa_cmp(&other, address, SA_ADDR); });
  if (known == enumeration.addresses->end())
    enumeration.addresses->push_back(*address);
  return false;
}

void ignore(sa const*, mbuf*, void*) {}

// A port the system has free for UDP at address now, 0 when none.
uint16_t freePort(sa address) {
  sa_set_port(&address, 0);
  udp_sock* probe = nullptr;
  if (udp_listen(&probe, &address, ignore, nullptr) != 0)
    return 0;
  sa bound;
  uint16_t const port = udp_local_get(probe, &bound) == 0 ? sa_port(&bound) : 0;
  mem_deref(probe);
  return port;
}

}  // namespace

bool Listeners::read(std::string const& text, Request& request, std::string& error) {
  sa address;
  request.text = text;
  if (sa_decode(&address, text.c_str(), text.size()) != 0) {
    error = "cannot read the listen address " + text + " (ADDR:PORT or [IPv6]:PORT)";
    return false;
  }
  request.port = sa_port(&address);
  if (!sa_is_any(&address)) {
    request.addresses.push_back(address);
    return true;
  }
  Enumeration enumeration{sa_af(&address), &request.addresses};
  int const result = net_getifaddrs(collect, &enumeration);
  if (result != 0 || request.addresses.empty()) {
    error = "no address of the machine to listen on for " + text;
    return false;
  }
  return true;
}

int Listeners::openAll(sip& stack, std::vector<Request> const& requests, std::string& failed) {
  m_listeners.clear();
  std::vector<sa> addresses;
  for (Request const& request : requests) {
    uint16_t const port = request.port != 0 ? request.port : freePort(request.addresses.front());
    if (port == 0) {
      failed = request.text;
      return EADDRINUSE;
    }
    for (sa address : request.addresses) {
      sa_set_port(&address, port);
      auto const same = [&](sa const& other) { return sa_cmp(&other, &address, SA_ALL); };
      if (std::none_of(addresses.begin(), addresses.end(), same))
        addresses.push_back(address);
    }
  }
  std::stable_partition(addresses.begin(), addresses.end(),
                        [](sa const& address) { return !isLoopback(address); });
  for (sa const& address : addresses)
    for (sip_transp const transport : {SIP_TRANSP_UDP, SIP_TRANSP_TCP}) {
      int const result = sip_transp_add(&stack, transport, &address);
      if (result != 0) {
        failed = textOf(transport, address);
        return result;
      }
      m_listeners.push_back(Listener{transport, address});
    }
  return 0;
}

bool Listeners::open(sip& stack, std::vector<std::string> const& listens, std::string& error) {
  std::vector<Request> requests(listens.size());
  for (size_t i = 0; i < listens.size(); ++i)
    if (!read(listens[i], requests[i], error))
      return false;
  bool const freePorts =
      std::any_of(requests.begin(), requests.end(), [](Request const& request) { return request.port == 0; });
  std::string failed;
  int result = 0;
  for (unsigned int attempt = 0; attempt < kAttempts; ++attempt) {
    result = openAll(stack, requests, failed);
    if (result == 0)
      return true;
    sip_transp_flush(&stack);
    m_listeners.clear();
    if (!freePorts || result != EADDRINUSE)
      break;
  }
  error = "cannot listen on " + failed + ": " + std::strerror(result);
  return false;
}

std::string Listeners::describe() const {
  std::string text;
  for (Listener const& listener : m_listeners) {
    if (!text.empty())
      text += ' ';
    text += textOf(listener.transport, listener.address);
  }
  return text;
}

bool Listeners::names(uri const& target) const {
  sa address;
  if (sa_set(&address, &target.host, target.port != 0 ? target.port : 5060) != 0)
    return false;
  for (Listener const& listener : m_listeners)
    if (sa_cmp(&listener.address, &address, SA_ALL))
      return true;
  return false;
}
