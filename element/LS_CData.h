// LS_CData<T>: one configuration value of a container, stored under a fixed
// name, and the free templates through which owning classes read and write
// such values.
//
// A data value either holds a local value or reads through to its base, the
// value of the same name in the base container, and so on up the chain.
// Every change it shows (a new local value, a reset, a new base or a change
// of the base while it has no local value) is announced with notifyChange();
// a local value hides the base and stops the propagation.
//
// Invariant the templates rely on: an owning class stores each name with
// exactly one T, in every container of a chain, so an element found under a
// name is taken as LS_CData<T> without checking.
//
// Ownership: the element owns its local value alone. Threading: no lock of
// its own; the templates hold the element's lock around get() and set(),
// and callers hold the container's lock. A pointer handed out by the pointer
// templates stays valid while the container stays locked and the element
// keeps its value. Values changed in place through such a pointer are
// announced by the owner with the container's changeElement(name).
#pragma once

#include <memory>

#include "LS_CDataBase.h"
#include "LS_Debug.h"
#include "LS_IContainer.h"
#include "LS_TestExpression.h"
#include "LockedPtr.h"

template <class T>
class LS_CData : public LS_CDataBase {
 public:
  LS_CData() { LS_DEBUG("LS_CData(%p)::LS_CData()\n", logAddress()); }
  explicit LS_CData(T const& value) : m_value(std::make_unique<T>(value)) {
    LS_DEBUG("LS_CData(%p)::LS_CData(data)\n", logAddress());
  }
  ~LS_CData() override { LS_DEBUG("LS_CData(%p)::~LS_CData()\n", logAddress()); }

  // The value this element shows: its own, else the first one up the chain
  // of bases; null when there is none.
  T* get() {
    if (m_value) {
      LS_DEBUG("LS_CData(%p)::get() -> local value\n", logAddress());
      return m_value.get();
    }
    LS_DEBUG("LS_CData(%p)::get() -> base value\n", logAddress());
    LS_IElement* const base = baseElement();
    return base ? static_cast<LS_CData*>(base)->get() : nullptr;
  }

  // Writing the value already held announces nothing.
  void set(T const& value) {
    if (m_value && *m_value == value)
      return;
    if (m_value) {
      LS_DEBUG("LS_CData(%p)::set() -> overwrite local\n", logAddress());
      *m_value = value;
    } else {
      LS_DEBUG("LS_CData(%p)::get() -> create local\n", logAddress());
      m_value = std::make_unique<T>(value);
    }
    notifyChange();
  }

  // Drops the local value; announced even when there was none.
  void reset() override {
    LS_DEBUG("LS_CData(%p)::reset()\n", logAddress());
    m_value.reset();
    notifyChange();
  }

  void setBase(LS_IElement* newBase) override {
    LS_DEBUG("LS_CData(%p)::setBase(%p)\n", logAddress(), LS_ptr(newBase));
    if (newBase == baseElement())
      return;
    LS_CElement::setBase(newBase);
    if (!m_value)
      notifyChange();
  }

  void onChange(ObserverEvent<LS_IElement>&) override {
    if (m_value) {
      LS_DEBUG("LS_CData(%p)::onChange() -> local data present\n", logAddress());
      return;
    }
    LS_DEBUG("LS_CData(%p)::onChange() -> no local data\n", logAddress());
    notifyChange();
  }

  XCode create(RefPtr<LS_IElement>& element) override {
    element = adoptRef(static_cast<LS_IElement*>(new LS_CData));
    LS_DEBUG("LS_CData(%p)::create() -> %p\n", logAddress(), LS_ptr(element.get()));
    return testExpression(element);
  }

 private:
  std::unique_ptr<T> m_value;  // null: read through to the base
};

// The element of a container taken as data value of type T (see the
// invariant above).
template <class T>
LS_CData<T>* LS_asData(RefPtr<LS_IElement> const& element) {
  return static_cast<LS_CData<T>*>(element.get());
}

// Copies the value that name shows under strategy into value; on failure
// value is left as it was.
template <class T>
XCode LS_getDataElement(LS_IContainer const* container,
                        String const& name,
                        LS_Strategy::Type strategy,
                        T& value) {
  RefPtr<LS_IElement> element;
  XCode result = container->getElement(name, strategy, element);
  if (result.isFailure())
    return result;
  T const* const shown = LockedPtr<LS_CData<T>>(LS_asData<T>(element))->get();
  result = testExpression(shown);
  if (result.isSuccess())
    value = *shown;
  return result;
}

// As above, with defaultValue in value when the read fails.
template <class T>
T& LS_getDataElement(LS_IContainer const* container,
                     String const& name,
                     LS_Strategy::Type strategy,
                     T& value,
                     T const& defaultValue) {
  if (LS_getDataElement(container, name, strategy, value).isFailure())
    value = defaultValue;
  return value;
}

// Writes the local value of name, creating the element when the container
// holds none of its own (it then replaces a shadow of that name).
template <class T>
T const& LS_setDataElement(LS_IContainer* container, String const& name, T const& value) {
  RefPtr<LS_IElement> element;
  if (container->getElement(name, LS_Strategy::LOCAL_ONLY, element).isSuccess()) {
    LockedPtr<LS_CData<T>>(LS_asData<T>(element))->set(value);
    return value;
  }
  RefPtr<LS_CData<T>> const created = adoptRef(new LS_CData<T>);
  LockedPtr<LS_CData<T>>(created)->set(value);
  container->addElement(name, created.get());
  return value;
}

// Points value at the value that name shows under strategy; null on failure.
template <class T>
XCode LS_getDataElementPointer(LS_IContainer const* container,
                               String const& name,
                               LS_Strategy::Type strategy,
                               T const*& value) {
  value = nullptr;
  RefPtr<LS_IElement> element;
  XCode const result = container->getElement(name, strategy, element);
  if (result.isFailure())
    return result;
  value = LockedPtr<LS_CData<T>>(LS_asData<T>(element))->get();
  return testExpression(value);
}

// The container's own value of name, for changing in place; null on failure.
template <class T>
XCode LS_getDataElementPointer(LS_IContainer* container, String const& name, T*& value) {
  T const* shown = nullptr;
  XCode const result = LS_getDataElementPointer(container, name, LS_Strategy::LOCAL_ONLY, shown);
  value = const_cast<T*>(shown);
  return result;
}

// The container's own value of name, first created from a default T when the
// container holds no element of that name itself.
template <class T>
XCode LS_createDataElementPointer(LS_IContainer* container, String const& name, T*& value) {
  value = nullptr;
  RefPtr<LS_IElement> element;
  if (container->getElement(name, LS_Strategy::LOCAL_ONLY, element).isFailure()) {
    RefPtr<LS_CData<T>> const created = adoptRef(new LS_CData<T>(T()));
    container->addElement(name, created.get());
    element = created;
  }
  value = LockedPtr<LS_CData<T>>(LS_asData<T>(element))->get();
  return testExpression(value);
}
