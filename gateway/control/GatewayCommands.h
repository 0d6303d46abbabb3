// GatewayCommands: the questions only a running gateway can answer, added to
// its command table next to the script language, so that they work over the
// control socket (and in location-console --connect) like any other line:
//
//   statistics  requests by method and answer, failed authentications,
//               bindings, trunks and their state, the library's CPU share
//   bindings [<service> [<identity>]]
//               registered contacts with their remaining lifetime, Call-ID
//               and source
//
// The handlers borrow the front-end; the table they are added to must not
// run a line after it died.
#pragma once

#include "CommandTable.h"
#include "sip/SipFrontEnd.h"

void addGatewayCommands(CommandTable& table, SipFrontEnd const& frontEnd);
