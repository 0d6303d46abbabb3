#include "SystemRepository.h"

#include <atomic>
#include <mutex>
#include <utility>

#include "RefPtr.h"

namespace {

// The installed repository's reference is owned by `owner`, changed under
// the mutex; `current` mirrors it for readers, who only load it: every
// lookup that the SIP stack makes without a master reads it, and a mutex
// there cost as much as the rest of finding the master.
struct Installed {
  std::mutex mutex;
  RefPtr<IDriverRepository> owner;
  std::atomic<IDriverRepository*> current{nullptr};
};

Installed& installed() {
  // Never destroyed: a repository still installed at process exit must not
  // be released after the drivers' code has been unloaded.
  static Installed* const instance = new Installed;
  return *instance;
}

}  // namespace

namespace SYSTEM {

IDriverRepository* DRIVER_REPOSITORY() {
  return installed().current.load(std::memory_order_acquire);
}

void SET_DRIVER_REPOSITORY(IDriverRepository* repository) {
  RefPtr<IDriverRepository> replaced(repository);
  Installed& state = installed();
  {
    std::lock_guard<std::mutex> guard(state.mutex);
    std::swap(replaced, state.owner);
    state.current.store(repository, std::memory_order_release);
  }
  // The previous repository is released here, outside the mutex, since its
  // destruction releases drivers that may look drivers up.
}

}  // namespace SYSTEM
