// AnswerCounters: how many requests the gateway answered, by method and
// response code, since it started; read by the statistics question and by
// /metrics. A method the gateway does not know is counted as "other", so
// that no peer can make the table (and the metrics' label sets) grow by
// inventing methods. Owned by the request log; libre's thread only.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <utility>

#include "sip/Libre.h"

class AnswerCounters {
 public:
  void count(pl const& method, uint16_t code);

  // (method, code) -> answers, in method then code order.
  std::map<std::pair<std::string, uint16_t>, uint64_t> const& counts() const { return m_counts; }

 private:
  std::map<std::pair<std::string, uint16_t>, uint64_t> m_counts;
};
