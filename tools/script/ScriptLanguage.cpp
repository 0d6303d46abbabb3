#include "ScriptLanguage.h"

#include "CommandTable.h"
#include "ConfigCommands.h"
#include "ScriptSession.h"
#include "SessionCommands.h"
#include "StackCommands.h"

void addScriptCommands(CommandTable& table) {
  addConfigCommands(table);
  addStackCommands(table);
  addSessionCommands(table);
  // The table outlives every session that runs a line of it.
  table.add("help [<topic>]", "the command reference, or the commands that begin with topic",
            [&table](ScriptSession& session, Arguments const& arguments) {
              session.output() << table.reference(arguments.has("topic") ? arguments.text("topic") : "");
            });
}
