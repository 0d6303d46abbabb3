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

#include <algorithm>
#include <cerrno>
#include <cstdlib>
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
    "                        [--min-expires S] [--max-expires S] [--default-expires S]\n"
    "                        [--nat-ping S] [--debug] [--statistics] SCRIPT...\n"
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
    "  --min-expires, --max-expires, --default-expires\n"
    "                the registration lifetimes in seconds for subscribers\n"
    "                whose face gives no lifetime range (60, 3600, 3600)\n"
    "  --nat-ping    OPTIONS every S seconds to phones registered from behind\n"
    "                NAT over UDP; a phone missing three is unregistered\n"
    "  --debug       show the library's debug lines\n"
    "  --statistics  at exit, the requests answered and the CPU time spent\n"
    "                in the library's calls\n"
    "\n"
    "Exit status: 0 after a signal, 1 when a script line fails or a\n"
    "listener cannot be opened, 2 for a usage error or an unreadable script.\n";

// A number of seconds, all digits, at least 1.
bool seconds(char const* text, uint32_t& value) {
  char* end = nullptr;
  errno = 0;
  unsigned long const parsed = std::strtoul(text, &end, 10);
  if (*text < '0' || *text > '9' || *end != '\0' || errno != 0 || parsed == 0 || parsed > UINT32_MAX)
    return false;
  value = static_cast<uint32_t>(parsed);
  return true;
}

void onSignal(int) {
  re_cancel();
}

struct Options {
  SipFrontEnd::Settings sip;
  bool debug = false;
  bool statistics = false;
  std::vector<std::string> scripts;
};

// Options from the command line; false after printing the usage.
bool parse(int argc, char** argv, Options& options) {
  for (int i = 1; i < argc; ++i) {
    std::string const argument = argv[i];
    if (argument == "--listen" && i + 1 < argc)
      options.sip.listen.push_back(argv[++i]);
    else if (argument == "--dns-server" && i + 1 < argc)
      options.sip.dnsServers.push_back(argv[++i]);
    else if (argument == "--min-expires" && i + 1 < argc && seconds(argv[++i], options.sip.expiry.minimum))
      continue;
    else if (argument == "--max-expires" && i + 1 < argc && seconds(argv[++i], options.sip.expiry.maximum))
      continue;
    else if (argument == "--default-expires" && i + 1 < argc &&
             seconds(argv[++i], options.sip.expiry.defaultLifetime))
      continue;
    else if (argument == "--nat-ping" && i + 1 < argc && seconds(argv[++i], options.sip.natPingSeconds))
      continue;
    else if (argument == "--debug")
      options.debug = true;
    else if (argument == "--statistics")
      options.statistics = true;
    else if (argument.size() > 1 && argument[0] == '-')
      return false;
    else
      options.scripts.push_back(argument);
  }
  // A default above the maximum is cut to it, as a requested expiry is.
  ExpiryRange& expiry = options.sip.expiry;
  expiry.defaultLifetime = std::min(expiry.defaultLifetime, expiry.maximum);
  if (expiry.minimum > expiry.defaultLifetime)
    return false;
  if (options.sip.listen.empty())
    options.sip.listen.push_back("127.0.0.1:5060");
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
  if (!frontEnd.start(options.sip, error)) {
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
