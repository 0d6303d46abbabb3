// Shared setup of the location tests: a master with one location service
// in which identities are configured by name, and observers that write
// what they are told into a Journal. The master goes last, cutting every
// identity's link back to its service.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "LS_CIdentity.h"
#include "LS_CMasterLocationService.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_ILocationServiceSubject.h"
#include "support/ElementRecorders.h"

using Texts = std::vector<std::string>;

// A parameterised row is named by its name field.
template <class Row>
std::string rowName(::testing::TestParamInfo<Row> const& info) {
  return info.param.name;
}

inline Texts textsOf(Vector<String> const& names) {
  Texts texts;
  for (String const& name : names)
    texts.push_back(name.str());
  return texts;
}

// The interface that call (iid, out) hands out, or null.
template <class T = IUnknown, class Call>
RefPtr<T> handedOut(Call&& call) {
  RefPtr<T> out;
  adoptInterface(out, call);
  return out;
}

// Records "<tag>:<event>:<identity>:<face|null>" for every face event.
class FaceRecorder : public LS_IRegistrationOutboundObserver,
                     public LS_IRegistrationInboundObserver,
                     public LS_IMwiSubscriptionObserver {
 public:
  FaceRecorder(Journal& journal, std::string tag) : m_journal(journal), m_tag(std::move(tag)) {}

  void watch(LS_IIdentity* identity) {
    RefPtr<LS_IRegistrationOutboundSubject> outbound;
    RefPtr<LS_IRegistrationInboundSubject> inbound;
    RefPtr<LS_IMwiSubscriptionSubject> mwi;
    ASSERT_TRUE(identity->queryIf(outbound).isSuccess() && identity->queryIf(inbound).isSuccess() &&
                identity->queryIf(mwi).isSuccess());
    outbound->addRegistrationOutboundObserver(this, 0);
    inbound->addRegistrationInboundObserver(this, 0);
    mwi->addMwiSubscriptionObserver(this, 0);
  }

  void onRegistrationOutboundChange(ObserverEvent<LS_IRegistrationOutbound>& event) override {
    record<LS_IRegistrationOutboundSubject>("outbound", event);
  }
  void onRegistrationInboundChange(ObserverEvent<LS_IRegistrationInbound>& event) override {
    record<LS_IRegistrationInboundSubject>("inbound", event);
  }
  void onRegistrationInboundRegistered(ObserverEvent<LS_IRegistrationInbound>& event) override {
    record<LS_IRegistrationInboundSubject>("registered", event);
  }
  void onRegistrationInboundUnregistered(ObserverEvent<LS_IRegistrationInbound>& event) override {
    record<LS_IRegistrationInboundSubject>("unregistered", event);
  }
  void onMwiSubscriptionChange(ObserverEvent<LS_IMwiSubscription>& event) override {
    record<LS_IMwiSubscriptionSubject>("mwi", event);
  }

  void const* lastFace = nullptr;
  LS_IIdentity* lastIdentity = nullptr;

 private:
  template <class Subject, class Face>
  void record(char const* what, ObserverEvent<Face>& event) {
    lastFace = event.getSubject();
    lastIdentity = static_cast<typename Subject::EvIdentity&>(event).identity.get();
    m_journal.push_back(m_tag + ":" + what + ":" + lastIdentity->getName().str() + ":" +
                        (lastFace ? "face" : "null"));
  }

  Journal& m_journal;
  std::string m_tag;
};

// Records "added:<identity>" and "removed:<identity>".
class IdentityRecorder : public LS_ILocationServiceObserver {
 public:
  explicit IdentityRecorder(Journal& journal) : m_journal(journal) {}
  void onIdentityAdded(ObserverEvent<LS_ILocationService>& event) override { record("added:", event); }
  void onIdentityRemoved(ObserverEvent<LS_ILocationService>& event) override { record("removed:", event); }

 private:
  void record(char const* what, ObserverEvent<LS_ILocationService>& event) {
    m_journal.push_back(
        what + static_cast<LS_ILocationServiceSubject::EvIdentity&>(event).identity->getName().str());
  }

  Journal& m_journal;
};

inline RefPtr<LS_IIdentity> runtime(RefPtr<LS_IIdentityConfig> const& identity) {
  RefPtr<LS_IIdentity> view;
  EXPECT_TRUE(identity && identity->queryIf(view).isSuccess());
  return view;
}

inline std::string baseNameOf(LS_IIdentity* identity) {
  RefPtr<LS_IIdentity> base;
  return identity->getBaseIdentity(base).isSuccess() ? base->getName().str() : "<none>";
}

// The address an identity's own log lines print.
inline void const* logAddressOf(RefPtr<LS_IIdentityConfig> const& identity) {
  return static_cast<LS_IElement*>(static_cast<LS_CIdentity*>(identity.get()));
}

class LocationTest : public ::testing::Test {
 protected:
  void SetUp() override {
    service = handedOut<LS_ILocationServiceConfig>(
        [this](UUID const& iid, void** out) { return master->createLocationServiceIf("example", iid, out); });
    ASSERT_TRUE(service && service->queryIf(runtimeService).isSuccess());
  }

  XCode createIdentity(char const* name,
                       char const* base,
                       LS_IdentityType::Type type,
                       RefPtr<LS_IIdentityConfig>& out) {
    return adoptInterface(out, [&](UUID const& iid, void** raw) {
      return service->createConfigIdentityIf(name, base, type, iid, raw);
    });
  }
  // A configured identity or group, which must be created.
  RefPtr<LS_IIdentityConfig> identity(char const* name,
                                      char const* base = "",
                                      LS_IdentityType::Type type = LS_IdentityType::IDENTITY) {
    RefPtr<LS_IIdentityConfig> created;
    EXPECT_TRUE(createIdentity(name, base, type, created).isSuccess()) << name;
    return created;
  }
  RefPtr<LS_IIdentityConfig> group(char const* name, char const* base = "") {
    return identity(name, base, LS_IdentityType::IDENTITY_GROUP);
  }
  RefPtr<LS_IIdentity> dynamicIdentity(char const* name) {
    return handedOut<LS_IIdentity>(
        [&](UUID const& iid, void** out) { return runtimeService->createDynamicIdentityIf(name, iid, out); });
  }
  // Names as the service lists them, configured (or all) identities.
  Texts identityNames(bool all) const {
    Vector<String> names;
    all ? runtimeService->getIdentities(names) : service->getConfigIdentities(names);
    return textsOf(names);
  }

  RefPtr<LS_CMasterLocationService> master = adoptRef(new LS_CMasterLocationService);
  RefPtr<LS_ILocationServiceConfig> service;
  RefPtr<LS_ILocationService> runtimeService;
  Journal journal;
};
