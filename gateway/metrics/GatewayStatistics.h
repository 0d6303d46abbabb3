// GatewayStatistics: one reading of what the gateway counts since it started,
// taken by the Gateway on libre's thread, and its text as the statistics
// question prints it. The Prometheus form of the same reading is
// PrometheusExposition's.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <utility>
#include <vector>

struct GatewayStatistics {
  struct Trunk {
    std::string path;  // "service/identity"
    bool registered;
  };

  // (method, response code) -> requests answered so.
  std::map<std::pair<std::string, uint16_t>, uint64_t> answers;
  // Digest responses with a wrong password, each answered 403.
  uint64_t failedAuthentications = 0;
  // Contacts this gateway holds registered now.
  uint64_t bindings = 0;
  // Bindings let go because a change removed their identity.
  uint64_t bindingsDropped = 0;
  // Changes the binding store's database refused (each dropped), and
  // changes dropped from its full queue while it was away.
  uint64_t storeRowsRefused = 0;
  uint64_t storeChangesDropped = 0;
  // The library's process-wide count of registered contacts.
  int64_t registeredContacts = 0;
  std::vector<Trunk> trunks;
  // Relayed calls (--calls relay): in progress now, answered since the
  // start, and failed by the final code the caller got, once the gateway
  // had placed them (a call refused before any branch, 480 or 403, shows
  // in answers only). Their set-up
  // times (INVITE to the 2xx sent back) as a histogram: callSetUpBuckets[i]
  // counts the calls within callSetUpBoundsSeconds[i] and above the bound
  // before; the last counts the rest.
  bool callsRelayed = false;
  uint64_t callsActive = 0;
  uint64_t callsSetUp = 0;
  std::map<uint16_t, uint64_t> callsFailed;
  std::vector<double> callSetUpBoundsSeconds;
  std::vector<uint64_t> callSetUpBuckets;
  double callSetUpSeconds = 0;
  // Message-waiting subscriptions by state (MessageWaiting::countByState),
  // and the NOTIFYs sent on to phones.
  std::map<std::string, uint64_t> mwiSubscriptions;
  uint64_t mwiNotifiesRelayed = 0;
  double cpuSeconds = 0;
  double librarySeconds = 0;

  std::string text() const;
};
