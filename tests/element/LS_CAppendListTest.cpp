#include "LS_CAppendList.h"

#include <gtest/gtest.h>

#include "support/ElementRecorders.h"

namespace {

using List = LS_CAppendList<String>;

void append(List* list, char const* entry) {
  list->entries().add(entry);
  list->notifyChange();
}

// top holds A, middle B, bottom C and D: bottom shows A, B, C, D.
class AppendListTest : public ::testing::Test {
 protected:
  void SetUp() override {
    middle->setBase(top.get());
    bottom->setBase(middle.get());
    List* list = nullptr;
    LS_createAppendListElement(top.get(), "authenticate", list);
    append(list, "A");
    LS_createAppendListElement(middle.get(), "authenticate", list);
    append(list, "B");
    LS_createAppendListElement(bottom.get(), "authenticate", bottomList);
    append(bottomList, "C");
    append(bottomList, "D");
  }

  std::vector<std::string> shown(List const* list, LS_Strategy::Type strategy) {
    std::vector<std::string> entries;
    for (unsigned int i = 0; i < list->size(strategy); ++i)
      entries.push_back(list->get(strategy, i)->str());
    return entries;
  }

  Journal journal;
  RefPtr<TestContainer> top = makeContainer();
  RefPtr<TestContainer> middle = makeContainer();
  RefPtr<TestContainer> bottom = makeContainer();
  List* bottomList = nullptr;
};

TEST_F(AppendListTest, IndexesRunOverTheConcatenationFromTheTopOfTheChain) {
  EXPECT_EQ(bottomList->size(LS_Strategy::LOCAL_OR_BASE), 4u);
  EXPECT_EQ(bottomList->size(LS_Strategy::BASE_ONLY), 2u);
  EXPECT_EQ(bottomList->size(LS_Strategy::LOCAL_ONLY), 2u);
  EXPECT_EQ(shown(bottomList, LS_Strategy::LOCAL_OR_BASE), (std::vector<std::string>{"A", "B", "C", "D"}));
  EXPECT_EQ(shown(bottomList, LS_Strategy::BASE_ONLY), (std::vector<std::string>{"A", "B"}));
  EXPECT_EQ(shown(bottomList, LS_Strategy::LOCAL_ONLY), (std::vector<std::string>{"C", "D"}));
  EXPECT_EQ(bottomList->size(static_cast<LS_Strategy::Type>(3)), 0u);
  EXPECT_EQ(bottomList->get(static_cast<LS_Strategy::Type>(3), 0), nullptr);
  EXPECT_EQ(bottomList->get(LS_Strategy::LOCAL_OR_BASE, 4), nullptr);
}

TEST_F(AppendListTest, ChangeUpTheChainIsAnnouncedDespiteOwnEntries) {
  ContainerWatch watch(bottom.get(), journal, "bottom");
  List* topList = nullptr;
  LS_getAppendListElement(top.get(), "authenticate", topList);

  append(topList, "A2");

  EXPECT_EQ(journal, (Journal{"bottom:change:authenticate", "bottom:change"}));
  EXPECT_EQ(shown(bottomList, LS_Strategy::LOCAL_OR_BASE),
            (std::vector<std::string>{"A", "A2", "B", "C", "D"}));
}

TEST_F(AppendListTest, RemoveAtNeverTouchesInheritedEntries) {
  bottomList->removeAt(0);
  EXPECT_EQ(shown(bottomList, LS_Strategy::LOCAL_OR_BASE), (std::vector<std::string>{"A", "B", "D"}));

  ContainerWatch watch(bottom.get(), journal, "bottom");
  bottomList->removeAt(5);
  EXPECT_EQ(journal, (Journal{"bottom:change:authenticate", "bottom:change"})) << "announced all the same";
}

TEST_F(AppendListTest, RemovingTheOwnListLeavesAShadowShowingTheInheritedEntries) {
  bottom->removeElement("authenticate");

  List* shadow = nullptr;
  ASSERT_TRUE(LS_getAppendListElement(static_cast<LS_IContainer const*>(bottom.get()), "authenticate",
                                      LS_Strategy::BASE_ONLY, shadow)
                  .isSuccess());
  EXPECT_EQ(shown(shadow, LS_Strategy::LOCAL_OR_BASE), (std::vector<std::string>{"A", "B"}));
  List* own = nullptr;
  EXPECT_TRUE(LS_getAppendListElement(bottom.get(), "authenticate", own).isFailure());
  EXPECT_EQ(own, nullptr);
}

TEST_F(AppendListTest, CreatingAnExistingOwnListReturnsIt) {
  List* again = nullptr;
  ASSERT_TRUE(LS_createAppendListElement(bottom.get(), "authenticate", again).isSuccess());
  EXPECT_EQ(again, bottomList);
}

TEST_F(AppendListTest, NewOwnListInheritsThroughTheShadowItReplaces) {
  RefPtr<TestContainer> leaf = makeContainer();
  leaf->setBase(bottom.get());
  List* leafList = nullptr;
  ASSERT_TRUE(LS_createAppendListElement(leaf.get(), "authenticate", leafList).isSuccess());
  append(leafList, "E");
  EXPECT_EQ(shown(leafList, LS_Strategy::LOCAL_OR_BASE), (std::vector<std::string>{"A", "B", "C", "D", "E"}));
}

}  // namespace
