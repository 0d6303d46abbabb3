// The queryInterface contract of every face class, made through the class
// table as a container makes it: each advertised interface answers, every
// interface leads back to one IUnknown, an identifier the class does not
// implement fails and stores null, and create() makes another object of the
// same class. Each face class adds one row to FACE_CLASSES.

#include <gtest/gtest.h>

#include <vector>

#include "IInfo.h"
#include "LS_CCallInbound.h"
#include "LS_CCallOutbound.h"
#include "LS_CMwiSubscription.h"
#include "LS_CRegistrationInbound.h"
#include "LS_CRegistrationOutbound.h"
#include "LS_ClassIdentifiers.h"
#include "LS_ElementClassTable.h"
#include "LS_ICall.h"
#include "LS_ICallConfig.h"
#include "LS_IContainer.h"
#include "LS_IContainerObserver.h"
#include "LS_IElement.h"
#include "LS_IInbound.h"
#include "LS_IInboundConfig.h"
#include "LS_IMwiSubscription.h"
#include "LS_IMwiSubscriptionConfig.h"
#include "LS_IOutbound.h"
#include "LS_IOutboundConfig.h"
#include "LS_IRegistrationInbound.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutbound.h"
#include "LS_IRegistrationOutboundConfig.h"

namespace {

struct InterfaceEntry {
  char const* name;
  UUID const& (*iid)();
  // The interface pointer that queryInterface stored, as its IUnknown.
  IUnknown* (*asUnknown)(void* raw);
};

template <class T>
InterfaceEntry interfaceOf(char const* name) {
  return {name, &T::IID, [](void* raw) { return static_cast<IUnknown*>(static_cast<T*>(raw)); }};
}

std::vector<InterfaceEntry> faceInterfaces(std::vector<InterfaceEntry> const& own) {
  std::vector<InterfaceEntry> entries = {
      interfaceOf<IUnknown>("IUnknown"),
      interfaceOf<LS_IElement>("LS_IElement"),
      interfaceOf<LS_IContainer>("LS_IContainer"),
      interfaceOf<LS_IContainerObserver>("LS_IContainerObserver"),
      interfaceOf<IInfo>("IInfo"),
  };
  entries.insert(entries.end(), own.begin(), own.end());
  return entries;
}

std::vector<InterfaceEntry> outboundFaceInterfaces(std::vector<InterfaceEntry> const& own) {
  std::vector<InterfaceEntry> entries = {
      interfaceOf<LS_IOutboundConfig>("LS_IOutboundConfig"),
      interfaceOf<LS_IOutbound>("LS_IOutbound"),
  };
  entries.insert(entries.end(), own.begin(), own.end());
  return faceInterfaces(entries);
}

std::vector<InterfaceEntry> inboundFaceInterfaces(std::vector<InterfaceEntry> const& own) {
  std::vector<InterfaceEntry> entries = {
      interfaceOf<LS_IInboundConfig>("LS_IInboundConfig"),
      interfaceOf<LS_IInbound>("LS_IInbound"),
  };
  entries.insert(entries.end(), own.begin(), own.end());
  return faceInterfaces(entries);
}

std::vector<InterfaceEntry> callInterfaces() {
  return {interfaceOf<LS_ICallConfig>("LS_ICallConfig"), interfaceOf<LS_ICall>("LS_ICall")};
}

struct FaceClass {
  char const* name;
  UUID const& (*cid)();
  std::vector<InterfaceEntry> interfaces;
};

std::vector<FaceClass> const FACE_CLASSES = {
    {"RegistrationOutbound", &CID_LS_RegistrationOutbound,
     outboundFaceInterfaces({
         interfaceOf<LS_IRegistrationOutboundConfig>("LS_IRegistrationOutboundConfig"),
         interfaceOf<LS_IRegistrationOutbound>("LS_IRegistrationOutbound"),
     })},
    {"MwiSubscription", &CID_LS_MessageSubscription,
     outboundFaceInterfaces({
         interfaceOf<LS_IMwiSubscriptionConfig>("LS_IMwiSubscriptionConfig"),
         interfaceOf<LS_IMwiSubscription>("LS_IMwiSubscription"),
     })},
    {"RegistrationInbound", &CID_LS_RegistrationInbound,
     inboundFaceInterfaces({
         interfaceOf<LS_IRegistrationInboundConfig>("LS_IRegistrationInboundConfig"),
         interfaceOf<LS_IRegistrationInbound>("LS_IRegistrationInbound"),
     })},
    {"CallInbound", &CID_LS_CallInbound, inboundFaceInterfaces(callInterfaces())},
    {"CallOutbound", &CID_LS_CallOutbound, outboundFaceInterfaces(callInterfaces())},
};

class FaceInterfacesTest : public ::testing::TestWithParam<FaceClass> {
 protected:
  void SetUp() override {
    ASSERT_TRUE(LS_ElementClassTable::create(GetParam().cid(), element).isSuccess());
    ASSERT_TRUE(element);
  }

  // The object's IUnknown, as a pointer value only (the reference is given
  // back at once).
  static IUnknown* identityOf(IUnknown* object) {
    void* raw = nullptr;
    EXPECT_TRUE(object->queryInterface(IID_Unknown(), &raw).isSuccess());
    auto* const identity = static_cast<IUnknown*>(raw);
    if (identity)
      identity->release();
    return identity;
  }

  static void expectEveryInterfaceAnswers(IUnknown* object) {
    for (InterfaceEntry const& entry : GetParam().interfaces) {
      void* raw = nullptr;
      EXPECT_TRUE(object->queryInterface(entry.iid(), &raw).isSuccess()) << entry.name;
      EXPECT_NE(raw, nullptr) << entry.name;
      if (raw)
        entry.asUnknown(raw)->release();
    }
  }

  RefPtr<LS_IElement> element;
};

TEST_P(FaceInterfacesTest, EveryAdvertisedInterfaceAnswers) {
  expectEveryInterfaceAnswers(element.get());
}

TEST_P(FaceInterfacesTest, EveryInterfaceLeadsBackToOneIdentity) {
  IUnknown* const identity = identityOf(element.get());
  ASSERT_NE(identity, nullptr);

  for (InterfaceEntry const& entry : GetParam().interfaces) {
    void* raw = nullptr;
    ASSERT_TRUE(element->queryInterface(entry.iid(), &raw).isSuccess()) << entry.name;
    IUnknown* const viaEntry = entry.asUnknown(raw);
    EXPECT_EQ(identityOf(viaEntry), identity) << entry.name;
    viaEntry->release();
  }
}

TEST_P(FaceInterfacesTest, UnknownIdentifierFailsAndStoresNull) {
  int sentinel = 0;
  for (UUID const& iid : {UUID(), GetParam().cid(), LS_IIdentityIdentifiers::IID(),
                          LS_IAuthenticationConfigIdentifiers::IID()}) {
    void* raw = &sentinel;
    EXPECT_TRUE(element->queryInterface(iid, &raw).isFailure()) << iid.name();
    EXPECT_EQ(raw, nullptr) << iid.name();
  }
}

TEST_P(FaceInterfacesTest, CreateMakesAnotherObjectOfTheSameClass) {
  RefPtr<LS_IElement> other;
  ASSERT_TRUE(element->create(other).isSuccess());

  ASSERT_TRUE(other);
  EXPECT_NE(identityOf(other.get()), identityOf(element.get()));
  expectEveryInterfaceAnswers(other.get());
}

INSTANTIATE_TEST_SUITE_P(Faces,
                         FaceInterfacesTest,
                         ::testing::ValuesIn(FACE_CLASSES),
                         [](::testing::TestParamInfo<FaceClass> const& info) { return info.param.name; });

}  // namespace
