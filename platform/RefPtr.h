// RefPtr<T>: owns one counted reference to an object with addRef()/release().
//
// A newly made object carries a count of 1; adoptRef() hands that reference
// to exactly one RefPtr. Constructing or assigning from a raw pointer adds a
// reference of its own. Locking and interface queries do not belong here.
#pragma once

#include <cstddef>
#include <utility>

template <class T>
class RefPtr {
 public:
  RefPtr() = default;
  RefPtr(std::nullptr_t) {}  // NOLINT: implicit, like a null pointer
  // Adds a reference; the caller keeps its own.
  RefPtr(T* object) : m_object(object) {  // NOLINT: implicit, like a pointer
    if (m_object)
      m_object->addRef();
  }
  RefPtr(RefPtr const& other) : RefPtr(other.m_object) {}
  RefPtr(RefPtr&& other) noexcept : m_object(other.leakRef()) {}
  template <class U>
  RefPtr(RefPtr<U> const& other) : RefPtr(other.get()) {}  // NOLINT: upcast
  ~RefPtr() {
    if (m_object)
      m_object->release();
  }

  RefPtr& operator=(RefPtr other) noexcept {
    std::swap(m_object, other.m_object);
    return *this;
  }

  // Takes over the reference that object already carries.
  static RefPtr adopt(T* object) {
    RefPtr adopted;
    adopted.m_object = object;
    return adopted;
  }

  // Gives up ownership without releasing: the caller now owns the reference.
  T* leakRef() { return std::exchange(m_object, nullptr); }

  T* get() const { return m_object; }
  T* operator->() const { return m_object; }
  T& operator*() const { return *m_object; }
  explicit operator bool() const { return m_object != nullptr; }

  bool operator==(RefPtr const& other) const { return m_object == other.m_object; }
  bool operator!=(RefPtr const& other) const { return m_object != other.m_object; }

 private:
  T* m_object = nullptr;
};

// Adopts the reference of a newly made object (count 1) or of an object that
// a callee handed out with a reference already added.
template <class T>
RefPtr<T> adoptRef(T* object) {
  return RefPtr<T>::adopt(object);
}
