// CObject: the counted object at the root of every implementation class.
//
// The count starts at 1 (the creator's reference, adopted by one RefPtr) and
// changes atomically, so references may be taken and dropped on any thread;
// the object deletes itself when the count reaches 0. The lock is borrowed:
// it must outlive the object, and null means the object is not locked.
// CObject answers queryInterface for IUnknown only; CInherit adds the rest.
#pragma once

#include "Export.h"

#include <atomic>

#include "IUnknown.h"

class LS_EXPORT CObject : public IUnknown {
 public:
  explicit CObject(Lock* lock = nullptr) : m_lock(lock) {}
  virtual ~CObject() = default;
  CObject(CObject const&) = delete;
  CObject& operator=(CObject const&) = delete;

  unsigned int addRef() override;
  unsigned int release() override;
  // The stand-in has no deferred release: this is release().
  void protectedRelease() override;
  Lock* getLock() const override { return m_lock; }
  XCode queryInterface(UUID const& iid, void** object) override;

 private:
  std::atomic<unsigned int> m_refCount{1};
  Lock* m_lock;
};
