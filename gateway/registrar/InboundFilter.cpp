#include "registrar/InboundFilter.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>

#include <cstring>

#include "RefPtr.h"
#include "ScriptSession.h"
#include "sip/Exchange.h"

namespace {

// An address in network byte order: 4 bytes for IPv4, 16 for IPv6.
struct Bytes {
  size_t length = 0;
  unsigned char value[16] = {};
};

// A mapped IPv4 source gives its IPv4 address.
Bytes bytesOf(sa const& source) {
  Bytes bytes;
  if (sa_af(&source) == AF_INET) {
    uint32_t const ip = htonl(sa_in(&source));
    std::memcpy(bytes.value, &ip, 4);
    bytes.length = 4;
    return bytes;
  }
  if (sa_af(&source) != AF_INET6)
    return bytes;
  uint8_t address[16];
  sa_in6(&source, address);
  static unsigned char const mappedPrefix[12] = {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xff, 0xff};
  if (std::memcmp(address, mappedPrefix, sizeof mappedPrefix) == 0) {
    std::memcpy(bytes.value, address + 12, 4);
    bytes.length = 4;
    return bytes;
  }
  std::memcpy(bytes.value, address, 16);
  bytes.length = 16;
  return bytes;
}

// The text IpAddress prints, read back; length 0 for text it did not print.
Bytes bytesOf(String const& text) {
  Bytes bytes;
  if (inet_pton(AF_INET, text.c_str(), bytes.value) == 1)
    bytes.length = 4;
  else if (inet_pton(AF_INET6, text.c_str(), bytes.value) == 1)
    bytes.length = 16;
  return bytes;
}

}  // namespace

bool InboundFilter::matches(IpAddress const& rule, sa const& source) {
  if (rule.isEmpty())
    return true;
  String addressText;
  String maskText;
  rule.getIpAddrAsString(addressText);
  rule.getNetMaskAsString(maskText);
  Bytes const address = bytesOf(addressText);
  Bytes const mask = bytesOf(maskText);
  Bytes const from = bytesOf(source);
  if (address.length == 0 || address.length != mask.length || address.length != from.length)
    return false;
  for (size_t i = 0; i < address.length; ++i)
    if ((from.value[i] & mask.value[i]) != (address.value[i] & mask.value[i]))
      return false;
  return true;
}

InboundFilter::Verdict InboundFilter::judge(LS_IInbound const& face, sa const& source) {
  Verdict verdict;
  verdict.rules = face.getNumberOfFilterRules();
  bool anyAccept = false;
  for (unsigned int index = 0; index < verdict.rules; ++index) {
    LS_FilterType::Type type = LS_FilterType::ACCEPT;
    IpAddress address;
    if (face.getFilterRule(index, type, address).isFailure())
      continue;
    anyAccept = anyAccept || type == LS_FilterType::ACCEPT;
    if (!matches(address, source))
      continue;
    verdict.accepted = type == LS_FilterType::ACCEPT;
    verdict.rule = index;
    verdict.type = type;
    verdict.address = address;
    return verdict;
  }
  verdict.accepted = !anyAccept;
  return verdict;
}

std::string InboundFilter::reason(Verdict const& verdict) {
  if (verdict.rule == kNoRule)
    return "denied, no rule of " + std::to_string(verdict.rules) + " matches";
  std::string const type = LS_FilterType::NAME(verdict.type);
  if (verdict.address.isEmpty())
    return "denied by rule " + std::to_string(verdict.rule) + " \"" + type + " any\"";
  String address;
  String mask;
  verdict.address.getIpAddrAsString(address);
  verdict.address.getNetMaskAsString(mask);
  return "denied by rule " + std::to_string(verdict.rule) + " \"" + type + " " + address.str() + " " +
         mask.str() + "\"";
}

bool InboundFilter::refuses(Exchange& exchange, LS_IIdentity const& identity, LS_IdentityFace::Type kind) {
  Verdict const verdict = exchange.clock().measure([&] {
    RefPtr<LS_IInbound> face;
    LS_getFaceIf(&identity, kind, face);
    return face ? judge(*face, exchange.request().src) : Verdict();
  });
  if (verdict.accepted)
    return false;
  exchange.setResult(exchange.clock().measure([&] { return ScriptSession::pathOf(&identity); }) + " " +
                     reason(verdict));
  exchange.answer(403, "Forbidden");
  return true;
}
