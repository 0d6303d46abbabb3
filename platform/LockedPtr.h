// LockedPtr<T>: holds an object's lock for the lifetime of the LockedPtr,
// normally one call: LockedPtr<T>(object)->operation(). An object whose
// getLock() yields null is called without locking. Holds no reference: the
// caller keeps the object alive.
#pragma once

#include "Lock.h"
#include "RefPtr.h"

template <class T>
class LockedPtr {
 public:
  explicit LockedPtr(T* object) : m_object(object), m_lock(object ? object->getLock() : nullptr) {
    if (m_lock)
      m_lock->lock();
  }
  explicit LockedPtr(RefPtr<T> const& object) : LockedPtr(object.get()) {}
  ~LockedPtr() {
    if (m_lock)
      m_lock->unlock();
  }
  LockedPtr(LockedPtr const&) = delete;
  LockedPtr& operator=(LockedPtr const&) = delete;

  T* operator->() const { return m_object; }
  T* get() const { return m_object; }

 private:
  T* m_object;
  Lock* m_lock;
};
