// LS_IContainer: an element that holds named child elements.
//
// Given a base container, a container mirrors the base's children: for every
// name the base has and the container does not hold itself, it keeps a
// shadow, an empty child of the same class based on the base's child. A read
// finds the container's own (local) child or the shadow, per strategy:
// "localOnly" sees local children, "baseOnly" shadows, "localOrBase" local
// then shadow; any other strategy sees nothing. Identities and their faces
// are containers; their values are the children.
#pragma once

#include "Export.h"

#include <memory>

#include "IUnknown.h"
#include "LS_IContainerObserver.h"
#include "LS_IElement.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "LS_Strategy.h"
#include "ObserverEvent.h"
#include "String.h"
#include "Vector.h"

class LS_EXPORT LS_IContainer : public LS_Interface<LS_IContainerIdentifiers> {
 public:
  // A child named name was added, removed or changed in the subject.
  class EvElement : public ObserverEvent<LS_IContainer> {
   public:
    EvElement() = default;
    EvElement(LS_IContainer* subject, String const& childName)
        : ObserverEvent<LS_IContainer>(subject), name(childName) {}
    EvElement(EvElement const&) = default;
    std::unique_ptr<ObserverEvent<LS_IContainer>> clone() const override {
      return std::make_unique<EvElement>(*this);
    }

    String name;
  };

  virtual void addContainerObserver(LS_IContainerObserver* observer, unsigned int priority) = 0;
  virtual void removeContainerObserver(LS_IContainerObserver* observer) = 0;
  virtual bool containsElement(String const& name, LS_Strategy::Type strategy) const = 0;
  // element receives the child; failure (no message) leaves it unchanged.
  virtual XCode getElement(String const& name,
                           LS_Strategy::Type strategy,
                           RefPtr<LS_IElement>& element) const = 0;
  // names is replaced by the names the strategy sees, local names first.
  virtual void getElements(LS_Strategy::Type strategy, Vector<String>& names) const = 0;
  // name must not be local yet: a local entry is never replaced.
  virtual void addElement(String const& name, LS_IElement* element) = 0;
  // Names that are not local are ignored.
  virtual void removeElement(String const& name) = 0;
  // Makes the local child of name announce a change; others are ignored.
  virtual void changeElement(String const& name) = 0;

  // The local child of name; if there is none, a new object of class cid is
  // made and added under name. An unknown cid fails and creates nothing.
  XCode createElement(String const& name, UUID const& cid, RefPtr<LS_IElement>& element);
  // Interface iid of the child of name, asked under the child's lock.
  XCode getElementIf(String const& name, LS_Strategy::Type strategy, UUID const& iid, void** object) const;
  // Adds object's LS_IElement under name; fails when object is no element.
  XCode addElementIf(String const& name, IUnknown* object);
  // Interface iid of the local child of name, made from class cid first when
  // there is none. Fails, storing null, for an unknown cid or a class that
  // lacks iid (nothing is added then).
  XCode createElementIf(String const& name, UUID const& cid, UUID const& iid, void** object);
};
