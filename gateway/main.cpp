// location-gateway: the location-service library answering real SIP traffic
// on libre. It reads its configuration from scripts in the console's
// language, then serves as registrar (digest-authenticated REGISTER) and
// redirect server (302 to where a subscriber is registered) on UDP and TCP
// at every address it is given, and registers its trunks with their
// registrars, found through DNS, until SIGINT or SIGTERM. It uses the library's public interfaces only.
//
// libre is chosen as the stack: Debian packages it for every architecture
// the gateway runs on, it is small, runs everything on one event loop (which
// the library, not internally synchronised, needs), and brings server and
// client transactions, registration client and digest helpers.

#include <cstring>
#include <fstream>
#include <iostream>
#include <string>
#include <vector>

#include "CommandTable.h"
#include "ScriptLanguage.h"
#include "ScriptRunner.h"
#include "ScriptSession.h"
#include "metrics/LibraryClock.h"
#include "sip/Libre.h"
#include "sip/SipFrontEnd.h"

namespace {

char const kUsage[] =
    "usage: location-gateway [--listen ADDR:PORT]... [--dns-server ADDR:PORT]...\n"
    "                        [--debug] [--statistics] SCRIPT...\n"
    "\n"
    "Configures the library from the scripts (the console's language), then\n"
    "answers SIP requests over UDP and TCP on every ADDR:PORT given (default\n"
    "127.0.0.1:5060; [IPv6]:PORT for IPv6; 0.0.0.0 or [::] for every address\n"
    "of the machine; port 0 takes a free one) until SIGINT or SIGTERM. One\n"
    "line per request answered on standard output: method, request URI,\n"
    "identity or the library's error text, response code.\n"
    "\n"
    "  --dns-server  a DNS server to resolve names with instead of the\n"
    "                system's (/etc/resolv.conf)\n"
    "  --debug       show the library's debug lines\n"
    "  --statistics  at exit, the requests answered and the CPU time spent\n"
    "                in the library's calls\n"
    "\n"
    "Exit status: 0 after a signal, 1 when a script line fails or a\n"
    "listener cannot be opened, 2 for a usage error or an unreadable script.\n";

void onSignal(int) {
  re_cancel();
}

struct Options {
  SipFrontEnd::Settings network;
  bool debug = false;
  bool statistics = false;
  std::vector<std::string> scripts;
};

// Options from the command line; false after printing the usage.
bool parse(int argc, char** argv, Options& options) {
  for (int i = 1; i < argc; ++i) {
    std::string const argument = argv[i];
    if (argument == "--listen" && i + 1 < argc)
      options.network.listen.push_back(argv[++i]);
    else if (argument == "--dns-server" && i + 1 < argc)
      options.network.dnsServers.push_back(argv[++i]);
    else if (argument == "--debug")
      options.debug = true;
    else if (argument == "--statistics")
      options.statistics = true;
    else if (argument.size() > 1 && argument[0] == '-')
      return false;
    else
      options.scripts.push_back(argument);
  }
  if (options.network.listen.empty())
    options.network.listen.push_back("127.0.0.1:5060");
  return !options.scripts.empty();
}

// 0 when every script ran, else the exit status.
int runScripts(ScriptSession& session, std::vector<std::string> const& scripts) {
  CommandTable table;
  addScriptCommands(table);
  ScriptRunner runner(session, table, std::cout, std::cerr);
  for (std::string const& name : scripts) {
    std::ifstream file(name);
    if (!file) {
      std::cerr << "location-gateway: cannot read " << name << ": " << std::strerror(errno) << "\n";
      return 2;
    }
    if (!runner.run(file, name, false))
      return 1;
  }
  std::cout.flush();
  return 0;
}

int serve(ScriptSession& session, Options const& options) {
  LibraryClock clock(options.statistics);
  SipFrontEnd frontEnd(session, clock);
  std::string error;
  if (!frontEnd.start(options.network, error)) {
    std::cerr << "location-gateway: " << error << "\n";
    return 1;
  }
  if (frontEnd.dnsServers().empty())
    std::cerr << "location-gateway: no DNS server configured: host names will not resolve\n";
  std::cerr << "location-gateway: listening on " << frontEnd.listening() << std::endl;
  re_main(onSignal);
  frontEnd.shutDown();
  if (options.statistics)
    std::cerr << "location-gateway: " << frontEnd.requests() << " requests, " << clock.summary() << std::endl;
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  Options options;
  if (!parse(argc, argv, options)) {
    std::cerr << kUsage;
    return 2;
  }
  int status = 0;
  {
    ScriptSession session;
    session.showDebugLines(options.debug);
    status = runScripts(session, options.scripts);
    if (status == 0) {
      if (libre_init() != 0) {
        std::cerr << "location-gateway: the SIP stack cannot start\n";
        return 1;
      }
      status = serve(session, options);
      libre_close();
    }
  }
  return status;
}
