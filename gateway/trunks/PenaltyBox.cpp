#include "trunks/PenaltyBox.h"

void PenaltyBox::failed(std::string const& proxy, uint64_t nowMs) {
  m_boxed[proxy] = nowMs + kBoxMs;
}

bool PenaltyBox::isBoxed(std::string const& proxy, uint64_t nowMs) {
  auto const entry = m_boxed.find(proxy);
  if (entry == m_boxed.end())
    return false;
  if (nowMs < entry->second)
    return true;
  m_boxed.erase(entry);
  return false;
}
