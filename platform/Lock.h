// Lock: an object's lock, re-entrant so that a caller holding it may call
// back into the same object. Objects borrow their lock; most objects of the
// system have none (a null Lock*), and LockedPtr then locks nothing.
#pragma once

#include "Export.h"

#include <mutex>

class LS_EXPORT Lock {
 public:
  void lock() { m_mutex.lock(); }
  void unlock() { m_mutex.unlock(); }

 private:
  std::recursive_mutex m_mutex;
};
