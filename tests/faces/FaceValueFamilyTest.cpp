// The shared suite of the value families; every face instantiates it with its
// own table, and both face test programs build it.
#include "FaceValueFamilies.h"

#include "support/ElementRecorders.h"

TEST_P(FaceValueFamilyTest, NothingSetAnywhereShowsTheDefault) {
  EXPECT_EQ(seen(), (std::vector<std::string>{NONE, family().defaultText}));
}

TEST_P(FaceValueFamilyTest, OwnValueHidesTheBaseValueUntilItIsRemoved) {
  family().set(*base, false);
  EXPECT_EQ(seen(), (std::vector<std::string>{NONE, family().firstText}));

  family().set(*face, true);
  EXPECT_EQ(seen(), (std::vector<std::string>{family().secondText, family().secondText}));

  family().remove(*face);
  EXPECT_EQ(seen(), (std::vector<std::string>{NONE, family().firstText}));
}

TEST_P(FaceValueFamilyTest, ChangingAValueIsAnnouncedOnceAsAChangeOfItsKey) {
  family().set(*face, false);
  Journal journal;
  ContainerWatch watch(face.get(), journal, "face");

  family().set(*face, true);
  family().set(*face, true);

  EXPECT_EQ(journal, (Journal{"face:change:" + family().key, "face:change"}));
}
