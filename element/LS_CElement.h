// LS_CElement: what every element of the tree has in common: its observers,
// its base link and the dynamic flag.
//
// Ownership: counted; it dies with its last reference. Its owner announces
// its departure beforehand with notifyDestroying(), so that the elements
// based on it let go; the destructor itself tells nobody.
// Base link: the element holds a counted reference to its base and is
// registered (priority 0) among the base's observers while linked.
// Re-entrancy: observers may unregister themselves or others during a
// notification (see ObserverContainer); a base that announces its
// destruction is dropped from inside that broadcast.
// Threading: no lock of its own is taken; callers hold the element's lock.
// create() stays abstract: each concrete class makes an empty instance of
// itself.
#pragma once

#include <cstdint>

#include "CInherit.h"
#include "LS_IElement.h"
#include "ObserverContainer.h"

class LS_CElement : public CInherit<LS_CElement, CObject, LS_IElement>, public LS_IElementObserver {
 public:
  LS_CElement() = default;
  ~LS_CElement() override;

  // LS_IElement
  void addElementObserver(LS_IElementObserver* observer, unsigned int priority) override;
  void removeElementObserver(LS_IElementObserver* observer) override;
  void notifyChange() override;
  void notifyDestroying() override;
  XCode getBase(RefPtr<LS_IElement>& base) const override;
  void setBase(LS_IElement* base) override;
  void reset() override {}
  void setDynamic(bool dynamic) override {
    m_baseAndDynamic = (m_baseAndDynamic & ~kDynamic) | (dynamic ? kDynamic : 0);
  }
  bool isDynamic() const override { return (m_baseAndDynamic & kDynamic) != 0; }

  // LS_IElementObserver: a change of the base is this element's change; a
  // base that goes away is dropped.
  void onChange(ObserverEvent<LS_IElement>& event) override;
  void onDestroying(ObserverEvent<LS_IElement>& event) override;

 protected:
  // The base element, borrowed; for hot read paths that must not count.
  LS_IElement* baseElement() const { return reinterpret_cast<LS_IElement*>(m_baseAndDynamic & ~kDynamic); }
  LS_IElementObserver* asElementObserver() { return this; }
  // The address log lines print for this element: its LS_IElement, the
  // pointer that other elements' lines (setBase, addElement) print for it.
  void const* logAddress() const { return static_cast<LS_IElement const*>(this); }

 private:
  static constexpr std::uintptr_t kDynamic = 1;
  static_assert(alignof(LS_IElement) > 1, "the low bit of an element's address is free");

  ObserverContainer<LS_IElement, LS_IElementObserver> m_observers;
  // The base element, holding a counted reference, with the dynamic flag in
  // the low bit of its address: a bool of its own padded every element by a
  // word on 32-bit targets, and a derived identity holds some thirty.
  std::uintptr_t m_baseAndDynamic = 0;
};
