// ObserverEvent<S>: what a subject of interface S tells its observers.
//
// The event holds a counted reference to its subject (released through the
// platform's protected release), so a subject stays alive for as long as an
// event that names it does, even if an observer drops every other reference
// during the broadcast. Subjects with more to say derive from it and
// override clone(): each observer receives its own copy.
#pragma once

#include <memory>

#include "Marshaller.h"
#include "ProtectedPtr.h"

template <class S>
class ObserverEvent {
 public:
  explicit ObserverEvent(S* subject = nullptr) : m_subject(subject) {}
  ObserverEvent(ObserverEvent const&) = default;
  ObserverEvent& operator=(ObserverEvent const&) = default;
  virtual ~ObserverEvent() = default;

  // A heap copy that takes its own reference on the subject.
  virtual std::unique_ptr<ObserverEvent> clone() const { return std::make_unique<ObserverEvent>(*this); }

  S* getSubject() const { return m_subject.get(); }
  // Carried for the platform's remote-call layer; the library never reads it.
  Marshaller& getMarshaller() { return m_marshaller; }

 private:
  ProtectedPtr<S> m_subject;
  Marshaller m_marshaller;
};
