// The lines of a diagnostic dump as "level|key|value" texts, so that a test
// asserts every row (level, key, value, in order) with one comparison.
#pragma once

#include <string>
#include <vector>

#include "InfoContainer.h"

using DumpRows = std::vector<std::string>;

inline DumpRows dumpRows(InfoContainer const& info) {
  DumpRows rows;
  for (InfoContainer::Line const& line : info)
    rows.push_back(std::to_string(line.level) + "|" + line.key.str() + "|" + line.value.str());
  return rows;
}
