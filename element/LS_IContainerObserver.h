// LS_IContainerObserver: the watcher of a container, told when a child is
// added, removed or changed. The event is always an LS_IContainer::EvElement
// naming the child.
#pragma once

#include "Export.h"

#include "IUnknown.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "ObserverEvent.h"

class LS_IContainer;

class LS_EXPORT LS_IContainerObserver : public LS_Interface<LS_IContainerObserverIdentifiers> {
 public:
  virtual void onElementAdd(ObserverEvent<LS_IContainer>& event) = 0;
  virtual void onElementRemove(ObserverEvent<LS_IContainer>& event) = 0;
  virtual void onElementChange(ObserverEvent<LS_IContainer>& event) = 0;
};
