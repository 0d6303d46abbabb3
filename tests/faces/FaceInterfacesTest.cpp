// The queryInterface contract of every face class, made through the class
// table as a container makes it, and create() making another object of the
// same class. Each face class adds one row to FACE_CLASSES.

#include <gtest/gtest.h>

#include <typeinfo>
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
#include "platform/QueryInterfaceContract.h"

namespace {

// Every face answers the container's interfaces and IInfo, then the pair of
// its direction, then its own pair; it refuses its class identifier and the
// interfaces of the identity and of authentication.
ContractClass faceClass(char const* name,
                        UUID const& (*cid)(),
                        std::vector<AdvertisedInterface> const& direction,
                        std::vector<AdvertisedInterface> const& own) {
  std::vector<AdvertisedInterface> interfaces = {
      ADVERTISED(IUnknown),      ADVERTISED(LS_IElement),
      ADVERTISED(LS_IContainer), ADVERTISED(LS_IContainerObserver),
      ADVERTISED(IInfo),
  };
  interfaces.insert(interfaces.end(), direction.begin(), direction.end());
  interfaces.insert(interfaces.end(), own.begin(), own.end());
  auto const make = [cid]() -> IUnknown* {
    RefPtr<LS_IElement> element;
    EXPECT_TRUE(LS_ElementClassTable::create(cid(), element).isSuccess());
    return element.leakRef();
  };
  return {name,
          make,
          interfaces,
          {&cid(), &LS_IIdentityIdentifiers::IID(), &LS_IAuthenticationConfigIdentifiers::IID()}};
}

std::vector<AdvertisedInterface> const OUTBOUND = {ADVERTISED(LS_IOutboundConfig), ADVERTISED(LS_IOutbound)};
std::vector<AdvertisedInterface> const INBOUND = {ADVERTISED(LS_IInboundConfig), ADVERTISED(LS_IInbound)};
std::vector<AdvertisedInterface> const CALL = {ADVERTISED(LS_ICallConfig), ADVERTISED(LS_ICall)};

std::vector<ContractClass> const FACE_CLASSES = {
    faceClass("RegistrationOutbound",
              &CID_LS_RegistrationOutbound,
              OUTBOUND,
              {ADVERTISED(LS_IRegistrationOutboundConfig), ADVERTISED(LS_IRegistrationOutbound)}),
    faceClass("MwiSubscription",
              &CID_LS_MessageSubscription,
              OUTBOUND,
              {ADVERTISED(LS_IMwiSubscriptionConfig), ADVERTISED(LS_IMwiSubscription)}),
    faceClass("RegistrationInbound",
              &CID_LS_RegistrationInbound,
              INBOUND,
              {ADVERTISED(LS_IRegistrationInboundConfig), ADVERTISED(LS_IRegistrationInbound)}),
    faceClass("CallInbound", &CID_LS_CallInbound, INBOUND, CALL),
    faceClass("CallOutbound", &CID_LS_CallOutbound, OUTBOUND, CALL),
};

INSTANTIATE_TEST_SUITE_P(Faces, QueryInterfaceContract, ::testing::ValuesIn(FACE_CLASSES), contractRowName);

class FaceClassTest : public QueryInterfaceContract {};

TEST_P(FaceClassTest, CreateMakesAnotherObjectOfTheSameClass) {
  RefPtr<LS_IElement> element;
  ASSERT_TRUE(m_object->queryIf(element).isSuccess());
  RefPtr<LS_IElement> other;
  ASSERT_TRUE(element->create(other).isSuccess());

  ASSERT_TRUE(other);
  EXPECT_NE(other.get(), element.get());
  EXPECT_EQ(typeid(*other), typeid(*element));
}

INSTANTIATE_TEST_SUITE_P(Faces, FaceClassTest, ::testing::ValuesIn(FACE_CLASSES), contractRowName);

}  // namespace
