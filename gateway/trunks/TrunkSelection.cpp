#include "trunks/TrunkSelection.h"

#include <map>

namespace TrunkSelection {

std::vector<bool> select(std::vector<Candidate> const& candidates) {
  // The best priority of each account's trunks that are wanted and have not
  // failed: a trunk registers when its own is no worse.
  std::map<std::string, uint32_t> bestWorking;
  for (Candidate const& candidate : candidates) {
    if (!candidate.wanted || candidate.failed)
      continue;
    auto const found = bestWorking.emplace(candidate.account, candidate.priority);
    if (!found.second && candidate.priority < found.first->second)
      found.first->second = candidate.priority;
  }
  std::vector<bool> chosen;
  chosen.reserve(candidates.size());
  for (Candidate const& candidate : candidates) {
    auto const best = bestWorking.find(candidate.account);
    chosen.push_back(candidate.wanted && (best == bestWorking.end() || candidate.priority <= best->second));
  }
  return chosen;
}

}  // namespace TrunkSelection
