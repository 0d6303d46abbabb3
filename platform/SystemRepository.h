// The process-wide driver repository: the one a host installs and every
// component of the process looks drivers up in. The repository itself
// belongs to IDriverRepository and CDriverRepository.
//
// The installed repository is kept with a counted reference until it is
// replaced or removed. DRIVER_REPOSITORY() returns a borrowed pointer:
// callers that keep it take a reference of their own, and the host installs
// the repository before, and removes it after, anything can look drivers up.
// Reading it takes no lock, since every lookup that is given no master reads
// it; installing is serialised.
#pragma once

#include "Export.h"

#include "IDriverRepository.h"

namespace SYSTEM {

// The installed repository, or null when none is.
LS_EXPORT IDriverRepository* DRIVER_REPOSITORY();
// Installs repository in place of the current one, which is released; null
// removes it.
LS_EXPORT void SET_DRIVER_REPOSITORY(IDriverRepository* repository);

}  // namespace SYSTEM
