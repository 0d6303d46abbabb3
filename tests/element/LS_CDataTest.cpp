#include "LS_CData.h"

#include <gtest/gtest.h>

#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

namespace {

// An identity-like pair: derived inherits from base.
class DataValueTest : public ::testing::Test {
 protected:
  void SetUp() override { derived->setBase(base.get()); }

  Journal journal;
  RefPtr<TestContainer> base = makeContainer();
  RefPtr<TestContainer> derived = makeContainer();
};

TEST_F(DataValueTest, WritingTheSameValueTwiceAnnouncesOneChange) {
  LS_setDataElement<String>(derived.get(), "display-name", "Derived");
  ContainerWatch watch(derived.get(), journal, "derived");

  LS_setDataElement<String>(derived.get(), "display-name", "Again");
  LS_setDataElement<String>(derived.get(), "display-name", "Again");

  EXPECT_EQ(journal, (Journal{"derived:change:display-name", "derived:change"}));
}

TEST_F(DataValueTest, SettingAMissingNameCreatesOneElementAndOneAddition) {
  ContainerWatch watch(derived.get(), journal, "derived");

  LS_setDataElement<unsigned int>(derived.get(), "lifetime", 60u);

  EXPECT_EQ(journal, (Journal{"derived:add:lifetime", "derived:change"}));
  unsigned int lifetime = 0;
  EXPECT_TRUE(LS_getDataElement(derived.get(), "lifetime", LS_Strategy::LOCAL_ONLY, lifetime).isSuccess());
  EXPECT_EQ(lifetime, 60u);
}

TEST_F(DataValueTest, ReadingWithADefaultLeavesNoElementBehind) {
  unsigned int lifetime = 7;
  EXPECT_EQ(LS_getDataElement(derived.get(), "lifetime", LS_Strategy::LOCAL_OR_BASE, lifetime, 3600u), 3600u);
  EXPECT_FALSE(derived->containsElement("lifetime", LS_Strategy::LOCAL_OR_BASE));
  bool flag = true;
  EXPECT_TRUE(LS_getDataElement(derived.get(), "flag", LS_Strategy::LOCAL_OR_BASE, flag).isFailure());
  EXPECT_TRUE(flag) << "a failed read leaves the output alone";
}

TEST_F(DataValueTest, ResetWithoutALocalValueStillAnnouncesAChange) {
  LS_setDataElement<String>(base.get(), "display-name", "Base");
  RefPtr<LS_IElement> shadow;
  derived->getElement("display-name", LS_Strategy::BASE_ONLY, shadow);
  ContainerWatch watch(derived.get(), journal, "derived");

  shadow->reset();

  EXPECT_EQ(journal, (Journal{"derived:change:display-name", "derived:change"}));
}

TEST_F(DataValueTest, CreatePointerMakesAnEmptyOwnValueForInPlaceEdits) {
  Vector<String>* list = nullptr;
  ASSERT_TRUE(LS_createDataElementPointer(derived.get(), "proxy", list).isSuccess());
  ASSERT_NE(list, nullptr);
  EXPECT_TRUE(list->isEmpty());
  list->add("edited in place");

  Vector<String>* again = nullptr;
  ASSERT_TRUE(LS_createDataElementPointer(derived.get(), "proxy", again).isSuccess());
  EXPECT_EQ(again, list);
  Vector<String> const* shown = nullptr;
  ASSERT_TRUE(
      LS_getDataElementPointer(derived.get(), "proxy", LS_Strategy::LOCAL_OR_BASE, shown).isSuccess());
  EXPECT_EQ((*shown)[0], "edited in place");
}

TEST_F(DataValueTest, PointerReadOfAMissingValueStoresNull) {
  LS_setDataElement<String>(base.get(), "display-name", "Base");
  String* own = reinterpret_cast<String*>(&own);
  EXPECT_TRUE(LS_getDataElementPointer(derived.get(), "display-name", own).isFailure());
  EXPECT_EQ(own, nullptr);
  String const* shown = nullptr;
  EXPECT_TRUE(
      LS_getDataElementPointer(derived.get(), "display-name", LS_Strategy::BASE_ONLY, shown).isSuccess());
  EXPECT_EQ(*shown, "Base");
}

TEST_F(DataValueTest, ShadowWithoutAnyValueUpTheChainReadsAsMissing) {
  RefPtr<LS_IElement> orphan = adoptRef(static_cast<LS_IElement*>(new LS_CData<String>));
  EXPECT_EQ(static_cast<LS_CData<String>*>(orphan.get())->get(), nullptr);
}

TEST(DataValueLogTest, FirstWriteLogsCreateLocalAndOverwriteLogsOverwrite) {
  RefPtr<LS_CData<String>> data = adoptRef(new LS_CData<String>);
  LogCapture log;

  data->set("a");
  data->set("a");
  data->set("b");

  void const* self = LS_ptr(static_cast<LS_IElement*>(data.get()));
  EXPECT_EQ(log.lines(), (std::vector<std::string>{
                             formatted("LS_CData(%p)::get() -> create local\n", self),
                             formatted("LS_CElement(%p)::notifyChange()\n", self),
                             formatted("LS_CData(%p)::set() -> overwrite local\n", self),
                             formatted("LS_CElement(%p)::notifyChange()\n", self),
                         }));
}

}  // namespace
