// RatioReporter: the console report, followed by each listed benchmark's cost
// as a ratio to a baseline measured in the same run. Runs that report the
// items they processed are compared per item, so that runs over different
// sizes compare; others by their time per iteration.
#pragma once

#include <benchmark/benchmark.h>

#include <cstdio>
#include <map>
#include <string>
#include <utility>
#include <vector>

class RatioReporter : public benchmark::ConsoleReporter {
 public:
  struct Ratio {
    std::string measured;
    std::string baseline;
  };

  explicit RatioReporter(std::vector<Ratio> ratios) : m_ratios(std::move(ratios)) {}

  void ReportRuns(std::vector<Run> const& runs) override {
    for (Run const& run : runs)
      m_costs[run.benchmark_name()] = costOf(run);
    ConsoleReporter::ReportRuns(runs);
  }

  void Finalize() override {
    ConsoleReporter::Finalize();
    for (Ratio const& ratio : m_ratios) {
      auto const measured = m_costs.find(ratio.measured);
      auto const baseline = m_costs.find(ratio.baseline);
      if (measured == m_costs.end() || baseline == m_costs.end() || baseline->second <= 0)
        continue;
      std::printf("%s / %s = %.2f\n", ratio.measured.c_str(), ratio.baseline.c_str(),
                  measured->second / baseline->second);
    }
  }

 private:
  static double costOf(Run const& run) {
    auto const items = run.counters.find("items_per_second");
    if (items != run.counters.end() && items->second.value > 0)
      return 1.0 / items->second.value;
    return run.GetAdjustedRealTime();
  }

  std::vector<Ratio> m_ratios;
  std::map<std::string, double> m_costs;
};
