// location-gateway: the location-service library answering real SIP traffic
// on libre. It reads its configuration from scripts in the console's
// language, then serves as registrar (digest-authenticated REGISTER) and
// redirect server (302 to where a subscriber is registered) on UDP and TCP
// at every address it is given, and registers its trunks with their
// registrars, found through DNS, until SIGINT or SIGTERM. It uses the library's public interfaces only.
// This file reads the options into the Gateway's settings and runs the
// scripts; the Gateway (Gateway.h) builds the parts and runs them.
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
#include "Gateway.h"
#include "ScriptLanguage.h"
#include "ScriptRunner.h"
#include "ScriptSession.h"
#include "registrar/CredentialMask.h"
#include "registrar/DigestAuthentication.h"
#include "registrar/ExpiryRange.h"
#include "sip/Libre.h"
#include "sip/SourceFilter.h"

namespace {

char const kUsage[] =
    "usage: location-gateway [--listen ADDR:PORT]... [--dns-server ADDR:PORT]...\n"
    "                        [--min-expires S] [--max-expires S] [--default-expires S]\n"
    "                        [--nat-ping S] [--store WHERE] [--debug] [--statistics] [--control PATH]\n"
    "                        [--autosave FILE] [--metrics ADDR:PORT] [OPTION...] SCRIPT...\n"
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
    "  --store WHERE where registrations outlive the process: a file (SQLite;\n"
    "                default location-gateway.sqlite), a postgresql:// URI\n"
    "                (gateways sharing it learn each other's), or none\n"
    "  --debug       show the library's debug lines\n"
    "  --statistics  at exit, the requests answered and the CPU time spent\n"
    "                in the library's calls\n"
    "  --digest LIST the algorithms each challenge offers, in order\n"
    "                (default SHA-256,MD5; both are always accepted); phones\n"
    "                that read only the first challenge and know only MD5\n"
    "                (PJSIP before 2.12, Asterisk 18 and FreeSWITCH 1.10\n"
    "                registering, SIPp) need MD5,SHA-256\n"
    "  --nonce-key-file PATH  the key that signs the nonces, shared by the\n"
    "                gateways of a cluster so that a nonce of one gets a\n"
    "                fresh challenge with stale=true at another, and after\n"
    "                a restart; made (mode 0600) when missing; default a\n"
    "                key of the process's own\n"
    "  --calls MODE  relay (the default): the gateway places the calls to its\n"
    "                subscribers itself and relays the signalling between\n"
    "                the phones (the media go from phone to phone); redirect:\n"
    "                302 to where the subscriber is registered\n"
    "  --max-calls N  at most N calls relayed at once; beyond, 503 with\n"
    "                Retry-After (default no limit)\n"
    "  --redirect-from CIDR  answer INVITE and the other redirected requests\n"
    "                only from this network (repeatable; default any source)\n"
    "  --source-rate N  refuse a source address sending more than N requests\n"
    "                a second for a while (default off)\n"
    "  --tls ADDR:PORT  SIP over TLS too (needs --certificate)\n"
    "  --ws ADDR:PORT, --wss ADDR:PORT  SIP over WebSocket, plain or secure\n"
    "                (RFC 7118; --wss needs --certificate)\n"
    "  --certificate FILE, --key FILE  the server's certificate and key (PEM)\n"
    "  --ca-file FILE  verify TLS trunks' carriers against these CA\n"
    "                certificates (PEM) instead of the system's\n"
    "  --allow-vulnerable-websocket  WebSocket even on a libre before 4.8.1,\n"
    "                which any peer can crash (CVE-2026-50161): tests only\n"
    "  --control PATH   a Unix socket (mode 0600) taking lines of the script\n"
    "                   language while serving: location-console --connect PATH\n"
    "  --autosave FILE  after a change over the socket, the configuration\n"
    "                   into FILE as save writes it (at most once a second)\n"
    "  --metrics ADDR:PORT  GET /metrics over HTTP, in Prometheus text format\n"
    "\n"
    "Exit status: 0 after a signal, 1 when a script line fails, a listener,\n"
    "the store or the nonce key file cannot be opened, 2 for a usage error\n"
    "or an unreadable script.\n";

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

struct Options {
  Gateway::Settings gateway;
  bool debug = false;
  std::vector<std::string> scripts;
};

// Options from the command line; false after printing the usage.
bool parse(int argc, char** argv, Options& options) {
  Gateway::Settings& settings = options.gateway;
  for (int i = 1; i < argc; ++i) {
    std::string const argument = argv[i];
    if (argument == "--listen" && i + 1 < argc)
      settings.sip.listen.push_back(argv[++i]);
    else if (argument == "--dns-server" && i + 1 < argc)
      settings.sip.dnsServers.push_back(argv[++i]);
    else if (argument == "--min-expires" && i + 1 < argc && seconds(argv[++i], settings.expiry.minimum))
      continue;
    else if (argument == "--max-expires" && i + 1 < argc && seconds(argv[++i], settings.expiry.maximum))
      continue;
    else if (argument == "--default-expires" && i + 1 < argc &&
             seconds(argv[++i], settings.expiry.defaultLifetime))
      continue;
    else if (argument == "--nat-ping" && i + 1 < argc && seconds(argv[++i], settings.natPingSeconds))
      continue;
    else if (argument == "--control" && i + 1 < argc)
      settings.control = argv[++i];
    else if (argument == "--autosave" && i + 1 < argc)
      settings.autosave = argv[++i];
    else if (argument == "--metrics" && i + 1 < argc)
      settings.metrics = argv[++i];
    else if (argument == "--store" && i + 1 < argc)
      settings.store = argv[++i];
    else if (argument == "--debug")
      options.debug = true;
    else if (argument == "--statistics")
      settings.statistics = true;
    else if (argument == "--digest" && i + 1 < argc && parseDigestAlgorithms(argv[i + 1], settings.digest))
      ++i;
    else if (argument == "--nonce-key-file" && i + 1 < argc)
      settings.nonceKeyFile = argv[++i];
    else if (argument == "--tls" && i + 1 < argc)
      settings.secure.tls = argv[++i];
    else if (argument == "--ws" && i + 1 < argc)
      settings.secure.ws = argv[++i];
    else if (argument == "--wss" && i + 1 < argc)
      settings.secure.wss = argv[++i];
    else if (argument == "--certificate" && i + 1 < argc)
      settings.secure.certificate = argv[++i];
    else if (argument == "--key" && i + 1 < argc)
      settings.secure.key = argv[++i];
    else if (argument == "--ca-file" && i + 1 < argc)
      settings.caFile = argv[++i];
    else if (argument == "--allow-vulnerable-websocket")
      settings.secure.allowVulnerableWebSocket = true;
    else if (argument == "--redirect-from" && i + 1 < argc && SourceFilter().allow(argv[i + 1]))
      settings.redirectFrom.push_back(argv[++i]);
    else if (argument == "--calls" && i + 1 < argc &&
             (std::strcmp(argv[i + 1], "relay") == 0 || std::strcmp(argv[i + 1], "redirect") == 0))
      settings.relayCalls = std::strcmp(argv[++i], "relay") == 0;
    else if (argument == "--max-calls" && i + 1 < argc && seconds(argv[++i], settings.maxCalls))
      continue;
    else if (argument == "--source-rate" && i + 1 < argc &&
             (settings.sourceRate = std::strtoul(argv[++i], nullptr, 10)) > 0)
      continue;
    else if (argument.size() > 1 && argument[0] == '-')
      return false;
    else
      options.scripts.push_back(argument);
  }
  // A default above the maximum is cut to it, as a requested expiry is.
  ExpiryRange& expiry = settings.expiry;
  expiry.defaultLifetime = std::min(expiry.defaultLifetime, expiry.maximum);
  if (expiry.minimum > expiry.defaultLifetime)
    return false;
  if (settings.sip.listen.empty())
    settings.sip.listen.push_back("127.0.0.1:5060");
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
  Gateway gateway(session, options.gateway);
  std::string error;
  if (!gateway.start(error)) {
    std::cerr << "location-gateway: " << error << "\n";
    return 1;
  }
  gateway.run();
  gateway.shutDown();
  if (options.gateway.statistics)
    std::cerr << "location-gateway: " << gateway.summary() << std::endl;
  return 0;
}

}  // namespace

int main(int argc, char** argv) {
  CredentialMask const maskedOutput(std::cout);
  CredentialMask const maskedErrors(std::cerr);
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
