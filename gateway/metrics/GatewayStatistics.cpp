#include "metrics/GatewayStatistics.h"

#include <cstdio>

std::string GatewayStatistics::text() const {
  std::string text;
  uint64_t total = 0;
  for (auto const& entry : answers)
    total += entry.second;
  text += "requests answered: " + std::to_string(total) + "\n";
  for (auto const& entry : answers)
    text += "  " + entry.first.first + " " + std::to_string(entry.first.second) + ": " +
            std::to_string(entry.second) + "\n";
  text += "failed authentications: " + std::to_string(failedAuthentications) + "\n";
  text += "bindings: " + std::to_string(bindings) +
          ", dropped with their identity: " + std::to_string(bindingsDropped) + "\n";
  text += "store: rows refused " + std::to_string(storeRowsRefused) + ", changes dropped from a full queue " +
          std::to_string(storeChangesDropped) + "\n";
  text += "registered contacts (library): " + std::to_string(registeredContacts) + "\n";
  size_t registered = 0;
  for (Trunk const& trunk : trunks)
    registered += trunk.registered;
  text += "trunks: " + std::to_string(trunks.size()) + ", registered: " + std::to_string(registered) + "\n";
  for (Trunk const& trunk : trunks)
    text += "  " + trunk.path + ": " + (trunk.registered ? "registered" : "not registered") + "\n";
  if (callsRelayed) {
    text +=
        "calls: " + std::to_string(callsActive) + " in progress, " + std::to_string(callsSetUp) + " set up\n";
    for (auto const& entry : callsFailed)
      text += "  failed " + std::to_string(entry.first) + ": " + std::to_string(entry.second) + "\n";
  }
  uint64_t subscriptions = 0;
  std::string states;
  for (auto const& entry : mwiSubscriptions) {
    subscriptions += entry.second;
    if (entry.second != 0)
      states += ", " + entry.first + " " + std::to_string(entry.second);
  }
  text += "message waiting: faces " + std::to_string(subscriptions) + states + ", NOTIFYs relayed " +
          std::to_string(mwiNotifiesRelayed) + "\n";
  char line[128];
  std::snprintf(line, sizeof line, "CPU %.3f s, in the library %.3f s (%.1f%%)\n", cpuSeconds, librarySeconds,
                cpuSeconds > 0 ? 100.0 * librarySeconds / cpuSeconds : 0.0);
  return text + line;
}
