#include "LS_CElement.h"

#include "LS_Debug.h"
#include "LockedPtr.h"

LS_CElement::~LS_CElement() {
  LS_DEBUG("LS_CElement(%p)::~LS_CElement()", logAddress());
  LS_CElement::setBase(nullptr);
}

void LS_CElement::addElementObserver(LS_IElementObserver* observer, unsigned int priority) {
  LS_DEBUG("LS_CElement(%p)::addElementObserver(%p)", logAddress(), LS_ptr(observer));
  m_observers.addObserver(observer, priority);
}

void LS_CElement::removeElementObserver(LS_IElementObserver* observer) {
  LS_DEBUG("LS_CElement(%p)::removeElementObserver(%p)", logAddress(), LS_ptr(observer));
  m_observers.removeObserver(observer);
}

void LS_CElement::notifyChange() {
  LS_DEBUG("LS_CElement(%p)::notifyChange()\n", logAddress());
  if (!m_observers.isEmpty())
    m_observers.broadcastEvent(ObserverEvent<LS_IElement>(this), &LS_IElementObserver::onChange);
}

void LS_CElement::notifyDestroying() {
  LS_DEBUG("LS_CElement(%p)::notifyDestroying()\n", logAddress());
  m_observers.broadcastEvent(ObserverEvent<LS_IElement>(this), &LS_IElementObserver::onDestroying);
}

XCode LS_CElement::getBase(RefPtr<LS_IElement>& base) const {
  base = RefPtr<LS_IElement>(baseElement());
  return base ? XCode::success() : XCode::failure();
}

void LS_CElement::setBase(LS_IElement* newBase) {
  LS_DEBUG("LS_CElement(%p)::setBase(%p)\n", logAddress(), LS_ptr(newBase));
  if (newBase == baseElement())
    return;
  if (baseElement())
    LockedPtr<LS_IElement>(baseElement())->removeElementObserver(this);
  // The old base keeps the reference this element held until it has been
  // let go of completely.
  RefPtr<LS_IElement> const oldBase = adoptRef(baseElement());
  if (newBase)
    newBase->addRef();
  m_baseAndDynamic = reinterpret_cast<std::uintptr_t>(newBase) | (m_baseAndDynamic & kDynamic);
  if (newBase)
    LockedPtr<LS_IElement>(newBase)->addElementObserver(this, 0);
}

void LS_CElement::onChange(ObserverEvent<LS_IElement>& event) {
  LS_DEBUG("LS_CElement(%p)::onChange()\n", logAddress());
  if (event.getSubject() == baseElement())
    notifyChange();
}

void LS_CElement::onDestroying(ObserverEvent<LS_IElement>& event) {
  LS_DEBUG("LS_CElement(%p)::onDestroying()\n", logAddress());
  if (event.getSubject() == baseElement())
    setBase(nullptr);
}
