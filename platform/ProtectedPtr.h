// ProtectedPtr<T>: like RefPtr<T>, but drops its reference through
// protectedRelease(). Events hold their subject this way. In this stand-in
// protectedRelease() is an ordinary release (see CObject).
#pragma once

#include <utility>

template <class T>
class ProtectedPtr {
 public:
  ProtectedPtr() = default;
  // Adds a reference of its own.
  explicit ProtectedPtr(T* object) : m_object(object) {
    if (m_object)
      m_object->addRef();
  }
  ProtectedPtr(ProtectedPtr const& other) : ProtectedPtr(other.m_object) {}
  ProtectedPtr& operator=(ProtectedPtr other) noexcept {
    std::swap(m_object, other.m_object);
    return *this;
  }
  ~ProtectedPtr() {
    if (m_object)
      m_object->protectedRelease();
  }

  T* get() const { return m_object; }
  T* operator->() const { return m_object; }
  explicit operator bool() const { return m_object != nullptr; }

 private:
  T* m_object = nullptr;
};
