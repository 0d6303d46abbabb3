// CSipUri: a SIP or SIPS URI, sip:[user[:password]@]host[:port][;params][?headers].
// It keeps what the lookups read, the user part and the host-port; the
// password, parameters and headers are checked but not kept. Comparing
// URIs and building them belong elsewhere (CNameAddr keeps the URI text).
#pragma once

#include "Export.h"

#include <cstddef>

#include "CHostPort.h"
#include "CString.h"

class LS_EXPORT CSipUri {
 public:
  CSipUri() = default;

  // Parses a whole URI, scheme included ("sip:" or "sips:", any case). The
  // host follows the strict URI grammar of CHostPort::ParseUriHostPort: a
  // wildcard or a malformed name from the network is malformed text, not a
  // host to match against configured domains. On malformed text the value
  // is reset and false returned.
  bool Parse(char const* text, size_t length);

  // True for a "sips:" URI.
  bool IsSecure() const { return m_secure; }
  // The user part exactly as written, with any ";" parameters it carries
  // ("+4930123;phone-context=example.com"); empty when the URI has none.
  // Escapes are checked ("%" and two hex digits) but not decoded: the user
  // part is compared with configured identity names as written, and
  // decoding would let "%61lice" and "alice" meet only on one side.
  CString const& GetUser() const { return m_user; }
  CHostPort const& GetHostPort() const { return m_hostPort; }

 private:
  // Stores the parts of a well-formed text; leaves the value alone otherwise.
  bool assign(char const* text, size_t length);
  void Reset();

  bool m_secure = false;
  CString m_user;
  CHostPort m_hostPort;
};
