// LS_CContainer: the container of the tree, holding local children and the
// shadows that mirror its base container's children.
//
// Invariants: a name is never both local and shadow; the container holds one
// reference on every child and is registered (priority 0) as element
// observer of every child in both tables, and as container observer of its
// base container. Shadows exist only while the base is a container; they
// appear, are re-based and disappear as the base gains and loses children.
// A local child that is removed while it still has a base turns back into a
// reset shadow, without a removal event.
//
// Decision: when the base container turns one of its shadows into a local
// child, the shadow here is re-based onto that new child (announced as a
// change of the shadow). Keeping the old base instead would leave this
// container reading the grandparent's value through a child its base has
// dropped, so an override in the middle of a chain would never reach the
// bottom.
//
// Decision: shadows are made when their name appears in the base, not when
// first asked for. Making one is observable even when nobody asks for it:
// its creation is announced to the container's observers and hooks (an
// identity turns that into registration events), it logs its creation and
// registrations with its own address, and each change of its base reaches
// the container through it, with log lines that name it. A shadow made
// later would have to replay all of that, so the memory is saved in what a
// shadow carries instead (see LS_ElementTable and ObserverContainer).
//
// Ownership: the container dies with its last reference and releases its
// children then, telling nobody. Subclasses (identity, faces) react to child
// events through the three hooks, which run before the container's own
// observers are told. Threading: no lock of its own; callers hold it, and
// each call on a child, shadow or base holds that object's lock alone.
// create() stays abstract.
#pragma once

#include "LS_CData.h"
#include "LS_CElement.h"
#include "LS_ElementTable.h"
#include "LS_IContainer.h"
#include "LS_IContainerObserver.h"

class LS_CContainer : public CInherit<LS_CContainer, LS_CElement, LS_IContainer, LS_IContainerObserver> {
 public:
  LS_CContainer() = default;
  ~LS_CContainer() override;

  // LS_IContainer
  void addContainerObserver(LS_IContainerObserver* observer, unsigned int priority) override;
  void removeContainerObserver(LS_IContainerObserver* observer) override;
  bool containsElement(String const& name, LS_Strategy::Type strategy) const override;
  XCode getElement(String const& name,
                   LS_Strategy::Type strategy,
                   RefPtr<LS_IElement>& element) const override;
  void getElements(LS_Strategy::Type strategy, Vector<String>& names) const override;
  void addElement(String const& name, LS_IElement* element) override;
  void removeElement(String const& name) override;
  void changeElement(String const& name) override;

  // LS_IElement: reset removes every local child; shadows stay.
  void reset() override;
  void setBase(LS_IElement* base) override;

  // LS_IElementObserver: a child changed. The base's own changes are not
  // passed on: its children are watched one by one through the shadows.
  void onChange(ObserverEvent<LS_IElement>& event) override;

  // LS_IContainerObserver: the base container gained or lost a child.
  void onElementAdd(ObserverEvent<LS_IContainer>& event) override;
  void onElementRemove(ObserverEvent<LS_IContainer>& event) override;
  void onElementChange(ObserverEvent<LS_IContainer>& event) override;

  // Each runs its hook, tells the container observers, then announces the
  // container's own change; removal then makes the departing child announce
  // its destruction, so that everything based on it lets go.
  virtual void notifyElementAdd(String const& name);
  virtual void notifyElementRemove(String const& name, LS_IElement* element);
  virtual void notifyElementChange(String const& name);

  // Hooks for subclasses; nothing here.
  virtual void onElementAdd(String const& name);
  virtual void onElementRemove(String const& name);
  virtual void onElementChange(String const& name);

 protected:
  // The value families of a container whose children are data values (the
  // faces): one data value per key, and each key stored with one T only.
  template <class T>
  void setValue(String const& key, T const& value) {
    LS_setDataElement<T>(this, key, value);
  }
  // Drops the container's own value, so that the inherited one shows again.
  void removeValue(String const& key) { removeElement(key); }
  template <class T>
  XCode readValue(String const& key, LS_Strategy::Type strategy, T& value) const {
    return LS_getDataElement<T>(this, key, strategy, value);
  }
  // The effective value, or defaultValue when neither the container nor its
  // base chain has one.
  template <class T>
  T readValueOr(String const& key, T const& defaultValue) const {
    T value = defaultValue;
    return LS_getDataElement<T>(this, key, LS_Strategy::LOCAL_OR_BASE, value, defaultValue);
  }
  // The value that strategy shows under key, read in place; null when none.
  template <class T>
  T const* valueIn(String const& key, LS_Strategy::Type strategy) const {
    T const* value = nullptr;
    LS_getDataElementPointer(this, key, strategy, value);
    return value;
  }
  // The container's own value under key, for editing in place (announce the
  // edit with changeElement); null when it has none.
  template <class T>
  T* ownValue(String const& key) {
    T* value = nullptr;
    LS_getDataElementPointer(this, key, value);
    return value;
  }
  // As ownValue, first created from a default T when the container holds no
  // value of its own under key.
  template <class T>
  T* ownValueCreated(String const& key) {
    T* value = nullptr;
    LS_createDataElementPointer(this, key, value);
    return value;
  }

 private:
  using ElementTable = LS_ElementTable;

  // Fails, changing nothing, when name already has a shadow. The shadow is
  // filed under the name object of base's entry when base is a container of
  // this kind, so that every member of a group shares the group's names.
  XCode createShadowElement(String const& name, LS_IElement* baseElement, LS_IContainer* base);
  static LS_ElementName sharedNameOf(LS_IContainer* base, String const& name);
  void destroyShadowElement(String const& name);
  void follow(RefPtr<LS_IContainer> const& base);
  void forgetBase();
  LS_IContainerObserver* asContainerObserver() { return this; }

  ObserverContainer<LS_IContainer, LS_IContainerObserver> m_containerObservers;
  ElementTable m_localElements;
  ElementTable m_shadowElements;
};
