// ObserverDelegate<S, O>: stands between a subject of interface S and one
// observer of interface O.
//
// The subject's ObserverContainer owns the delegate through a counted
// reference; the observer is borrowed and is never counted, so observers and
// subjects may point at each other without a cycle. stopNotifications()
// cuts the observer off for good; every notify call then does nothing.
#pragma once

#include <atomic>

#include "ObserverEvent.h"
#include "String.h"
#include "XCode.h"

template <class S, class O>
class ObserverDelegate {
 public:
  explicit ObserverDelegate(O* observer) : m_observer(observer) {}
  ObserverDelegate(ObserverDelegate const&) = delete;
  ObserverDelegate& operator=(ObserverDelegate const&) = delete;

  virtual unsigned int addRef() { return m_refCount.fetch_add(1, std::memory_order_relaxed) + 1; }
  virtual unsigned int release() {
    unsigned int const remaining = m_refCount.fetch_sub(1, std::memory_order_acq_rel) - 1;
    if (remaining == 0)
      delete this;
    return remaining;
  }

  virtual void stopNotifications() { m_observer = nullptr; }

  virtual void notifyEvent(void (O::*handler)(ObserverEvent<S>&), ObserverEvent<S>& event) {
    if (m_observer)
      (m_observer->*handler)(event);
  }

  // Without an observer there is nobody to object: success.
  virtual XCode notifyEvent(String& message,
                            XCode (O::*handler)(String&, ObserverEvent<S>&),
                            ObserverEvent<S>& event) {
    if (!m_observer)
      return XCode::success();
    return (m_observer->*handler)(message, event);
  }

  virtual void notifyDestructionEvent(void (O::*handler)(S*), S* subject) {
    if (m_observer)
      (m_observer->*handler)(subject);
  }

  O* getObserver() const { return m_observer; }

 protected:
  virtual ~ObserverDelegate() = default;

 private:
  std::atomic<unsigned int> m_refCount{1};
  O* m_observer;
};
