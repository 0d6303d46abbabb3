// LS_IElement: a node of the inheritable configuration tree.
//
// An element may have a base element of the same kind: it then watches the
// base and passes the base's changes on to its own observers as its own
// changes, which is how an inherited value follows every change of the value
// it inherits. Containers, data values and append lists are elements.
#pragma once

#include "Export.h"

#include "IUnknown.h"
#include "LS_IElementObserver.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"

class LS_EXPORT LS_IElement : public LS_Interface<LS_IElementIdentifiers> {
 public:
  virtual void addElementObserver(LS_IElementObserver* observer, unsigned int priority) = 0;
  virtual void removeElementObserver(LS_IElementObserver* observer) = 0;
  virtual void notifyChange() = 0;
  virtual void notifyDestroying() = 0;
  // base receives the base element; failure (no message) without one.
  virtual XCode getBase(RefPtr<LS_IElement>& base) const = 0;
  virtual void setBase(LS_IElement* base) = 0;
  // Drops the element's own content so that it reads through to its base.
  virtual void reset() = 0;
  // A new, empty element of the same class.
  virtual XCode create(RefPtr<LS_IElement>& element) = 0;
  // Marks an element made at run time rather than by configuration.
  virtual void setDynamic(bool dynamic) = 0;
  virtual bool isDynamic() const = 0;

  // Interface iid of the base element, asked under the base's lock. Without
  // a base, or when the base lacks iid: failure, and null in *object.
  XCode getBaseIf(UUID const& iid, void** object) const;
  // Makes base's LS_IElement the base; null removes the base. An object that
  // is not an element yields failure and leaves the base as it was.
  XCode setBaseIf(IUnknown* base);
};

// base receives interface T of element's base element, or null.
template <class T>
XCode LS_getBaseIf(LS_IElement const* element, RefPtr<T>& base) {
  return adoptInterface(base,
                        [element](UUID const& iid, void** raw) { return element->getBaseIf(iid, raw); });
}
