#include "CObject.h"

UUID const& IID_Unknown() {
  static UUID const id("00000000-0000-0000-c000-000000000046", "IUnknown");
  return id;
}

UUID const& CID_Unknown() {
  static UUID const id;
  return id;
}

unsigned int CObject::addRef() {
  return m_refCount.fetch_add(1, std::memory_order_relaxed) + 1;
}

unsigned int CObject::release() {
  unsigned int const remaining = m_refCount.fetch_sub(1, std::memory_order_acq_rel) - 1;
  if (remaining == 0)
    delete this;
  return remaining;
}

void CObject::protectedRelease() {
  release();
}

XCode CObject::queryInterface(UUID const& iid, void** object) {
  if (iid == IID_Unknown()) {
    if (object) {
      *object = static_cast<IUnknown*>(this);
      addRef();
    }
    return XCode::success();
  }
  if (object)
    *object = nullptr;
  return XCode::failure();
}
