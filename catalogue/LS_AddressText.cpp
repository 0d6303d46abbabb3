#include "LS_AddressText.h"

#include "CBlob.h"
#include "PlatformTexts.h"

String const& LS_nameAddrToString(CNameAddr const& nameAddr, String& out) {
  static String const invalid(ERROR::INVALID);
  CBlob blob;
  nameAddr.Serialize(blob);
  unsigned char const terminator = 0;
  if (blob.Insert(blob.GetSize(), &terminator, 1) < 0)
    return invalid;
  out = String(reinterpret_cast<char const*>(blob.GetData()));
  return out;
}

String LS_nameAddrToString(CNameAddr const& nameAddr) {
  String text;
  return LS_nameAddrToString(nameAddr, text);
}

String& LS_hostPortToString(CHostPort const& hostPort, String& out) {
  out = String(hostPort.GetHost().c_str());
  if (hostPort.GetPort() != CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT)
    out.concatf(":%u", static_cast<unsigned int>(hostPort.GetPort()));
  return out;
}

String LS_hostPortToString(CHostPort const& hostPort) {
  String text;
  return LS_hostPortToString(hostPort, text);
}

String hostPortStr(CHostPort const& hostPort) {
  String text(hostPort.GetHost().c_str());
  if (hostPort.GetPort() != 0)
    text.concatf(":%u", static_cast<unsigned int>(hostPort.GetPort()));
  return text;
}

String hostPortStr(CSocketAddr const& socketAddr) {
  CString const address = socketAddr.GetAddress(true);
  unsigned short const port = socketAddr.GetPort();
  if (port == 0)
    return String(address.c_str());
  String text;
  if (socketAddr.GetKind() == CSocketAddr::KIND_IPV6)
    return text.format("[%s]:%u", address.c_str(), static_cast<unsigned int>(port));
  return text.format("%s:%u", address.c_str(), static_cast<unsigned int>(port));
}

CHostPort const& LS_emptyHostPort() {
  static CHostPort const empty;
  return empty;
}
