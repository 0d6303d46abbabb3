// LS_IElementObserver: the watcher of an element, told when the element
// changes and when it is about to go away. A plain abstract class, not an
// IUnknown: elements borrow their observers and never count them.
#pragma once

#include "Export.h"

#include "ObserverEvent.h"

class LS_IElement;

class LS_EXPORT LS_IElementObserver {
 public:
  virtual void onChange(ObserverEvent<LS_IElement>& event) = 0;
  virtual void onDestroying(ObserverEvent<LS_IElement>& event) = 0;

 protected:
  ~LS_IElementObserver() = default;
};
