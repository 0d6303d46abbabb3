// Feeds arbitrary bytes to the parsers that see text from the network: a
// host-port, a name-addr (then serialised again, and the serialised text
// parsed once more) and an IP address with net mask (the input split at its
// first newline into address and mask).
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "CBlob.h"
#include "CHostPort.h"
#include "CNameAddr.h"
#include "IpAddress.h"
#include "String.h"

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
  char const* text = reinterpret_cast<char const*>(data);

  CHostPort hostPort;
  hostPort.Parse(text, size);

  CNameAddr nameAddr;
  if (nameAddr.Parse(text, size)) {
    CBlob blob;
    nameAddr.Serialize(blob);
    // What the stack serialises it must read back as the same address.
    CNameAddr again;
    if (!again.Parse(reinterpret_cast<char const*>(blob.GetData()), blob.GetSize()) || !(again == nameAddr) ||
        !(again.GetDisplayName() == nameAddr.GetDisplayName()))
      std::abort();
  }

  char const* newline = static_cast<char const*>(std::memchr(text, '\n', size));
  size_t const addressLength = newline ? static_cast<size_t>(newline - text) : size;
  String const address(text, addressLength);
  String const netMask = newline ? String(newline + 1, size - addressLength - 1) : String();
  IpAddress ipAddress;
  ipAddress.set(address, netMask);
  String out;
  ipAddress.getIpAddrAsString(out);
  ipAddress.getNetMaskAsString(out);
  return 0;
}
