#include "LS_IElement.h"

#include "LockedPtr.h"

XCode LS_IElement::getBaseIf(UUID const& iid, void** object) const {
  RefPtr<LS_IElement> base;
  if (getBase(base).isSuccess())
    return LockedPtr<LS_IElement>(base)->queryInterface(iid, object);
  if (object)
    *object = nullptr;
  return XCode::failure();
}

XCode LS_IElement::setBaseIf(IUnknown* base) {
  if (!base) {
    setBase(nullptr);
    return XCode::success();
  }
  RefPtr<LS_IElement> element;
  XCode const result = base->queryIf(element);
  if (result.isSuccess())
    setBase(element.get());
  return result;
}
