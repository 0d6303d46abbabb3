// CInherit<Self, Base, Interfaces...>: builds an implementation class from a
// base class (CObject or another CInherit) and the interfaces it adds.
//
// It supplies the one final implementation of the IUnknown operations for
// all of Self's interface subobjects: reference counting and the lock come
// from Base, and queryInterface answers each of Interfaces (by its IID())
// before asking Base, so IUnknown always yields CObject's subobject and one
// object has one identity.
#pragma once

#include "CObject.h"

template <class Self, class Base, class... Interfaces>
class CInherit : public Base, public Interfaces... {
 public:
  using Base::Base;

  unsigned int addRef() override { return Base::addRef(); }
  unsigned int release() override { return Base::release(); }
  void protectedRelease() override { Base::protectedRelease(); }
  Lock* getLock() const override { return Base::getLock(); }

  XCode queryInterface(UUID const& iid, void** object) override {
    void* found = nullptr;
    bool const answered = ((iid == Interfaces::IID() && (found = asInterface<Interfaces>(), true)) || ...);
    if (!answered)
      return Base::queryInterface(iid, object);
    if (object) {
      *object = found;
      addRef();
    }
    return XCode::success();
  }

  // The typed query of IUnknown, reachable without naming one of the many
  // IUnknown subobjects.
  template <class T>
  XCode queryIf(RefPtr<T>& out) {
    return static_cast<CObject*>(this)->queryIf(out);
  }

 private:
  template <class Interface>
  void* asInterface() {
    return static_cast<Interface*>(static_cast<Self*>(this));
  }
};
