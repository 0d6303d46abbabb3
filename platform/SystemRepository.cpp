#include "SystemRepository.h"

#include <mutex>
#include <utility>

#include "RefPtr.h"

namespace {

struct Installed {
  std::mutex mutex;
  RefPtr<IDriverRepository> repository;
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
  Installed& state = installed();
  std::lock_guard<std::mutex> guard(state.mutex);
  return state.repository.get();
}

void SET_DRIVER_REPOSITORY(IDriverRepository* repository) {
  RefPtr<IDriverRepository> replaced(repository);
  Installed& state = installed();
  {
    std::lock_guard<std::mutex> guard(state.mutex);
    std::swap(replaced, state.repository);
  }
  // The previous repository is released here, outside the mutex, since its
  // destruction releases drivers that may look drivers up.
}

}  // namespace SYSTEM
