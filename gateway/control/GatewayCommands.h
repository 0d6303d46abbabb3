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
//   mwi         each identity with a message-waiting face in explicit or
//               implicit mode: its mode, the subscription's state, the
//               notifier (learnt, when a 3xx named it) and what the
//               message server said last (MessageWaiting::describe)
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
#include "mwi/MessageWaiting.h"
#include "registrar/Registrar.h"
#include "trunks/TrunkRegistrations.h"

void addGatewayCommands(CommandTable& table,
                        Registrar const& registrar,
                        TrunkRegistrations const& trunks,
                        std::function<GatewayStatistics()> statistics,
                        Calls const* calls);
// The mwi question; the table must not run a line after messageWaiting died.
void addMessageWaitingCommand(CommandTable& table, MessageWaiting const& messageWaiting);
