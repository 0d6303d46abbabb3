#include "LS_CContainer.h"

#include "LS_Debug.h"
#include "LockedPtr.h"

namespace {


void appendNames(LS_ElementTable const& table, Vector<String>& names) {
  for (auto const& entry : table)
    names.add(entry.key());
}

// The child the base container shows under name (local or its own shadow).
RefPtr<LS_IElement> childOf(RefPtr<LS_IContainer> const& base, String const& name) {
  RefPtr<LS_IElement> child;
  LockedPtr<LS_IContainer>(base)->getElement(name, LS_Strategy::LOCAL_OR_BASE, child);
  return child;
}

}  // namespace

LS_CContainer::~LS_CContainer() {
  LS_DEBUG("LS_CContainer(%p)::~LS_CContainer()", logAddress());
  RefPtr<LS_IContainer> base;
  if (baseElement() && baseElement()->queryIf(base).isSuccess())
    LockedPtr<LS_IContainer>(base)->removeContainerObserver(this);
  for (ElementTable const* table : {&m_localElements, &m_shadowElements}) {
    for (auto const& entry : *table)
      LockedPtr<LS_IElement>(entry.value)->removeElementObserver(asElementObserver());
  }
}

void LS_CContainer::addContainerObserver(LS_IContainerObserver* observer, unsigned int priority) {
  m_containerObservers.addObserver(observer, priority);
}

void LS_CContainer::removeContainerObserver(LS_IContainerObserver* observer) {
  m_containerObservers.removeObserver(observer);
}

bool LS_CContainer::containsElement(String const& name, LS_Strategy::Type strategy) const {
  switch (strategy) {
    case LS_Strategy::LOCAL_ONLY:
      return m_localElements.contains(name);
    case LS_Strategy::BASE_ONLY:
      return m_shadowElements.contains(name);
    case LS_Strategy::LOCAL_OR_BASE:
      return m_localElements.contains(name) || m_shadowElements.contains(name);
  }
  return false;
}

XCode LS_CContainer::getElement(String const& name,
                                LS_Strategy::Type strategy,
                                RefPtr<LS_IElement>& element) const {
  RefPtr<LS_IElement> const* found = nullptr;
  switch (strategy) {
    case LS_Strategy::LOCAL_ONLY:
      found = m_localElements.get(name);
      break;
    case LS_Strategy::BASE_ONLY:
      found = m_shadowElements.get(name);
      break;
    case LS_Strategy::LOCAL_OR_BASE:
      found = m_localElements.get(name);
      if (!found)
        found = m_shadowElements.get(name);
      break;
  }
  if (!found)
    return XCode::failure();
  element = *found;
  return XCode::success();
}

void LS_CContainer::getElements(LS_Strategy::Type strategy, Vector<String>& names) const {
  names.clear();
  if (strategy == LS_Strategy::LOCAL_ONLY || strategy == LS_Strategy::LOCAL_OR_BASE)
    appendNames(m_localElements, names);
  if (strategy == LS_Strategy::BASE_ONLY || strategy == LS_Strategy::LOCAL_OR_BASE)
    appendNames(m_shadowElements, names);
}

void LS_CContainer::addElement(String const& name, LS_IElement* element) {
  LS_DEBUG("LS_CElement(%p)::addElement(%s, %p)\n", logAddress(), name.c_str(), LS_ptr(element));
  RefPtr<LS_IElement> shadow;
  LS_ElementName shared;
  bool const replacesShadow = m_shadowElements.take(name, shadow, &shared);
  if (replacesShadow) {
    // The new child takes the shadow's place in the inheritance chain.
    RefPtr<LS_IElement> inherited;
    if (LockedPtr<LS_IElement>(shadow)->getBase(inherited).isSuccess())
      LockedPtr<LS_IElement>(element)->setBase(inherited.get());
    LockedPtr<LS_IElement>(shadow)->removeElementObserver(asElementObserver());
  }
  m_localElements.add(replacesShadow ? std::move(shared) : LS_ElementName(name), element);
  LockedPtr<LS_IElement>(element)->addElementObserver(asElementObserver(), 0);
  notifyElementAdd(name);
}

void LS_CContainer::removeElement(String const& name) {
  LS_DEBUG("LS_CElement(%p)::removeElement(%s)\n", logAddress(), name.c_str());
  RefPtr<LS_IElement> child;
  LS_ElementName shared;
  if (!m_localElements.take(name, child, &shared))
    return;
  RefPtr<LS_IElement> inherited;
  if (LockedPtr<LS_IElement>(child)->getBase(inherited).isSuccess()) {
    // Still inherited: back to a shadow that reads through to its base. The
    // reset announces the change; nothing is removed.
    m_shadowElements.add(std::move(shared), child.get());
    LockedPtr<LS_IElement>(child)->reset();
    return;
  }
  LockedPtr<LS_IElement>(child)->removeElementObserver(asElementObserver());
  notifyElementRemove(name, child.get());
}

void LS_CContainer::changeElement(String const& name) {
  LS_DEBUG("LS_CElement(%p)::changeElement(%s)\n", logAddress(), name.c_str());
  RefPtr<LS_IElement> child;
  if (getElement(name, LS_Strategy::LOCAL_ONLY, child).isSuccess())
    LockedPtr<LS_IElement>(child)->notifyChange();
}

void LS_CContainer::reset() {
  LS_DEBUG("LS_CElement(%p)::reset()\n", logAddress());
  Vector<String> names;
  getElements(LS_Strategy::LOCAL_ONLY, names);
  for (String const& name : names)
    removeElement(name);
}

void LS_CContainer::setBase(LS_IElement* newBase) {
  LS_DEBUG("LS_CContainer(%p)::setBase(%p)\n", logAddress(), LS_ptr(newBase));
  if (newBase == baseElement())
    return;
  RefPtr<LS_IContainer> oldContainer;
  if (baseElement() && LockedPtr<LS_IElement>(baseElement())->queryIf(oldContainer).isSuccess())
    LockedPtr<LS_IContainer>(oldContainer)->removeContainerObserver(asContainerObserver());
  LS_CElement::setBase(newBase);
  RefPtr<LS_IContainer> newContainer;
  if (newBase && LockedPtr<LS_IElement>(newBase)->queryIf(newContainer).isSuccess()) {
    follow(newContainer);
    return;
  }
  forgetBase();
}

// Joins base and brings every child in line with it: local children and
// shadows re-based, shadows of vanished names destroyed, new names shadowed.
void LS_CContainer::follow(RefPtr<LS_IContainer> const& base) {
  LockedPtr<LS_IContainer>(base)->addContainerObserver(asContainerObserver(), 0);
  Vector<String> baseNames;
  LockedPtr<LS_IContainer>(base)->getElements(LS_Strategy::LOCAL_OR_BASE, baseNames);

  Vector<String> names;
  getElements(LS_Strategy::LOCAL_ONLY, names);
  for (String const& name : names) {
    RefPtr<LS_IElement> const inherited = childOf(base, name);
    if (RefPtr<LS_IElement>* local = m_localElements.get(name))
      LockedPtr<LS_IElement>(*local)->setBase(inherited.get());
  }
  getElements(LS_Strategy::BASE_ONLY, names);
  for (String const& name : names) {
    RefPtr<LS_IElement> const inherited = childOf(base, name);
    RefPtr<LS_IElement>* const shadow = m_shadowElements.get(name);
    if (!shadow)
      continue;
    if (inherited)
      LockedPtr<LS_IElement>(*shadow)->setBase(inherited.get());
    else
      destroyShadowElement(name);
  }
  m_shadowElements.reserve(m_shadowElements.size() + baseNames.size());
  for (String const& name : baseNames) {
    RefPtr<LS_IElement> const inherited = childOf(base, name);
    if (inherited && !m_localElements.contains(name) && !m_shadowElements.contains(name))
      createShadowElement(name, inherited.get(), base.get());
  }
}

// Without a base container nothing is inherited: local children lose their
// bases and every shadow goes.
void LS_CContainer::forgetBase() {
  Vector<String> names;
  getElements(LS_Strategy::LOCAL_ONLY, names);
  for (String const& name : names) {
    if (RefPtr<LS_IElement>* local = m_localElements.get(name))
      LockedPtr<LS_IElement>(*local)->setBase(nullptr);
  }
  getElements(LS_Strategy::BASE_ONLY, names);
  for (String const& name : names)
    destroyShadowElement(name);
}

void LS_CContainer::onChange(ObserverEvent<LS_IElement>& event) {
  // The base tells this container of its own changes as well; what changed
  // in it arrives through the shadows, each under its name. A base is never
  // a child of the container inheriting from it, so nothing in the tables
  // could match: a group's change passes here for every member.
  if (event.getSubject() == baseElement())
    return;
  // Names first: the notifications may change the tables.
  Vector<String> changed;
  for (ElementTable const* table : {&m_localElements, &m_shadowElements}) {
    for (auto const& entry : *table) {
      if (entry.value.get() == event.getSubject())
        changed.add(entry.key());
    }
  }
  for (String const& name : changed)
    notifyElementChange(name);
}

void LS_CContainer::onElementAdd(ObserverEvent<LS_IContainer>& event) {
  auto* const added = dynamic_cast<EvElement*>(&event);
  if (!added || !event.getSubject())
    return;
  RefPtr<LS_IElement> inherited;
  if (LockedPtr<LS_IContainer>(event.getSubject())
          ->getElement(added->name, LS_Strategy::LOCAL_OR_BASE, inherited)
          .isFailure())
    return;
  LS_DEBUG("LS_CElement(%p)::onElementAdd(%s, %p)\n", logAddress(), added->name.c_str(),
           LS_ptr(inherited.get()));
  if (RefPtr<LS_IElement>* local = m_localElements.get(added->name)) {
    LockedPtr<LS_IElement>(*local)->setBase(inherited.get());
    return;
  }
  if (RefPtr<LS_IElement>* shadow = m_shadowElements.get(added->name)) {
    LockedPtr<LS_IElement>(*shadow)->setBase(inherited.get());
    return;
  }
  createShadowElement(added->name, inherited.get(), event.getSubject());
}

void LS_CContainer::onElementRemove(ObserverEvent<LS_IContainer>& event) {
  auto* const removed = dynamic_cast<EvElement*>(&event);
  if (!removed)
    return;
  LS_DEBUG("LS_CElement(%p)::onElementRemove(%s)\n", logAddress(), removed->name.c_str());
  if (RefPtr<LS_IElement>* local = m_localElements.get(removed->name)) {
    LockedPtr<LS_IElement>(*local)->setBase(nullptr);
    return;
  }
  destroyShadowElement(removed->name);
}

void LS_CContainer::onElementChange(ObserverEvent<LS_IContainer>&) {}

void LS_CContainer::notifyElementAdd(String const& name) {
  LS_DEBUG("LS_CElement(%p)::notifyElementAdd(%s)\n", logAddress(), name.c_str());
  onElementAdd(name);
  if (!m_containerObservers.isEmpty())
    m_containerObservers.broadcastEvent(EvElement(this, name), &LS_IContainerObserver::onElementAdd);
  notifyChange();
}

void LS_CContainer::notifyElementRemove(String const& name, LS_IElement* element) {
  LS_DEBUG("LS_CElement(%p)::notifyElementRemove(%s)\n", logAddress(), name.c_str());
  onElementRemove(name);
  if (!m_containerObservers.isEmpty())
    m_containerObservers.broadcastEvent(EvElement(this, name), &LS_IContainerObserver::onElementRemove);
  notifyChange();
  LockedPtr<LS_IElement>(element)->notifyDestroying();
}

void LS_CContainer::notifyElementChange(String const& name) {
  LS_DEBUG("LS_CElement(%p)::notifyElementChange(%s)\n", logAddress(), name.c_str());
  onElementChange(name);
  if (!m_containerObservers.isEmpty())
    m_containerObservers.broadcastEvent(EvElement(this, name), &LS_IContainerObserver::onElementChange);
  notifyChange();
}

void LS_CContainer::onElementAdd(String const&) {}
void LS_CContainer::onElementRemove(String const&) {}
void LS_CContainer::onElementChange(String const&) {}

LS_ElementName LS_CContainer::sharedNameOf(LS_IContainer* base, String const& name) {
  auto const* const container = dynamic_cast<LS_CContainer const*>(base);
  if (!container)
    return LS_ElementName(name);
  for (ElementTable const* table : {&container->m_localElements, &container->m_shadowElements}) {
    if (LS_ElementName const* found = table->nameOf(name))
      return *found;
  }
  return LS_ElementName(name);
}

XCode LS_CContainer::createShadowElement(String const& name, LS_IElement* baseElement, LS_IContainer* base) {
  LS_DEBUG("LS_CElement(%p)::createShadowElement(%s, %p)\n", logAddress(), name.c_str(), LS_ptr(baseElement));
  if (m_shadowElements.contains(name))
    return XCode::failure();
  RefPtr<LS_IElement> shadow;
  XCode const result = LockedPtr<LS_IElement>(baseElement)->create(shadow);
  if (result.isFailure() || !shadow)
    return XCode::failure();
  LockedPtr<LS_IElement>(shadow)->setBase(baseElement);
  m_shadowElements.add(sharedNameOf(base, name), shadow.get());
  LockedPtr<LS_IElement>(shadow)->addElementObserver(asElementObserver(), 0);
  notifyElementAdd(name);
  return XCode::success();
}

void LS_CContainer::destroyShadowElement(String const& name) {
  LS_DEBUG("LS_CElement(%p)::destroyShadowElement(%s)\n", logAddress(), name.c_str());
  RefPtr<LS_IElement> shadow;
  if (!m_shadowElements.take(name, shadow))
    return;
  LockedPtr<LS_IElement>(shadow)->removeElementObserver(asElementObserver());
  notifyElementRemove(name, shadow.get());
}
