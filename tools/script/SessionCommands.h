// SessionCommands: the commands about the session rather than the model:
// diagnostic dumps of any object, saving the configuration as a script,
// watching the model's events, showing the debug monitor's lines, echoing a
// text, and the command reference.
#pragma once

class CommandTable;

void addSessionCommands(CommandTable& table);
