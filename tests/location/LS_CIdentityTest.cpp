#include "LS_CIdentity.h"

#include <gtest/gtest.h>

#include <string>

#include "LS_ClassIdentifiers.h"
#include "LS_ElementClassTable.h"
#include "LocationFixture.h"
#include "faces/DumpRows.h"
#include "support/LogCapture.h"

namespace {

TEST_F(LocationTest, IsResponsibleForItsNameAliasNamesByteRangesAndWholeExpressionMatches) {
  RefPtr<LS_IIdentityConfig> const alice = identity("alice");
  alice->addConfigAliasName("bob");
  alice->addConfigAliasRange("100", "199");
  alice->addConfigAliasExpression("9[0-9]{2}");
  RefPtr<LS_IIdentity> const view = runtime(alice);

  for (char const* user : {"alice", "bob", "100", "150", "199", "1000", "10a", "950"})
    EXPECT_TRUE(view->isResponsible(user)) << user;
  for (char const* user : {"2", "099", "2000", "9500", "95", "Alice", ""})
    EXPECT_FALSE(view->isResponsible(user)) << user;
}

TEST_F(LocationTest, AnOwnAliasRecordReplacesTheInheritedOneUntilDestroyed) {
  group("group")->addConfigAliasName("x");
  RefPtr<LS_IIdentityConfig> const alice = identity("alice", "group");
  RefPtr<LS_IIdentity> const view = runtime(alice);
  unsigned int count = 9;
  EXPECT_EQ(view->getNumberOfAliasNames(), 1u);
  EXPECT_TRUE(alice->getNumberOfConfigAliasNames(count).isFailure());
  EXPECT_EQ(count, 0u);

  alice->addConfigAliasName("y");
  EXPECT_TRUE(view->isResponsible("y"));
  EXPECT_FALSE(view->isResponsible("x"));
  String name = "stale";
  EXPECT_TRUE(view->getAliasName(1, name).isFailure());
  EXPECT_EQ(name, "");

  alice->clearConfigAlias();
  EXPECT_FALSE(view->isResponsible("y"));
  EXPECT_EQ(view->getNumberOfAliasNames(), 0u);
  alice->destroyConfigAlias();
  EXPECT_TRUE(view->isResponsible("x"));
}

// One configuration edit: the log line it writes (class names as they are)
// and the child events the identity raises. Prepared edits start from an
// identity with the alias x, the display name Al and the user
// representation ip.
struct Edit {
  char const* name;
  bool prepared;
  void (*act)(LS_IIdentityConfig& identity);
  char const* logFormat;  // null: no line to check
  Journal children;
};

class IdentityEditTest : public ::testing::TestWithParam<Edit> {};

TEST_P(IdentityEditTest, LogsItsLineAndRaisesExactlyItsChildEvents) {
  RefPtr<LS_IIdentityConfig> const identity = adoptRef(static_cast<LS_IIdentityConfig*>(new LS_CIdentity));
  if (GetParam().prepared) {
    identity->addConfigAliasName("x");
    identity->setConfigDisplayName("Al");
    identity->setConfigUserRepresentation(LS_User::IP);
  }
  Journal journal;
  RefPtr<ContainerRecorder> const recorder = adoptRef(new ContainerRecorder(journal, "id"));
  static_cast<LS_CIdentity*>(identity.get())->addContainerObserver(recorder.get(), 0);
  LogCapture log;

  GetParam().act(*identity);

  EXPECT_EQ(journal, GetParam().children);
  if (GetParam().logFormat) {
    EXPECT_TRUE(log.contains(formatted(GetParam().logFormat, logAddressOf(identity))))
        << GetParam().logFormat;
  }
  static_cast<LS_CIdentity*>(identity.get())->removeContainerObserver(recorder.get());
}

Journal const CREATED = {"id:add:alias", "id:change:alias"};
Journal const NONE;
Journal only(char const* event) {
  return {event};
}
using I = LS_IIdentityConfig;

std::vector<Edit> const EDITS = {
    {"AddAliasName", false, [](I& i) { i.addConfigAliasName("x"); },
     "LS_COutbound(%p)::addConfigAliasName(x)\n", CREATED},
    {"AddPresentAliasName", true, [](I& i) { i.addConfigAliasName("x"); }, nullptr, NONE},
    {"RemoveAliasNameWithoutRecord", false, [](I& i) { i.removeConfigAliasName("x"); },
     "LS_CIdentity(%p)::removeConfigAliasName(x)\n", NONE},
    {"RemoveAliasRangeWithoutRecord", false, [](I& i) { i.removeConfigAliasRange("1", "2"); },
     "LS_COutbound(%p)::removeConfigAliasRange(1, 2)\n", CREATED},
    {"AddExpressionThatDoesNotCompile", false, [](I& i) { i.addConfigAliasExpression("("); },
     "LS_COutbound(%p)::addConfigAliasExpression(()\n", CREATED},
    {"RemoveExpressionWithoutRecord", false, [](I& i) { i.removeConfigAliasExpression("e"); },
     "LS_CIdentity(%p)::removeConfigAliasExpression(e)\n", NONE},
    {"ClearAlias", false, [](I& i) { i.clearConfigAlias(); }, nullptr, CREATED},
    {"DestroyAlias", true, [](I& i) { i.destroyConfigAlias(); }, "LS_CIdentity(%p)::destroyConfigAlias()\n",
     only("id:remove:alias")},
    {"RemoveDisplayName", true, [](I& i) { i.removeConfigDisplayName(); },
     "LS_CIdentity(%p)::setConfigDisplayName()\n", only("id:remove:display-name")},
    {"SetPhoneContext", false, [](I& i) { i.setConfigPhoneContext("+49"); },
     "LS_CIdentity(%p)::setConfigPhoneContext(+49)\n", only("id:add:phone-context")},
    {"SetUserRepresentation", true, [](I& i) { i.setConfigUserRepresentation(LS_User::PHONE); },
     "LS_CIdentity(%p)::setConfigUserRepresentation(phone)\n", only("id:change:user-representation")},
    {"RemoveUserRepresentation", true, [](I& i) { i.removeConfigUserRepresentation(); },
     "LS_CIdentity(%p)::setConfigUserRepresentation()\n", only("id:remove:user-representation")},
};

INSTANTIATE_TEST_SUITE_P(Identity, IdentityEditTest, ::testing::ValuesIn(EDITS), rowName<Edit>);

template <class T>
DumpRows dumpOf(T* object,
                unsigned int maxLevel,
                unsigned int level,
                unsigned int detail,
                char const* prefix) {
  InfoContainer info;
  RefPtr<IInfo> dumped;
  EXPECT_TRUE(object->queryIf(dumped).isSuccess());
  dumped->getInfo(info, maxLevel, level, 5, detail, prefix);
  return dumpRows(info);
}

TEST_F(LocationTest, DumpShowsTheValuesInEffectThenEachFaceInEffectOneLevelDownWithinItsLimits) {
  RefPtr<LS_IIdentityConfig> const base = group("group");
  base->setConfigDisplayName("Group");
  base->addConfigAliasName("hidden");
  for (auto kind : {LS_IdentityFace::REGISTRATION_OUTBOUND, LS_IdentityFace::AUTHENTICATION_INBOUND})
    handedOut([&](UUID const& iid, void** out) { return base->createConfigFaceIf(kind, iid, out); });
  RefPtr<LS_IIdentityConfig> const alice = identity("alice", "group");
  alice->addConfigAliasName("al");
  alice->addConfigAliasRange("100", "199");
  alice->addConfigAliasExpression("9[0-9]{2}");
  alice->setConfigPhoneContext("+49");
  alice->setConfigUserRepresentation(LS_User::PHONE);
  for (auto kind : {LS_IdentityFace::REGISTRATION_INBOUND, LS_IdentityFace::AUTHENTICATION_OUTBOUND})
    handedOut([&](UUID const& iid, void** out) { return alice->createConfigFaceIf(kind, iid, out); });

  DumpRows expected = {"0|Dump Identity|alice",
                       "1|Inherits|group",
                       "1|Alias|",
                       "2|al|",
                       "2|100..199|",
                       "2|/9[0-9]{2}/|",
                       "1|Display Name|Group",
                       "1|Phone Context|+49",
                       "1|User Representation|phone"};
  struct FaceDump {
    LS_IdentityFace::Type kind;
    char const* prefix;
  };
  for (FaceDump const face : {FaceDump{LS_IdentityFace::AUTHENTICATION_OUTBOUND, "Outbound "},
                              FaceDump{LS_IdentityFace::AUTHENTICATION_INBOUND, "Inbound "},
                              FaceDump{LS_IdentityFace::REGISTRATION_OUTBOUND, ""},
                              FaceDump{LS_IdentityFace::REGISTRATION_INBOUND, ""}}) {
    RefPtr<IInfo> faceInfo;
    ASSERT_TRUE(LS_getFaceIf(runtime(alice).get(), face.kind, faceInfo).isSuccess());
    InfoContainer faceDump;
    for (std::string const& row : dumpRows(faceInfo->getInfo(faceDump, 9, 1, 5, 0, face.prefix)))
      expected.push_back(row);
  }
  EXPECT_EQ(dumpOf(alice.get(), 9, 0, 0, "Dump "), expected);
  EXPECT_EQ(dumpOf(alice.get(), 2, 2, 0, ""), DumpRows{"2|Identity|alice"});
  EXPECT_TRUE(dumpOf(alice.get(), 9, 0, 6, "").empty());
  EXPECT_EQ(dumpOf(identity("solo").get(), 5, 0, 0, "P "), DumpRows{"0|P Identity|solo"});
}

TEST(IdentityClass, IsMadeByTheContainerHelpersUnderItsClassIdentifier) {
  RefPtr<LS_IElement> element;
  ASSERT_TRUE(LS_ElementClassTable::create(CID_LS_Identity(), element).isSuccess());
  RefPtr<LS_IIdentity> identity;
  EXPECT_TRUE(element->queryIf(identity).isSuccess());
}

}  // namespace
