// Feeds arbitrary bytes to the parsers that see address text: a host-port
// as configuration writes it and as a URI carries it, a name-addr, and an
// IP address with net mask (the input split at its first newline into
// address and mask). Besides not crashing, the parsers must agree with
// themselves:
//   - the URI host grammar accepts exactly what a regular expression of the
//     same grammar accepts, and only host-ports that the configuration
//     grammar reads as the same value;
//   - assignment from a CString reads what Parse reads;
//   - every printed form (LS_hostPortToString, hostPortStr,
//     LS_nameAddrToString) parses back to the same scheme, display name,
//     user, host, port, number and phone context, and prints the same again.
#include <arpa/inet.h>
#include <re2/re2.h>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "CBlob.h"
#include "CHostPort.h"
#include "CNameAddr.h"
#include "IpAddress.h"
#include "LS_AddressText.h"
#include "String.h"

namespace {

void check(bool condition) {
  if (!condition)
    std::abort();
}

std::string bytes(CString const& text) {
  return std::string(text.c_str(), text.length());
}

// Byte for byte, unlike CHostPort's equality, which folds the host's case.
bool same(CHostPort const& a, CHostPort const& b) {
  return a.GetHost() == b.GetHost() && a.GetPort() == b.GetPort();
}

// The URI host-port grammar written a second way: hostname, IPv4 address
// or a bracketed reference whose inside inet_pton reads as IPv6, then an
// optional decimal port. Latin-1, so that every byte is one character.
bool isUriHostPortByPattern(char const* text, size_t size) {
  static RE2 const pattern(
      "(?:(?:[A-Za-z0-9](?:[A-Za-z0-9-]*[A-Za-z0-9])?\\.)*[A-Za-z](?:[A-Za-z0-9-]*[A-Za-z0-9])?\\.?"
      "|(?:(?:25[0-5]|2[0-4][0-9]|[01]?[0-9]?[0-9])\\.){3}(?:25[0-5]|2[0-4][0-9]|[01]?[0-9]?[0-9])"
      "|\\[([0-9A-Fa-f:.]+)\\])"
      "(?::0*([0-9]{1,5}))?",
      RE2::Latin1);
  std::string ipv6;
  std::string port;
  if (!RE2::FullMatch(re2::StringPiece(text, size), pattern, &ipv6, &port))
    return false;
  unsigned char address[16];
  if (!ipv6.empty() && inet_pton(AF_INET6, ipv6.c_str(), address) != 1)
    return false;
  return port.empty() || std::strtoul(port.c_str(), nullptr, 10) <= 65535;
}

void checkHostPort(char const* text, size_t size) {
  CHostPort configured(CString("previous"), 1);
  bool const parsed = configured.Parse(text, size);
  CHostPort assigned(CString("previous"), 1);
  assigned = CString(text, size);
  check(same(assigned, configured));

  CHostPort uri(CString("previous"), 1);
  bool const strict = uri.ParseUriHostPort(text, size);
  check(strict == isUriHostPortByPattern(text, size));
  check(same(uri, strict ? configured : CHostPort()));
  if (!parsed) {
    check(same(configured, CHostPort()));
    return;
  }

  for (String const& printed : {LS_hostPortToString(configured), hostPortStr(configured)}) {
    CHostPort again;
    again = CString(printed.c_str(), printed.length());
    check(same(again, configured));
  }
  // The text assigned lives inside the value it is assigned to.
  CHostPort self = configured;
  self = self.GetHost();
  check(same(self, CHostPort(configured.GetHost(), 0)));
}

// What a caller can read of a name-addr, in one comparable list.
std::vector<std::string> parts(CNameAddr const& nameAddr) {
  std::vector<std::string> out = {std::to_string(nameAddr.GetUriKind()), bytes(nameAddr.GetDisplayName())};
  CSipUri const* const sip = nameAddr.GetSipUri();
  check((sip != nullptr) ==
        (nameAddr.GetUriKind() == CNameAddr::URI_SIP || nameAddr.GetUriKind() == CNameAddr::URI_SIPS));
  if (sip) {
    check(sip->IsSecure() == (nameAddr.GetUriKind() == CNameAddr::URI_SIPS));
    CHostPort const& hostPort = sip->GetHostPort();
    out.insert(out.end(),
               {bytes(sip->GetUser()), bytes(hostPort.GetHost()), std::to_string(hostPort.GetPort())});
    // A host from a URI obeys the URI grammar on its own.
    check(isUriHostPortByPattern(hostPort.GetHost().c_str(), hostPort.GetHost().length()));
  }
  CTelUri const* const tel = nameAddr.GetTelUri();
  check((tel != nullptr) == (nameAddr.GetUriKind() == CNameAddr::URI_TEL));
  if (tel) {
    out.push_back(bytes(tel->GetNumber()));
    if (CString const* const context = tel->GetPhoneContext())
      out.push_back(bytes(*context));
  }
  return out;
}

void checkNameAddr(char const* text, size_t size) {
  CNameAddr nameAddr;
  if (!nameAddr.Parse(text, size)) {
    check(nameAddr == CNameAddr() && parts(nameAddr) == parts(CNameAddr()));
    return;
  }
  std::vector<std::string> const read = parts(nameAddr);

  String printed;
  check(&LS_nameAddrToString(nameAddr, printed) == &printed);
  // The serialised bytes hold no zero byte, which would cut the text short.
  CBlob blob;
  nameAddr.Serialize(blob);
  check(std::string(reinterpret_cast<char const*>(blob.GetData()), blob.GetSize()) == printed.str());

  CNameAddr again;
  check(again.Parse(printed.c_str(), printed.length()));
  check(again == nameAddr && parts(again) == read);
  check(LS_nameAddrToString(again) == printed);

  // The text parsed lives inside the value that parses it.
  CNameAddr self = nameAddr;
  self.Parse(self.GetDisplayName().c_str(), self.GetDisplayName().length());
  parts(self);
}

void checkIpAddress(char const* text, size_t size) {
  char const* newline = static_cast<char const*>(std::memchr(text, '\n', size));
  size_t const addressLength = newline ? static_cast<size_t>(newline - text) : size;
  String const address(text, addressLength);
  String const netMask = newline ? String(newline + 1, size - addressLength - 1) : String();
  IpAddress ipAddress;
  ipAddress.set(address, netMask);
  String out;
  ipAddress.getIpAddrAsString(out);
  ipAddress.getNetMaskAsString(out);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
  char const* text = reinterpret_cast<char const*>(data);
  checkHostPort(text, size);
  checkNameAddr(text, size);
  checkIpAddress(text, size);
  return 0;
}
