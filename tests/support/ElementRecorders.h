// Test doubles for the element model: a concrete container, and observers
// that write what they are told into a shared journal, so that tests can
// assert the order and count of notifications across several subjects.
#pragma once

#include <string>
#include <vector>

#include "CInherit.h"
#include "LS_CContainer.h"
#include "LS_ElementClassTable.h"

using Journal = std::vector<std::string>;

class TestContainer : public LS_CContainer {
 public:
  XCode create(RefPtr<LS_IElement>& element) override { return LS_makeElement<TestContainer>(element); }
};

inline RefPtr<TestContainer> makeContainer() {
  return adoptRef(new TestContainer);
}

// Records "<tag>:change" and "<tag>:destroying" for every element event.
class ElementRecorder : public LS_IElementObserver {
 public:
  ElementRecorder(Journal& journal, std::string tag) : m_journal(journal), m_tag(std::move(tag)) {}
  void onChange(ObserverEvent<LS_IElement>& event) override {
    m_journal.push_back(m_tag + ":change");
    lastSubject = event.getSubject();
  }
  void onDestroying(ObserverEvent<LS_IElement>&) override { m_journal.push_back(m_tag + ":destroying"); }

  LS_IElement* lastSubject = nullptr;

 private:
  Journal& m_journal;
  std::string m_tag;
};

// Records "<tag>:add:<name>", "<tag>:remove:<name>", "<tag>:change:<name>".
class ContainerRecorder : public CInherit<ContainerRecorder, CObject, LS_IContainerObserver> {
 public:
  ContainerRecorder(Journal& journal, std::string tag) : m_journal(journal), m_tag(std::move(tag)) {}
  void onElementAdd(ObserverEvent<LS_IContainer>& event) override { record("add", event); }
  void onElementRemove(ObserverEvent<LS_IContainer>& event) override { record("remove", event); }
  void onElementChange(ObserverEvent<LS_IContainer>& event) override { record("change", event); }

 private:
  void record(char const* what, ObserverEvent<LS_IContainer>& event) {
    auto& element = static_cast<LS_IContainer::EvElement&>(event);
    m_journal.push_back(m_tag + ":" + what + ":" + element.name.str());
  }

  Journal& m_journal;
  std::string m_tag;
};

// Watches a container both ways: its child events and its own changes.
struct ContainerWatch {
  ContainerWatch(LS_IContainer* container, Journal& journal, std::string const& tag)
      : children(adoptRef(new ContainerRecorder(journal, tag))), self(journal, tag), m_container(container) {
    container->addContainerObserver(children.get(), 0);
    RefPtr<LS_IElement> element;
    container->queryIf(element);
    element->addElementObserver(&self, 0);
  }
  ~ContainerWatch() {
    m_container->removeContainerObserver(children.get());
    RefPtr<LS_IElement> element;
    m_container->queryIf(element);
    element->removeElementObserver(&self);
  }

  RefPtr<ContainerRecorder> children;
  ElementRecorder self;

 private:
  LS_IContainer* m_container;
};
