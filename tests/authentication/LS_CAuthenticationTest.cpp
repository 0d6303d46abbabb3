#include "LS_CAuthentication.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "CDriverRepository.h"
#include "LS_CMasterAuthenticationService.h"
#include "SystemRepository.h"
#include "faces/DumpRows.h"
#include "support/LogCapture.h"

namespace {

using Entries = std::vector<std::string>;

// A face with its own entries on top of a base face with two.
class AuthenticationFaceTest : public ::testing::Test {
 protected:
  void SetUp() override {
    base->insertConfigAuthenticate(0, "s1", "u1");
    base->insertConfigAuthenticate(1, "s2", "u2");
    face->setBase(base.get());
  }

  static Entries runTime(LS_IAuthentication const& face) {
    Entries entries;
    String service;
    String user;
    for (unsigned int index = 0; index < face.getNumberOfAuthenticates(); ++index) {
      EXPECT_TRUE(face.getAuthenticate(index, service, user).isSuccess());
      entries.push_back(service.str() + "/" + user.str());
    }
    return entries;
  }
  static Entries configured(LS_IAuthenticationConfig const& face) {
    Entries entries;
    unsigned int count = 0;
    face.getNumberOfConfigAuthenticates(count);
    String service;
    String user;
    for (unsigned int index = 0; index < count; ++index) {
      EXPECT_TRUE(face.getConfigAuthenticate(index, service, user).isSuccess());
      entries.push_back(service.str() + "/" + user.str());
    }
    return entries;
  }

  RefPtr<LS_CAuthentication> base = adoptRef(new LS_CAuthentication);
  RefPtr<LS_CAuthentication> face = adoptRef(new LS_CAuthentication);
};

TEST_F(AuthenticationFaceTest, RunTimeViewIsTheBaseEntriesThenTheOwnOnesWhichClearEmptiesAndDestroyDrops) {
  unsigned int count = 7;
  EXPECT_TRUE(face->getNumberOfConfigAuthenticates(count).isFailure());
  EXPECT_EQ(count, 0u);
  EXPECT_EQ(runTime(*face), (Entries{"s1/u1", "s2/u2"}));

  face->insertConfigAuthenticate(0, "own", "me");
  EXPECT_EQ(runTime(*face), (Entries{"s1/u1", "s2/u2", "own/me"}));
  base->insertConfigAuthenticate(99, "s3", "u3");
  EXPECT_EQ(runTime(*face), (Entries{"s1/u1", "s2/u2", "s3/u3", "own/me"})) << "follows the base live";
  EXPECT_EQ(configured(*face), Entries{"own/me"});

  face->clearConfigAuthenticates();
  count = 7;
  EXPECT_TRUE(face->getNumberOfConfigAuthenticates(count).isSuccess()) << "clear keeps an empty own list";
  EXPECT_EQ(count, 0u);
  EXPECT_EQ(runTime(*face), (Entries{"s1/u1", "s2/u2", "s3/u3"}));
  face->insertConfigAuthenticate(0, "own", "me");
  face->destroyConfigAuthenticates();
  EXPECT_TRUE(face->getNumberOfConfigAuthenticates(count).isFailure());
  face->insertConfigAuthenticate(0, "again", "me");
  EXPECT_EQ(runTime(*face), (Entries{"s1/u1", "s2/u2", "s3/u3", "again/me"}));
}

TEST_F(AuthenticationFaceTest, EditsFollowTheIndexRulesOfTheOwnList) {
  face->insertConfigAuthenticate(0, "a", "1");
  face->insertConfigAuthenticate(99, "b", "2");
  face->insertConfigAuthenticate(1, "a", "1");
  EXPECT_EQ(configured(*face), (Entries{"a/1", "a/1", "b/2"})) << "duplicates allowed, past the end appends";

  EXPECT_TRUE(face->moveConfigAuthenticate(2, -10).isSuccess());
  EXPECT_TRUE(face->modifyConfigAuthenticate(1, "c", "3").isSuccess());
  EXPECT_EQ(configured(*face), (Entries{"b/2", "c/3", "a/1"}));
  EXPECT_TRUE(face->moveConfigAuthenticate(3, 1).isFailure());
  EXPECT_TRUE(face->modifyConfigAuthenticate(3, "x", "y").isFailure());
  String service("kept");
  String user("kept");
  EXPECT_TRUE(face->getConfigAuthenticate(3, service, user).isFailure());
  EXPECT_EQ(service, "kept");

  face->removeConfigAuthenticate(3);
  face->removeConfigAuthenticate(0);
  EXPECT_EQ(configured(*face), (Entries{"c/3", "a/1"}));
  EXPECT_EQ(runTime(*face), (Entries{"s1/u1", "s2/u2", "c/3", "a/1"})) << "inherited entries untouched";
}

TEST_F(AuthenticationFaceTest, EditsLogOnEntryWithTheirArguments) {
  LogCapture log;
  face->insertConfigAuthenticate(4, "s", "u");
  face->modifyConfigAuthenticate(9, "t", "v");
  face->moveConfigAuthenticate(0, -1);
  face->removeConfigAuthenticate(5);
  face->clearConfigAuthenticates();
  face->destroyConfigAuthenticates();
  void const* const self = static_cast<LS_IElement*>(face.get());
  std::vector<std::string> own;
  for (std::string const& line : log.lines()) {
    if (line.rfind("LS_CAuthentication(", 0) == 0)
      own.push_back(line);
  }
  EXPECT_EQ(own, (std::vector<std::string>{
                     formatted("LS_CAuthentication(%p)::insertConfigAuthenticate(4, s, u)\n", self),
                     formatted("LS_CAuthentication(%p)::modifyConfigAuthenticate(9, t, v)\n", self),
                     formatted("LS_CAuthentication(%p)::moveConfigAuthenticate(0, 4294967295)\n", self),
                     formatted("LS_CAuthentication(%p)::removeConfigAuthenticate(5)\n", self),
                     formatted("LS_CAuthentication(%p)::clearConfigAuthenticate()\n", self),
                     formatted("LS_CAuthentication(%p)::destroyConfigAuthenticate()\n", self),
                 }));
}

// The dump asks the registered master authentication service about each
// entry's service and user.
class AuthenticationFaceDumpTest : public AuthenticationFaceTest {
 protected:
  void SetUp() override {
    AuthenticationFaceTest::SetUp();
    face->insertConfigAuthenticate(0, "s1", "");
    face->insertConfigAuthenticate(1, "s3", "u3");
    repository->registerDriver(master.get());
    SYSTEM::SET_DRIVER_REPOSITORY(repository.get());
  }
  void TearDown() override { SYSTEM::SET_DRIVER_REPOSITORY(nullptr); }

  RefPtr<LS_IAuthenticationService> service(char const* name) {
    RefPtr<LS_IAuthenticationService> created;
    adoptInterface(created,
                   [&](UUID const& iid, void** raw) { return master->createAuthenticationServiceIf(name, iid, raw); });
    return created;
  }
  DumpRows dump() const {
    InfoContainer info;
    face->getInfo(info, 9, 0, 0, 0, "* ");
    return dumpRows(info);
  }

  RefPtr<LS_CMasterAuthenticationService> master = adoptRef(new LS_CMasterAuthenticationService);
  RefPtr<CDriverRepository> repository = adoptRef(new CDriverRepository);
};

TEST_F(AuthenticationFaceDumpTest, MarksMissingServicesUsersAndTheDefaultFallbackAndAllWithoutARepository) {
  service("s1")->setCredentials("u1", "p");
  service("s2")->setCredentials("DEFAULT", "p");
  EXPECT_EQ(dump(), (DumpRows{
                        "0|* Authentication|",
                        "1|Authentication Link|",
                        "2|Authentication-Service|s1",
                        "2|User Name|u1",
                        "1|Authentication Link|",
                        "2|Authentication-Service|s2",
                        "2|User Name|u2 (does not exist; fallback to username 'default')",
                        "1|Authentication Link|",
                        "2|Authentication-Service|s1",
                        "1|Authentication Link|",
                        "2|Authentication-Service|s3 (DOES NOT EXIST)",
                        "2|User Name|u3 (DOES NOT EXIST)",
                    }));

  SYSTEM::SET_DRIVER_REPOSITORY(nullptr);
  DumpRows const rows = dump();
  EXPECT_EQ(DumpRows(rows.begin() + 2, rows.begin() + 4),
            (DumpRows{"2|Authentication-Service|s1 (DOES NOT EXIST)", "2|User Name|u1 (DOES NOT EXIST)"}));
}

}  // namespace
