// The queryInterface contract of every face class, made through the class
// table as a container makes it: each advertised interface answers, every
// interface leads back to one IUnknown, an identifier the class does not
// implement fails and stores null, and create() makes another object of the
// same class. Each face class adds one row to FACE_CLASSES.

#include <gtest/gtest.h>

#include <vector>

#include "IInfo.h"
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
#define INTERFACE(T) interfaceOf<T>(#T)

// Every face answers the container's interfaces and IInfo, then the pair of
// its direction, then its own pair.
std::vector<InterfaceEntry> faceInterfaces(std::vector<InterfaceEntry> const& direction,
                                           std::vector<InterfaceEntry> const& own) {
  std::vector<InterfaceEntry> entries = {
      INTERFACE(IUnknown), INTERFACE(LS_IElement), INTERFACE(LS_IContainer), INTERFACE(LS_IContainerObserver),
      INTERFACE(IInfo),
  };
  entries.insert(entries.end(), direction.begin(), direction.end());
  entries.insert(entries.end(), own.begin(), own.end());
  return entries;
}

std::vector<InterfaceEntry> const OUTBOUND = {INTERFACE(LS_IOutboundConfig), INTERFACE(LS_IOutbound)};
std::vector<InterfaceEntry> const INBOUND = {INTERFACE(LS_IInboundConfig), INTERFACE(LS_IInbound)};
std::vector<InterfaceEntry> const CALL = {INTERFACE(LS_ICallConfig), INTERFACE(LS_ICall)};

struct FaceClass {
  char const* name;
  UUID const& (*cid)();
  std::vector<InterfaceEntry> interfaces;
};

std::vector<FaceClass> const FACE_CLASSES = {
    {"RegistrationOutbound", &CID_LS_RegistrationOutbound,
     faceInterfaces(OUTBOUND,
                    {INTERFACE(LS_IRegistrationOutboundConfig), INTERFACE(LS_IRegistrationOutbound)})},
    {"MwiSubscription", &CID_LS_MessageSubscription,
     faceInterfaces(OUTBOUND, {INTERFACE(LS_IMwiSubscriptionConfig), INTERFACE(LS_IMwiSubscription)})},
    {"RegistrationInbound", &CID_LS_RegistrationInbound,
     faceInterfaces(INBOUND, {INTERFACE(LS_IRegistrationInboundConfig), INTERFACE(LS_IRegistrationInbound)})},
    {"CallInbound", &CID_LS_CallInbound, faceInterfaces(INBOUND, CALL)},
    {"CallOutbound", &CID_LS_CallOutbound, faceInterfaces(OUTBOUND, CALL)},
};

class FaceInterfacesTest : public ::testing::TestWithParam<FaceClass> {
 protected:
  void SetUp() override { ASSERT_TRUE(LS_ElementClassTable::create(GetParam().cid(), element).isSuccess()); }

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

  // Every advertised interface answers and leads back to the object's
  // identity, which it returns.
  static IUnknown* expectOneIdentity(IUnknown* object) {
    IUnknown* const identity = identityOf(object);
    EXPECT_NE(identity, nullptr);
    for (InterfaceEntry const& entry : GetParam().interfaces) {
      void* raw = nullptr;
      EXPECT_TRUE(object->queryInterface(entry.iid(), &raw).isSuccess()) << entry.name;
      if (!raw) {
        ADD_FAILURE() << entry.name << " stored null";
        continue;
      }
      IUnknown* const viaEntry = entry.asUnknown(raw);
      EXPECT_EQ(identityOf(viaEntry), identity) << entry.name;
      viaEntry->release();
    }
    return identity;
  }

  RefPtr<LS_IElement> element;
};

TEST_P(FaceInterfacesTest, EveryAdvertisedInterfaceAnswersAndLeadsBackToOneIdentity) {
  expectOneIdentity(element.get());
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
  EXPECT_NE(expectOneIdentity(other.get()), identityOf(element.get()));
}

INSTANTIATE_TEST_SUITE_P(Faces,
                         FaceInterfacesTest,
                         ::testing::ValuesIn(FACE_CLASSES),
                         [](::testing::TestParamInfo<FaceClass> const& info) { return info.param.name; });

}  // namespace
