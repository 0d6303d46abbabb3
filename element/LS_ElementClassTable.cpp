#include "LS_ElementClassTable.h"

#include <utility>
#include <vector>

namespace {

std::vector<std::pair<UUID, LS_ElementClassTable::Maker>>& classes() {
  static std::vector<std::pair<UUID, LS_ElementClassTable::Maker>> table;
  return table;
}

}  // namespace

void LS_ElementClassTable::registerClass(UUID const& cid, Maker maker) {
  for (auto& entry : classes()) {
    if (entry.first == cid) {
      entry.second = maker;
      return;
    }
  }
  classes().emplace_back(cid, maker);
}

XCode LS_ElementClassTable::create(UUID const& cid, RefPtr<LS_IElement>& element) {
  element = nullptr;
  for (auto const& entry : classes()) {
    if (entry.first == cid)
      return entry.second(element);
  }
  return XCode::failure();
}
