// TrunkSelection: which of the trunks of one account register now, by
// their outbound-registration faces' priority. What a trunk is and how it
// registers is TrunkRegistrations'; this only decides.
//
// Decisions, with their reasons:
// - An account is the identity's name: the same name as identities in
//   different location services, each with its own registrar, is one
//   account at several carriers (or several registrars of one carrier).
//   An identity has one registrar (and its TLS counterpart) in this model,
//   so several registrars for one account can only be several identities.
// - The lowest priority value goes first. A trunk registers unless a trunk
//   of its account with a lower value is wanted and has not failed: so the
//   next one registers only once every better one has failed, and trunks
//   of equal priority register together (the face's default gives every
//   trunk the same priority, so that a configuration that names none
//   registers every trunk, as before priorities were followed).
// - A better trunk that failed keeps trying at its retry timeout while a
//   worse one stands in; the worse one unregisters as soon as the better one
//   registers again. The carrier thus sees the better trunk back within one
//   retry timeout of its recovery, with no probing of its own, and for that
//   moment both are registered rather than neither.
// - A trunk that is not wanted (back-to-back with no phone registered)
//   neither registers nor holds back the worse ones.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace TrunkSelection {

struct Candidate {
  std::string account;
  uint32_t priority;
  // Its registration mode lets it register now.
  bool wanted;
  // Its last attempt failed, and it waits for its retry.
  bool failed;
};

// For each candidate, in order, whether it registers now.
std::vector<bool> select(std::vector<Candidate> const& candidates);

}  // namespace TrunkSelection
