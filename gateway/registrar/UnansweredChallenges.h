// UnansweredChallenges: the registrations last answered with a challenge
// that offered SHA-256 first and that have sent no credentials since, so
// that the Authenticator can tell an operator about a phone that seems
// unable to read that challenge. Such a phone (one that reads only the
// first WWW-Authenticate and knows only MD5) answers nothing, and later
// starts over with a new REGISTER without credentials; a phone that reads
// the challenge answers it, with credentials, at the next CSeq. A
// registration is the caller's hash of its Call-ID and its source.
//
// Decisions, with their reasons:
// - Fixed size, one entry a slot chosen by the registration's hash, the
//   newest taking the slot: a challenge stays cheap, and traffic that churns
//   the slots can only make a warning go unsaid, never make one up.
// - gaveUp() needs a higher CSeq than the challenged one: the challenged
//   request itself again is a retransmission (its 401 was lost), not a
//   phone giving up. A phone whose 401 was lost in every retransmission and
//   that starts over later looks like one giving up; the warning says
//   "seems" for that reason, and for a phone whose user has no password set.
//
// Not thread-safe; everything runs on libre's thread.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

class UnansweredChallenges {
 public:
  static constexpr size_t kCapacity = 256;

  explicit UnansweredChallenges(size_t capacity);

  // The registration got a challenge offering SHA-256 first at cseq.
  void challenged(uint64_t registration, uint32_t cseq);
  // The registration sent credentials: it reads its challenges.
  void answered(uint64_t registration);
  // A request of the registration without credentials at cseq: whether its
  // last challenge, at a lower CSeq, went unanswered. Forgets it, so that
  // one registration is reported once per challenge.
  bool gaveUp(uint64_t registration, uint32_t cseq);

 private:
  struct Entry {
    uint64_t registration = 0;
    uint32_t cseq = 0;
    bool occupied = false;
  };

  Entry& slotOf(uint64_t registration);

  std::vector<Entry> m_entries;
};
