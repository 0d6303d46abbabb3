// IUnknown: the root of every interface of the object model.
//
// Objects are reference counted (see CObject); queryInterface() hands out an
// interface with a reference added, or stores null and fails. Interfaces are
// released, never deleted through an interface pointer.
#pragma once

#include "Export.h"

#include "Lock.h"
#include "RefPtr.h"
#include "UUID.h"
#include "XCode.h"

class IUnknown;

// Identifier of IUnknown, and the class identifier that names no class.
LS_EXPORT UUID const& IID_Unknown();
LS_EXPORT UUID const& CID_Unknown();

// Runs call(T::IID(), &raw) and lets out adopt whatever the callee stored in
// raw: the callee hands an interface out with a reference already added, or
// stores null. out is emptied first. Returns the callee's result.
template <class T, class Call>
XCode adoptInterface(RefPtr<T>& out, Call&& call) {
  out = nullptr;
  void* raw = nullptr;
  XCode const result = call(T::IID(), &raw);
  out = adoptRef(static_cast<T*>(raw));
  return result;
}

class LS_EXPORT IUnknown {
 public:
  static UUID const& IID() { return IID_Unknown(); }

  virtual unsigned int addRef() = 0;
  virtual unsigned int release() = 0;
  // Release on behalf of a ProtectedPtr.
  virtual void protectedRelease() = 0;
  // The object's lock; null when the object has none.
  virtual Lock* getLock() const = 0;
  // On success *object receives the interface iid with a reference added;
  // on failure *object is set to null (when object is not null).
  virtual XCode queryInterface(UUID const& iid, void** object) = 0;

  // Typed queryInterface: out receives interface T or null.
  template <class T>
  XCode queryIf(RefPtr<T>& out) {
    return adoptInterface(out, [this](UUID const& iid, void** raw) { return queryInterface(iid, raw); });
  }

 protected:
  ~IUnknown() = default;
};
