// LS_CAppendList<T>: an ordered list element that extends its base instead of
// hiding it, and the free templates that find or create one in a container.
//
// Under "localOrBase" the list shows the whole chain: the farthest base's
// own entries first, then each nearer base's, its own entries last, indexed
// from 0 over that concatenation; "baseOnly" shows what the base shows;
// "localOnly" the own entries. Any change up the chain is announced as this
// list's change, whatever its own entries are.
//
// Invariant: every list in a base chain is an LS_CAppendList<T> of the same
// T. The owner edits the own entries through entries() (insert, replace,
// move, clear) and then calls notifyChange() itself; the list does not watch
// its vector. Threading: no lock of its own; callers hold the container's
// lock while they use a list pointer, and bases are read without locking.
#pragma once

#include "LS_CAppendListBase.h"
#include "LS_Debug.h"
#include "LS_IContainer.h"
#include "LS_TestExpression.h"
#include "Vector.h"

template <class T>
class LS_CAppendList : public LS_CAppendListBase {
 public:
  LS_CAppendList() { LS_DEBUG("LS_CAppendList(%p)::LS_CAppendList()\n", logAddress()); }
  ~LS_CAppendList() override { LS_DEBUG("LS_CAppendList(%p)::~LS_CAppendList()\n", logAddress()); }

  unsigned int size(LS_Strategy::Type strategy) const {
    switch (strategy) {
      case LS_Strategy::LOCAL_ONLY:
        return ownCount();
      case LS_Strategy::BASE_ONLY:
        return inheritedCount();
      case LS_Strategy::LOCAL_OR_BASE:
        return ownCount() + inheritedCount();
    }
    return 0;
  }

  // Entry index of the list the strategy shows; null for an index at or past
  // size(strategy) and for an unknown strategy.
  T const* get(LS_Strategy::Type strategy, unsigned int index) const {
    switch (strategy) {
      case LS_Strategy::LOCAL_ONLY:
        return index < ownCount() ? &m_entries[index] : nullptr;
      case LS_Strategy::BASE_ONLY:
        return base() ? base()->entryOfChain(index) : nullptr;
      case LS_Strategy::LOCAL_OR_BASE:
        return entryOfChain(index);
    }
    return nullptr;
  }

  // Removes own entry index; inherited entries cannot be removed here. The
  // change is announced even when nothing was removed.
  void removeAt(unsigned int index) {
    if (index < ownCount())
      m_entries.remove(index);
    notifyChange();
  }

  // The own entries, for the owner's edits (announce them with notifyChange).
  Vector<T>& entries() { return m_entries; }

  void reset() override {
    LS_DEBUG("LS_CAppendList(%p)::reset()\n", logAddress());
    m_entries.clear();
    notifyChange();
  }

  void setBase(LS_IElement* newBase) override {
    LS_DEBUG("LS_CAppendList(%p)::setBase(%p)\n", logAddress(), LS_ptr(newBase));
    if (newBase == baseElement())
      return;
    LS_CElement::setBase(newBase);
    notifyChange();
  }

  void onChange(ObserverEvent<LS_IElement>&) override {
    LS_DEBUG("LS_CAppendList(%p)::onChange()\n", logAddress());
    notifyChange();
  }

  XCode create(RefPtr<LS_IElement>& element) override {
    element = adoptRef(static_cast<LS_IElement*>(new LS_CAppendList));
    LS_DEBUG("LS_CAppendList(%p)::create() -> %p\n", logAddress(), LS_ptr(element.get()));
    return testExpression(element);
  }

 private:
  LS_CAppendList const* base() const { return static_cast<LS_CAppendList const*>(baseElement()); }
  unsigned int ownCount() const { return static_cast<unsigned int>(m_entries.size()); }
  // Entries that the bases contribute in front of the own ones.
  unsigned int inheritedCount() const {
    unsigned int count = 0;
    for (LS_CAppendList const* list = base(); list; list = list->base())
      count += list->ownCount();
    return count;
  }
  // Entry index of the concatenation that starts at the top of this chain.
  T const* entryOfChain(unsigned int index) const {
    for (LS_CAppendList const* list = this; list; list = list->base()) {
      unsigned int const above = list->inheritedCount();
      if (above <= index)
        return index - above < list->ownCount() ? &list->m_entries[index - above] : nullptr;
    }
    return nullptr;
  }

  Vector<T> m_entries;
};

// The list under name, as strategy finds it; null and failure when absent.
template <class T>
XCode LS_getAppendListElement(LS_IContainer const* container,
                              String const& name,
                              LS_Strategy::Type strategy,
                              LS_CAppendList<T>*& list) {
  list = nullptr;
  RefPtr<LS_IElement> element;
  XCode const result = container->getElement(name, strategy, element);
  if (result.isFailure())
    return result;
  list = static_cast<LS_CAppendList<T>*>(element.get());
  return testExpression(list);
}

// The container's own list under name.
template <class T>
XCode LS_getAppendListElement(LS_IContainer* container, String const& name, LS_CAppendList<T>*& list) {
  return LS_getAppendListElement(static_cast<LS_IContainer const*>(container), name, LS_Strategy::LOCAL_ONLY,
                                 list);
}

// The container's own list under name, created empty when there is none (it
// then replaces a shadow of that name and inherits through the shadow's
// base). The container keeps the only reference.
template <class T>
XCode LS_createAppendListElement(LS_IContainer* container, String const& name, LS_CAppendList<T>*& list) {
  if (LS_getAppendListElement(container, name, list).isSuccess())
    return XCode::success();
  RefPtr<LS_CAppendList<T>> const created = adoptRef(new LS_CAppendList<T>);
  container->addElement(name, created.get());
  list = created.get();
  return testExpression(list);
}
