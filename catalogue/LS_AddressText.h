// Text forms of the SIP stack's addresses for log lines, diagnostic dumps and
// error texts, and the shared empty host-port. Parsing addresses belongs to
// the SIP stack and to the lookups, not here.
//
// Two port rules coexist on purpose: LS_hostPortToString leaves out only the
// stack's do-not-output marker, hostPortStr leaves out port 0. Callers choose
// the one whose output their log or dump format was written for.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "CNameAddr.h"
#include "CSocketAddr.h"
#include "String.h"

// Sets out to the serialised name-addr and returns it. When the text cannot
// be made, out is left as it was and the returned reference is a shared
// constant holding the platform's invalid-value text instead.
LS_EXPORT String const& LS_nameAddrToString(CNameAddr const& nameAddr, String& out);
LS_EXPORT String LS_nameAddrToString(CNameAddr const& nameAddr);

// Host, then ":port" unless the port is the do-not-output marker. Returns
// out.
LS_EXPORT String& LS_hostPortToString(CHostPort const& hostPort, String& out);
LS_EXPORT String LS_hostPortToString(CHostPort const& hostPort);

// "host:port", or the bare host when the port is 0.
LS_EXPORT String hostPortStr(CHostPort const& hostPort);
// "address:port", "[address]:port" for an IPv6 address, or the bare address
// (without brackets) when the port is 0.
LS_EXPORT String hostPortStr(CSocketAddr const& socketAddr);

// A default host-port, made on the first call and kept until the library is
// unloaded: every call returns the same object, so operations that have no
// host-port to report can hand out a reference to it.
LS_EXPORT CHostPort const& LS_emptyHostPort();
