// GatewayCommands: the questions only a running gateway can answer, added to
// its command table next to the script language, so that they work over the
// control socket (and in location-console --connect) like any other line:
//
//   statistics  requests by method and answer, failed authentications,
//               bindings, trunks and their state, the library's CPU share
//   bindings [<service> [<identity>]]
//               registered contacts with their remaining lifetime, Call-ID
//               and source
//   calls       the calls relayed now (--calls relay), one line each: the
//               caller, the Request-URI, the state and, once answered,
//               the contact that answered
//   trunks      the gateway's own registrations, one line each: the
//               state, the registrar in use (one a 3xx named marked
//               "(learnt)", which the face's dump does not show) and the
//               hop it is reached by
//
// The handlers read the registrar and take a fresh reading of the
// statistics for each question; they borrow the registrar and the trunks,
// and the table they are added to must not run a line after either died.
#pragma once

#include <functional>

#include "CommandTable.h"
#include "calls/Calls.h"
#include "metrics/GatewayStatistics.h"
#include "registrar/Registrar.h"
#include "trunks/TrunkRegistrations.h"

void addGatewayCommands(CommandTable& table,
                        Registrar const& registrar,
                        TrunkRegistrations const& trunks,
                        std::function<GatewayStatistics()> statistics,
                        Calls const* calls);
