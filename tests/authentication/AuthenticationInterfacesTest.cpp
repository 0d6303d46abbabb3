// The queryInterface contract of the authentication classes.

#include <gtest/gtest.h>

#include <vector>

#include "IDriver.h"
#include "LS_CAuthentication.h"
#include "LS_CAuthenticationService.h"
#include "LS_CMasterAuthenticationService.h"
#include "LS_ClassIdentifiers.h"
#include "LS_ElementClassTable.h"
#include "platform/QueryInterfaceContract.h"

namespace {

std::vector<ContractClass> const AUTHENTICATION_CLASSES = {
    {"Authentication",
     []() -> IUnknown* {
       RefPtr<LS_IElement> element;
       EXPECT_TRUE(LS_ElementClassTable::create(CID_LS_Authentication(), element).isSuccess());
       return element.leakRef();
     },
     {ADVERTISED(IUnknown), ADVERTISED(LS_IElement), ADVERTISED(LS_IContainer), ADVERTISED(IInfo),
      ADVERTISED(LS_IAuthenticationConfig), ADVERTISED(LS_IAuthentication)},
     {&LS_IIdentityIdentifiers::IID(), &LS_IAuthenticationServiceIdentifiers::IID()}},
    {"AuthenticationService",
     []() -> IUnknown* { return static_cast<LS_IAuthenticationService*>(new LS_CAuthenticationService); },
     {ADVERTISED(IUnknown), ADVERTISED(LS_IAuthenticationService), ADVERTISED(IInfo)},
     {&LS_IElement::IID(), &IDriver::IID()}},
    {"MasterAuthenticationService",
     []() -> IUnknown* { return static_cast<LS_IMasterAuthenticationService*>(new LS_CMasterAuthenticationService); },
     {ADVERTISED(IUnknown), ADVERTISED(IDriver), ADVERTISED(LS_IMasterAuthenticationService), ADVERTISED(IInfo)},
     {&LS_IAuthenticationService::IID()}},
};

INSTANTIATE_TEST_SUITE_P(Authentication,
                         QueryInterfaceContract,
                         ::testing::ValuesIn(AUTHENTICATION_CLASSES),
                         contractRowName);

}  // namespace
