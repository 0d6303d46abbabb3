#include "control/GatewayCommands.h"

#include "ScriptSession.h"

void addGatewayCommands(CommandTable& table, SipFrontEnd const& frontEnd) {
  table.add("statistics", "what the gateway answered, its bindings and trunks, the library's CPU share",
            [&frontEnd](ScriptSession& session, Arguments const&) {
              session.output() << frontEnd.statistics().text();
            });
}
