// location-console: configures the location-service library from a script
// and answers the SIP stack's questions about it, without a gateway. It
// plays the driver host (builds and registers both masters), the
// configuration layer and the SIP stack, through the library's public
// interfaces only. With --connect it is instead a client of a running
// gateway's control socket: the same scripts and prompt, run on the
// gateway's model.

#include <unistd.h>

#include <cstring>
#include <fstream>
#include <iostream>
#include <sstream>
#include <stdexcept>
#include <vector>

#include "CommandTable.h"
#include "ControlConnection.h"
#include "DefaultSession.h"
#include "ModelSaver.h"
#include "ScriptLanguage.h"
#include "ScriptRunner.h"
#include "ScriptSession.h"

namespace {

char const kUsage[] =
    "usage: location-console [--debug] [--keep-going] [--save file] [--print-default] [--help]\n"
    "                        [script ...]\n"
    "       location-console --connect PATH [--keep-going] [script ...]\n"
    "\n"
    "Runs each script in turn against one model; \"-\" reads standard input\n"
    "(with a prompt when it is a terminal). Without a script it runs the\n"
    "embedded default session: a small gateway, its dump, requests resolved\n"
    "and explained, a challenge and a response.\n"
    "\n"
    "  --debug          show the library's debug lines for each command\n"
    "  --keep-going     go on after a line that cannot be applied\n"
    "  --save file      after the scripts, write the configuration to file as\n"
    "                   the script that rebuilds it (not when a failed line\n"
    "                   stopped the run)\n"
    "  --print-default  print the default session's script and exit\n"
    "  --help           print this and the command reference, and exit\n"
    "  --connect PATH   run the scripts (standard input without one) on the\n"
    "                   gateway whose control socket is PATH; its own\n"
    "                   commands (bindings, statistics) included\n"
    "\n"
    "Exit status: 0, 1 when a line could not be applied, 2 for a usage error,\n"
    "a script that cannot be read, or a gateway that cannot be reached.\n";

// Runs each script in turn, "-" being standard input (with a prompt when it
// is a terminal), until a failed line stops the run (stopped set then).
// False, told on standard error, when a script cannot be read.
bool runScripts(ScriptRunner& runner, std::vector<std::string> const& scripts, bool& stopped) {
  for (std::string const& name : scripts) {
    if (name == "-") {
      stopped = !runner.run(std::cin, "<stdin>", isatty(STDIN_FILENO) != 0);
    } else {
      std::ifstream file(name);
      if (!file) {
        std::cerr << "location-console: cannot read " << name << ": " << std::strerror(errno) << "\n";
        return false;
      }
      stopped = !runner.run(file, name, false);
    }
    if (stopped)
      break;
  }
  return true;
}

// The scripts run on a gateway: the same runner, each line sent over the
// socket. "-" and no script read standard input.
int runConnected(std::string const& path, std::vector<std::string> scripts, bool keepGoing) {
  ControlConnection connection;
  std::string error;
  if (!connection.connect(path, error)) {
    std::cerr << "location-console: cannot connect to " << path << ": " << error << "\n";
    return 2;
  }
  ScriptRunner runner([&connection](std::string const& text) { return connection.run(text); }, std::cout,
                      std::cerr);
  runner.keepGoing(keepGoing);
  runner.beforePrompt([&connection] { connection.showEventsUntilInput(std::cout, "ls> "); });
  if (scripts.empty())
    scripts.push_back("-");
  try {
    bool stopped = false;
    if (!runScripts(runner, scripts, stopped))
      return 2;
  } catch (std::runtime_error const& lost) {
    std::cerr << "location-console: " << lost.what() << "\n";
    return 2;
  }
  return runner.anyLineFailed() ? 1 : 0;
}

}  // namespace

int main(int argc, char** argv) {
  bool debug = false;
  bool keepGoing = false;
  std::string saveTo;
  std::string connectTo;
  std::vector<std::string> scripts;
  CommandTable table;
  addScriptCommands(table);
  for (int i = 1; i < argc; ++i) {
    std::string const argument = argv[i];
    if (argument == "--debug") {
      debug = true;
    } else if (argument == "--keep-going") {
      keepGoing = true;
    } else if (argument == "--save") {
      if (i + 1 == argc) {
        std::cerr << "location-console: --save needs a file\n" << kUsage;
        return 2;
      }
      saveTo = argv[++i];
    } else if (argument == "--connect") {
      if (i + 1 == argc) {
        std::cerr << "location-console: --connect needs a socket path\n" << kUsage;
        return 2;
      }
      connectTo = argv[++i];
    } else if (argument == "--print-default") {
      std::cout << defaultSession();
      return 0;
    } else if (argument == "--help") {
      std::cout << kUsage << "\nCommands:\n" << table.reference("");
      return 0;
    } else if (argument.size() > 1 && argument[0] == '-') {
      std::cerr << "location-console: unknown option " << argument << "\n" << kUsage;
      return 2;
    } else {
      scripts.push_back(argument);
    }
  }

  if (!connectTo.empty()) {
    // The gateway keeps its changes with its own save command or
    // --autosave; its debug lines go to its own error stream.
    if (!saveTo.empty() || debug) {
      std::cerr
          << "location-console: --save and --debug are not for --connect; use save and debug on the gateway\n"
          << kUsage;
      return 2;
    }
    return runConnected(connectTo, scripts, keepGoing);
  }

  ScriptSession session;
  session.showDebugLines(debug);
  ScriptRunner runner(session, table, std::cout, std::cerr);
  runner.keepGoing(keepGoing);
  bool stopped = false;
  if (scripts.empty()) {
    std::istringstream script(defaultSession());
    stopped = !runner.run(script, "<default>", false);
  }
  if (!runScripts(runner, scripts, stopped))
    return 2;
  int const status = runner.anyLineFailed() ? 1 : 0;
  if (saveTo.empty())
    return status;
  // A run cut short holds part of what the scripts describe; saving it
  // under the name asked for would pass it off as the whole.
  if (stopped) {
    std::cerr << "location-console: not saved to " << saveTo << ": the run stopped at a failed line\n";
    return status;
  }
  std::string script;
  try {
    script = ModelSaver(session).script();
  } catch (std::runtime_error const& error) {
    std::cerr << "location-console: not saved to " << saveTo << ": " << error.what() << "\n";
    return 2;
  }
  std::ofstream file(saveTo, std::ios::binary);
  if (!(file << script).flush()) {
    std::cerr << "location-console: cannot write " << saveTo << ": " << std::strerror(errno) << "\n";
    return 2;
  }
  return status;
}
