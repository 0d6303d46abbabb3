// ScriptLanguage: the whole command language that the host programs read,
// in one table: the configuration layer's commands, the SIP stack's settings,
// actions and questions, the session commands and the reference. A program
// that builds its table here reads exactly the scripts the console reads.
#pragma once

class CommandTable;

void addScriptCommands(CommandTable& table);
