// CSocketAddr: an IPv4 or IPv6 transport address with a 16-bit port, as the
// stack reports where a message came from or went to. It holds numeric
// addresses only; name resolution and socket handling do not belong here.
#pragma once

#include "Export.h"

#include "CString.h"

class LS_EXPORT CSocketAddr {
 public:
  // Values of GetKind().
  enum : unsigned int {
    KIND_IPV4 = 0,
    KIND_IPV6 = 1,
  };

  // The IPv4 address 0.0.0.0, port 0.
  CSocketAddr() = default;

  // Takes a numeric address: dotted IPv4 or IPv6 text without brackets or
  // zone. Null or malformed text gives the default value and false.
  bool Set(char const* address, unsigned short port);

  // The numeric address text, IPv6 without brackets. numeric asks for a
  // number instead of a host name; the stand-in resolves no names, so the
  // text is numeric either way.
  CString GetAddress(bool numeric) const;
  unsigned short GetPort() const { return m_port; }
  unsigned int GetKind() const { return m_kind; }

 private:
  unsigned int m_kind = KIND_IPV4;
  // Network byte order; IPv4 uses the first four bytes.
  unsigned char m_address[16] = {};
  unsigned short m_port = 0;
};
