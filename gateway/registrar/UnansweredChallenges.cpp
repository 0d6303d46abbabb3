#include "registrar/UnansweredChallenges.h"

UnansweredChallenges::UnansweredChallenges(size_t capacity) : m_entries(capacity != 0 ? capacity : 1) {}

UnansweredChallenges::Entry& UnansweredChallenges::slotOf(uint64_t registration) {
  return m_entries[static_cast<size_t>(registration % m_entries.size())];
}

void UnansweredChallenges::challenged(uint64_t registration, uint32_t cseq) {
  Entry& entry = slotOf(registration);
  entry.registration = registration;
  entry.cseq = cseq;
  entry.occupied = true;
}

void UnansweredChallenges::answered(uint64_t registration) {
  Entry& entry = slotOf(registration);
  if (entry.occupied && entry.registration == registration)
    entry.occupied = false;
}

bool UnansweredChallenges::gaveUp(uint64_t registration, uint32_t cseq) {
  Entry& entry = slotOf(registration);
  if (!entry.occupied || entry.registration != registration || cseq <= entry.cseq)
    return false;
  entry.occupied = false;
  return true;
}
