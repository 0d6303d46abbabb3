// CHostPort: a SIP host with an optional 16-bit port, as written in a URI or
// configured as a domain: "host", "host:port", "[v6]" or "[v6]:port". Hosts
// are kept as written; no name resolution happens here, and the text forms
// for dumps belong to the catalogue.
#pragma once

#include "Export.h"

#include <cstddef>

#include "CString.h"

// A value type; copies are independent. Host texts of IPv6 references keep
// their brackets ("[::1]"), so "%s:%u" of host and port is again a valid
// host-port.
//
// Two host grammars, one per source of text. Configuration writes domains
// as patterns, so Parse and assignment from CString accept a wildcard
// ("*.example.com") and any run of letters, digits and "-._*". A URI from
// the network names one host, so ParseUriHostPort, which CSipUri uses,
// accepts only a host name of dot-separated labels (letters, digits and
// inner hyphens; the last label starts with a letter; one trailing dot
// allowed), an IPv4 address (four decimal parts of one to three digits,
// each at most 255) or a bracketed IPv6 reference; CTelUri holds the
// phone context, which the lookups turn into a host, to the same host-name
// rule. Where the two meet, in domain matching by equality, a request can
// therefore never name a wildcard domain literally: "*" is configuration's,
// never a host. Every host that ParseUriHostPort accepts, Parse accepts
// with the same value.
//
// Equality is that of the port and of the host text ignoring ASCII case,
// since SIP compares hosts without regard to case: a request for
// "Example.COM" reaches the domain "example.com". The host is still kept
// and printed as written.
class LS_EXPORT CHostPort {
 public:
  // The port value that is not printed. The stand-in has no separate "use
  // the SIP default port" state: a port that was not given is exactly the
  // port that must not be printed, so the marker is 0, the "no port" value.
  static unsigned short const ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT;

  CHostPort() = default;
  // Takes the host as given, without checking it.
  CHostPort(CString const& host, unsigned short port) : m_host(host), m_port(port) {}

  // Parses text; malformed text leaves the value Reset(). The text may be
  // this object's own host.
  CHostPort& operator=(CString const& text);

  // Parses [text, text + length). Malformed: empty text, empty host, a
  // character outside letters, digits and "-._*" in a name, an IPv6
  // reference that is unbalanced or not an IPv6 address, anything but
  // ":port" after the host, and a port that is empty, signed, not decimal
  // or above 65535. An explicit ":0" is the same as no port. On failure
  // the value is Reset() and false returned.
  bool Parse(char const* text, size_t length);

  // As Parse, but the host must follow the URI host grammar above.
  bool ParseUriHostPort(char const* text, size_t length);

  void Reset();

  CString const& GetHost() const { return m_host; }
  // 0 when no port was given.
  unsigned short GetPort() const { return m_port; }

  friend bool operator==(CHostPort const& a, CHostPort const& b) {
    return a.m_port == b.m_port && a.m_host.equalsIgnoringCase(b.m_host);
  }
  friend bool operator!=(CHostPort const& a, CHostPort const& b) { return !(a == b); }

 private:
  bool parse(char const* text, size_t length, bool uriHost);

  CString m_host;
  unsigned short m_port = 0;
};
