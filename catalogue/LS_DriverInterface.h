// getDriverInterface<T>: interface T of the driver that a repository knows
// under a driver name. The two masters are found this way, by the lookups
// and by dumps that need a master; which name to ask for belongs to the
// caller (LS_masterDriverName).
#pragma once

#include "IDriverRepository.h"
#include "LockedPtr.h"
#include "RefPtr.h"
#include "String.h"
#include "XCode.h"

// out is emptied first, and adopts the reference the repository hands out
// only on success. Returns the repository's result unchanged.
template <class T>
XCode getDriverInterface(RefPtr<IDriverRepository>& repository, String const& driverName, RefPtr<T>& out) {
  out = nullptr;
  void* raw = nullptr;
  XCode const result = LockedPtr<IDriverRepository>(repository)->getDriverIf(driverName, T::IID(), &raw);
  if (result.isSuccess())
    out = adoptRef(static_cast<T*>(raw));
  return result;
}
