#include "LS_CMasterAuthenticationService.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "LS_ClassIdentifiers.h"
#include "faces/DumpRows.h"

namespace {

class MasterAuthenticationTest : public ::testing::Test {
 protected:
  RefPtr<LS_IAuthenticationService> create(char const* name) {
    void* raw = nullptr;
    EXPECT_TRUE(master->createAuthenticationServiceIf(name, LS_IAuthenticationService::IID(), &raw).isSuccess());
    return adoptRef(static_cast<LS_IAuthenticationService*>(raw));
  }
  std::vector<std::string> names() const {
    Vector<String> names;
    master->getAuthenticationServices(names);
    std::vector<std::string> result;
    for (String const& name : names)
      result.push_back(name.str());
    return result;
  }
  DumpRows dump(unsigned int maxLevel) const {
    InfoContainer info;
    master->getInfo(info, maxLevel, 0, 5, 0, "");
    return dumpRows(info);
  }

  RefPtr<LS_CMasterAuthenticationService> master = adoptRef(new LS_CMasterAuthenticationService);
};

TEST_F(MasterAuthenticationTest, IsTheDriverTheLookupsLookFor) {
  EXPECT_EQ(master->getDID(), DID_MasterAuthenticationService());
  EXPECT_EQ(master->getDriverName(), LS_masterDriverName("master-authentication-service"));
}

TEST_F(MasterAuthenticationTest, CreatesEachNameOnceListsInCreationOrderAndKeepsNoFailedOne) {
  void* raw = &raw;
  EXPECT_TRUE(master->createAuthenticationServiceIf("x", IDriver::IID(), &raw).isFailure());
  EXPECT_EQ(raw, nullptr);
  EXPECT_TRUE(names().empty());
  RefPtr<LS_IAuthenticationService> const x = create("x");
  EXPECT_EQ(create("x"), x);
  EXPECT_EQ(x->getName(), "x");
  create("y");
  create("Y");
  create("z");
  master->removeAuthenticationService("y");
  master->removeAuthenticationService("nobody");
  EXPECT_EQ(names(), (std::vector<std::string>{"x", "Y", "z"}));

  raw = &raw;
  EXPECT_TRUE(master->getAuthenticationServiceIf("y", LS_IAuthenticationService::IID(), &raw).isFailure());
  EXPECT_EQ(raw, nullptr);
}

TEST_F(MasterAuthenticationTest, DumpNestsEveryServiceTwoLevelsDownUnlessCut) {
  EXPECT_EQ(dump(5), (DumpRows{"0|Master Authentication-Service|", "1|Authentication-Services|(none)"}));
  create("a")->insertRealm(0, "r");
  create("b");
  EXPECT_EQ(dump(1), (DumpRows{"0|Master Authentication-Service|", "1|Authentication-Services|"}));
  EXPECT_EQ(dump(3), (DumpRows{"0|Master Authentication-Service|", "1|Authentication-Services|",
                               "2|Authentication-Service|a", "3|Protocol|HTTP", "3|Realms|", "3|Credentials|(none)",
                               "2|Authentication-Service|b", "3|Protocol|HTTP", "3|Realms|(none)",
                               "3|Credentials|(none)"}));
}

}  // namespace
