// The lookups through which the SIP stack finds the two masters, a location
// or authentication service by name, and the location service responsible
// for a host.
//
// Each takes a String& error first and writes a message in capital letters
// into it only when a step fails for a reason it names; the text is never
// cleared, and a failure passed on from a nested lookup keeps the nested
// text. A null master is found through the system driver repository under
// LS_masterDriverName; a given master is used as it is. The functions keep
// no state and take no lock of their own; every call on an object goes
// through that object's LockedPtr for that one call. They allocate nothing
// that outlives the call except the references handed back.
//
// Decision: without a master, every call asks the repository; nothing found
// there is kept, so the repository stays the authority when drivers are
// registered, replaced or removed between calls. What made asking it cost
// was building the driver name on every call; the two names are pure
// functions of constant arguments and are built once instead, which leaves
// the repository's own lookup by name as the price of passing no master.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "LS_IAuthenticationService.h"
#include "LS_ILocationService.h"
#include "LS_IMasterAuthenticationService.h"
#include "LS_IMasterLocationService.h"
#include "LS_Imperative.h"
#include "RefPtr.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

LS_EXPORT XCode LS_getMasterLocationService(String& error, RefPtr<LS_IMasterLocationService>& out);
LS_EXPORT XCode LS_getMasterAuthenticationService(String& error, RefPtr<LS_IMasterAuthenticationService>& out);

LS_EXPORT XCode LS_getLocationService(String& error,
                            RefPtr<LS_ILocationService>& out,
                            String const& name,
                            LS_IMasterLocationService* master);
LS_EXPORT XCode LS_getAuthenticationService(String& error,
                                  RefPtr<LS_IAuthenticationService>& out,
                                  String const& name,
                                  LS_IMasterAuthenticationService* master);

// The location service responsible for host among names, tried in their
// order, in three passes: the configured domains (an exact match ends the
// pass, else the first partial match wins); then the first service marked
// default domain, whatever the host and imperative; then the configured
// domains and localHostPorts together, as in the first pass. Services less
// authoritative than imperative take part in the second pass only. A name
// that does not resolve is skipped without a message.
LS_EXPORT XCode LS_getLocationService(String& error,
                            RefPtr<LS_ILocationService>& out,
                            CHostPort const& host,
                            Vector<String> const& names,
                            Vector<CHostPort> const& localHostPorts,
                            LS_Imperative::Type imperative,
                            LS_IMasterLocationService* master);
// The same among all location services of the master, in creation order.
LS_EXPORT XCode LS_getLocationService(String& error,
                            RefPtr<LS_ILocationService>& out,
                            CHostPort const& host,
                            Vector<CHostPort> const& localHostPorts,
                            LS_Imperative::Type imperative,
                            LS_IMasterLocationService* master);
