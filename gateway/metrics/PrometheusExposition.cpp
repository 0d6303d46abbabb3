#include "metrics/PrometheusExposition.h"

#include <cstdio>

namespace PrometheusExposition {

namespace {

void family(std::string& out, char const* name, char const* type, char const* help) {
  out += std::string("# HELP location_gateway_") + name + " " + help + "\n";
  out += std::string("# TYPE location_gateway_") + name + " " + type + "\n";
}

void sample(std::string& out, char const* name, std::string const& labels, double value) {
  char number[64];
  std::snprintf(number, sizeof number, "%.9g", value);
  out += std::string("location_gateway_") + name + labels + " " + number + "\n";
}

// A label value with \, " and line feeds escaped as the format asks.
std::string labelValue(std::string const& text) {
  std::string escaped;
  for (char c : text) {
    if (c == '\\' || c == '"')
      escaped += '\\';
    if (c == '\n') {
      escaped += "\\n";
      continue;
    }
    escaped += c;
  }
  return escaped;
}

}  // namespace

std::string render(GatewayStatistics const& statistics) {
  std::string out;
  family(out, "requests_total", "counter", "SIP requests answered, by method and response code.");
  for (auto const& entry : statistics.answers)
    sample(out, "requests_total",
           "{method=\"" + labelValue(entry.first.first) + "\",code=\"" + std::to_string(entry.first.second) +
               "\"}",
           static_cast<double>(entry.second));
  family(out, "failed_authentications_total", "counter", "Digest responses refused for a wrong password.");
  sample(out, "failed_authentications_total", "", static_cast<double>(statistics.failedAuthentications));
  family(out, "bindings", "gauge", "Contacts registered with this gateway.");
  sample(out, "bindings", "", static_cast<double>(statistics.bindings));
  family(out, "bindings_dropped_total", "counter",
         "Bindings dropped because a change removed their identity.");
  sample(out, "bindings_dropped_total", "", static_cast<double>(statistics.bindingsDropped));
  family(out, "store_rows_refused_total", "counter",
         "Changes the binding store's database refused, each dropped and logged.");
  sample(out, "store_rows_refused_total", "", static_cast<double>(statistics.storeRowsRefused));
  family(out, "store_changes_dropped_total", "counter",
         "Changes dropped from the binding store's full queue while it was away.");
  sample(out, "store_changes_dropped_total", "", static_cast<double>(statistics.storeChangesDropped));
  family(out, "registered_contacts", "gauge",
         "The location library's process-wide count of registered contacts.");
  sample(out, "registered_contacts", "", static_cast<double>(statistics.registeredContacts));
  size_t registered = 0;
  for (GatewayStatistics::Trunk const& trunk : statistics.trunks)
    registered += trunk.registered;
  family(out, "trunks", "gauge", "Trunks the gateway registers with a registrar.");
  sample(out, "trunks", "", static_cast<double>(statistics.trunks.size()));
  family(out, "trunks_registered", "gauge", "Trunks registered now.");
  sample(out, "trunks_registered", "", static_cast<double>(registered));
  if (statistics.callsRelayed) {
    family(out, "calls_active", "gauge", "Calls relayed now.");
    sample(out, "calls_active", "", static_cast<double>(statistics.callsActive));
    family(out, "calls_set_up_total", "counter", "Calls answered and relayed to their caller.");
    sample(out, "calls_set_up_total", "", static_cast<double>(statistics.callsSetUp));
    family(out, "calls_failed_total", "counter", "Calls that failed, by the final code their caller got.");
    for (auto const& entry : statistics.callsFailed)
      sample(out, "calls_failed_total", "{code=\"" + std::to_string(entry.first) + "\"}",
             static_cast<double>(entry.second));
    family(out, "call_setup_seconds", "histogram", "Time from a call's INVITE to the answer sent back.");
    uint64_t cumulative = 0;
    for (size_t i = 0; i < statistics.callSetUpBuckets.size(); ++i) {
      cumulative += statistics.callSetUpBuckets[i];
      char bound[32];
      if (i < statistics.callSetUpBoundsSeconds.size())
        std::snprintf(bound, sizeof bound, "%g", statistics.callSetUpBoundsSeconds[i]);
      else
        std::snprintf(bound, sizeof bound, "+Inf");
      sample(out, "call_setup_seconds_bucket", std::string("{le=\"") + bound + "\"}",
             static_cast<double>(cumulative));
    }
    sample(out, "call_setup_seconds_sum", "", statistics.callSetUpSeconds);
    sample(out, "call_setup_seconds_count", "", static_cast<double>(cumulative));
  }
  family(out, "mwi_subscriptions", "gauge", "Message-waiting subscriptions, by state.");
  for (auto const& entry : statistics.mwiSubscriptions)
    sample(out, "mwi_subscriptions", "{state=\"" + entry.first + "\"}", static_cast<double>(entry.second));
  family(out, "mwi_notifies_relayed_total", "counter", "Message-waiting NOTIFYs sent on to phones.");
  sample(out, "mwi_notifies_relayed_total", "", static_cast<double>(statistics.mwiNotifiesRelayed));
  family(out, "cpu_seconds_total", "counter", "CPU time of the gateway's event loop.");
  sample(out, "cpu_seconds_total", "", statistics.cpuSeconds);
  family(out, "library_cpu_seconds_total", "counter", "CPU time spent inside the location library's calls.");
  sample(out, "library_cpu_seconds_total", "", statistics.librarySeconds);
  return out;
}

}  // namespace PrometheusExposition
