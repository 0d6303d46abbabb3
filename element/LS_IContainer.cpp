#include "LS_IContainer.h"

#include "LS_ElementClassTable.h"
#include "LockedPtr.h"

XCode LS_IContainer::createElement(String const& name, UUID const& cid, RefPtr<LS_IElement>& element) {
  if (getElement(name, LS_Strategy::LOCAL_ONLY, element).isSuccess())
    return XCode::success();
  RefPtr<LS_IElement> created;
  XCode const result = LS_ElementClassTable::create(cid, created);
  if (result.isFailure() || !created)
    return XCode::failure();
  addElement(name, created.get());
  element = created;
  return XCode::success();
}

XCode LS_IContainer::getElementIf(String const& name,
                                  LS_Strategy::Type strategy,
                                  UUID const& iid,
                                  void** object) const {
  RefPtr<LS_IElement> element;
  if (getElement(name, strategy, element).isSuccess())
    return LockedPtr<LS_IElement>(element)->queryInterface(iid, object);
  if (object)
    *object = nullptr;
  return XCode::failure();
}

XCode LS_IContainer::addElementIf(String const& name, IUnknown* object) {
  RefPtr<LS_IElement> element;
  XCode const result = object ? object->queryIf(element) : XCode::failure();
  if (result.isSuccess())
    addElement(name, element.get());
  return result;
}

XCode LS_IContainer::createElementIf(String const& name, UUID const& cid, UUID const& iid, void** object) {
  if (getElementIf(name, LS_Strategy::LOCAL_ONLY, iid, object).isSuccess())
    return XCode::success();
  RefPtr<LS_IElement> created;
  if (LS_ElementClassTable::create(cid, created).isFailure() || !created) {
    if (object)
      *object = nullptr;
    return XCode::failure();
  }
  // Asked before the object joins the container, so that a class lacking iid
  // leaves nothing behind.
  XCode const result = LockedPtr<LS_IElement>(created)->queryInterface(iid, object);
  if (result.isSuccess())
    addElementIf(name, created.get());
  return result;
}
