#include "LS_CContainer.h"

#include <gtest/gtest.h>

#include "LS_CData.h"
#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

namespace {

String valueOf(LS_IContainer const* container, char const* name, LS_Strategy::Type strategy) {
  String value("<none>");
  LS_getDataElement(container, name, strategy, value);
  return value;
}

Vector<String> namesOf(LS_IContainer const* container, LS_Strategy::Type strategy) {
  Vector<String> names;
  container->getElements(strategy, names);
  return names;
}

Vector<String> listOf(std::initializer_list<char const*> texts) {
  Vector<String> names;
  for (char const* text : texts)
    names.add(text);
  return names;
}

// A chain of three containers: top <- middle <- bottom.
class ContainerChainTest : public ::testing::Test {
 protected:
  void SetUp() override {
    middle->setBase(top.get());
    bottom->setBase(middle.get());
  }

  Journal journal;
  RefPtr<TestContainer> top = makeContainer();
  RefPtr<TestContainer> middle = makeContainer();
  RefPtr<TestContainer> bottom = makeContainer();
};

TEST_F(ContainerChainTest, EachStrategyReadsThroughTheChain) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  LS_setDataElement<String>(middle.get(), "b", "middle-b");
  LS_setDataElement<String>(bottom.get(), "b", "bottom-b");

  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::LOCAL_OR_BASE), "top-a");
  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::BASE_ONLY), "top-a");
  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::LOCAL_ONLY), "<none>");
  EXPECT_EQ(valueOf(bottom.get(), "b", LS_Strategy::LOCAL_OR_BASE), "bottom-b");
  EXPECT_EQ(valueOf(bottom.get(), "b", LS_Strategy::BASE_ONLY), "<none>");
  EXPECT_EQ(valueOf(bottom.get(), "a", static_cast<LS_Strategy::Type>(3)), "<none>");
  EXPECT_EQ(namesOf(bottom.get(), LS_Strategy::LOCAL_OR_BASE), listOf({"b", "a"}));
  EXPECT_FALSE(bottom->containsElement("b", LS_Strategy::BASE_ONLY));
  EXPECT_TRUE(namesOf(bottom.get(), static_cast<LS_Strategy::Type>(7)).isEmpty());
}

TEST_F(ContainerChainTest, ShadowFollowsTheBaseGainingAndLosingAChild) {
  ContainerWatch watch(bottom.get(), journal, "bottom");

  LS_setDataElement<String>(top.get(), "c", "top-c");
  EXPECT_EQ(journal, (Journal{"bottom:add:c", "bottom:change"}));
  EXPECT_EQ(valueOf(bottom.get(), "c", LS_Strategy::BASE_ONLY), "top-c");

  journal.clear();
  top->removeElement("c");
  EXPECT_EQ(journal, (Journal{"bottom:remove:c", "bottom:change"}));
  EXPECT_FALSE(bottom->containsElement("c", LS_Strategy::LOCAL_OR_BASE));
}

TEST_F(ContainerChainTest, AddingALocalChildReplacesTheShadowAndTakesOverItsBase) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  ContainerWatch watch(bottom.get(), journal, "bottom");

  LS_setDataElement<String>(bottom.get(), "a", "bottom-a");

  EXPECT_EQ(journal, (Journal{"bottom:add:a", "bottom:change"}));
  EXPECT_FALSE(bottom->containsElement("a", LS_Strategy::BASE_ONLY));
  RefPtr<LS_IElement> local;
  ASSERT_TRUE(bottom->getElement("a", LS_Strategy::LOCAL_ONLY, local).isSuccess());
  RefPtr<LS_IElement> inherited;
  ASSERT_TRUE(local->getBase(inherited).isSuccess());
  RefPtr<LS_IElement> middleShadow;
  middle->getElement("a", LS_Strategy::BASE_ONLY, middleShadow);
  EXPECT_EQ(inherited.get(), middleShadow.get());
}

TEST_F(ContainerChainTest, RemovingABasedLocalChildTurnsItBackIntoAFollowingShadowWithoutRemoval) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  LS_setDataElement<String>(bottom.get(), "a", "bottom-a");
  ContainerWatch watch(bottom.get(), journal, "bottom");

  bottom->removeElement("a");

  EXPECT_EQ(journal, (Journal{"bottom:change:a", "bottom:change"}));
  EXPECT_TRUE(bottom->containsElement("a", LS_Strategy::BASE_ONLY));
  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::LOCAL_OR_BASE), "top-a");
  journal.clear();
  LS_setDataElement<String>(top.get(), "a", "top-a2");
  EXPECT_EQ(journal, (Journal{"bottom:change:a", "bottom:change"})) << "the base's changes reach it again";
}

TEST_F(ContainerChainTest, RemovingAnUnbasedLocalChildAnnouncesRemovalThenItsDestruction) {
  LS_setDataElement<String>(bottom.get(), "z", "bottom-z");
  RefPtr<LS_IElement> child;
  bottom->getElement("z", LS_Strategy::LOCAL_ONLY, child);
  ElementRecorder childWatch(journal, "z");
  child->addElementObserver(&childWatch, 0);
  ContainerWatch watch(bottom.get(), journal, "bottom");

  bottom->removeElement("z");

  EXPECT_EQ(journal, (Journal{"bottom:remove:z", "bottom:change", "z:destroying"}));
  child->removeElementObserver(&childWatch);
}

TEST_F(ContainerChainTest, ChildChangeRaisesOneElementChangeThenTheContainersChange) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  ContainerWatch watch(bottom.get(), journal, "bottom");

  LS_setDataElement<String>(top.get(), "a", "top-a2");

  EXPECT_EQ(journal, (Journal{"bottom:change:a", "bottom:change"}));
  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::LOCAL_OR_BASE), "top-a2");
}

TEST_F(ContainerChainTest, LocalValueStopsPropagationOfTheBasesChange) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  LS_setDataElement<String>(middle.get(), "a", "middle-a");
  ContainerWatch watch(bottom.get(), journal, "bottom");

  LS_setDataElement<String>(top.get(), "a", "top-a2");

  EXPECT_TRUE(journal.empty());
  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::LOCAL_OR_BASE), "middle-a");
}

TEST_F(ContainerChainTest, OverrideInTheMiddleReachesTheBottomShadow) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  ContainerWatch watch(bottom.get(), journal, "bottom");

  LS_setDataElement<String>(middle.get(), "a", "middle-a");

  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::LOCAL_OR_BASE), "middle-a");
  EXPECT_EQ(journal, (Journal{"bottom:change:a", "bottom:change"}));
}

TEST_F(ContainerChainTest, SettingTheBaseToNullDestroysEveryShadowAndUnbasesLocalChildren) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  LS_setDataElement<String>(top.get(), "b", "top-b");
  LS_setDataElement<String>(bottom.get(), "b", "bottom-b");
  ContainerWatch watch(bottom.get(), journal, "bottom");

  bottom->setBase(nullptr);

  EXPECT_EQ(journal, (Journal{"bottom:remove:a", "bottom:change"}));
  EXPECT_TRUE(namesOf(bottom.get(), LS_Strategy::BASE_ONLY).isEmpty());
  RefPtr<LS_IElement> local, base;
  bottom->getElement("b", LS_Strategy::LOCAL_ONLY, local);
  EXPECT_TRUE(local->getBase(base).isFailure());
  EXPECT_EQ(valueOf(bottom.get(), "b", LS_Strategy::LOCAL_OR_BASE), "bottom-b");
}

TEST_F(ContainerChainTest, MovingToAnotherBaseRebasesKeepsAndCreatesShadows) {
  LS_setDataElement<String>(top.get(), "kept", "top-kept");
  LS_setDataElement<String>(top.get(), "gone", "top-gone");
  RefPtr<TestContainer> other = makeContainer();
  LS_setDataElement<String>(other.get(), "new", "other-new");
  LS_setDataElement<String>(other.get(), "kept", "other-kept");
  ContainerWatch watch(bottom.get(), journal, "bottom");

  bottom->setBase(other.get());

  EXPECT_EQ(journal, (Journal{"bottom:change:kept", "bottom:change", "bottom:remove:gone", "bottom:change",
                              "bottom:add:new", "bottom:change"}));
  EXPECT_EQ(valueOf(bottom.get(), "kept", LS_Strategy::LOCAL_OR_BASE), "other-kept");
  EXPECT_EQ(namesOf(bottom.get(), LS_Strategy::BASE_ONLY), listOf({"kept", "new"}));
  journal.clear();
  LS_setDataElement<String>(top.get(), "kept", "ignored");
  EXPECT_TRUE(journal.empty()) << "the old base is no longer followed";
}

TEST_F(ContainerChainTest, ResetRemovesLocalChildrenAndKeepsShadows) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  LS_setDataElement<String>(bottom.get(), "a", "bottom-a");
  LS_setDataElement<String>(bottom.get(), "own", "bottom-own");

  bottom->reset();

  EXPECT_EQ(namesOf(bottom.get(), LS_Strategy::LOCAL_ONLY).size(), 0u);
  EXPECT_EQ(namesOf(bottom.get(), LS_Strategy::BASE_ONLY), listOf({"a"}));
  EXPECT_EQ(valueOf(bottom.get(), "a", LS_Strategy::LOCAL_OR_BASE), "top-a");
}

TEST_F(ContainerChainTest, TearingDownAChainInAnyOrderLeavesNothingBehind) {
  LS_setDataElement<String>(top.get(), "a", "top-a");
  LS_setDataElement<String>(middle.get(), "b", "middle-b");
  top = nullptr;
  LS_setDataElement<String>(bottom.get(), "a", "bottom-a");
  middle = nullptr;
  EXPECT_EQ(valueOf(bottom.get(), "b", LS_Strategy::LOCAL_OR_BASE), "middle-b");
  bottom = nullptr;  // the sanitizer build reports any leak or dangling observer
}

// Enough children that the tables find names through their index, and
// edits that move entries between and out of the tables.
TEST_F(ContainerChainTest, ManyChildrenAreFoundByNameAndListedInOrderAfterEdits) {
  constexpr int kChildren = 40;
  auto const name = [](int i) { return String().format("child-%d", i); };
  for (int i = 0; i < kChildren; ++i)
    LS_setDataElement<String>(top.get(), name(i), name(i));
  for (int i = 0; i < kChildren; i += 3)
    LS_setDataElement<String>(middle.get(), name(i), "middle");
  for (int i = 1; i < kChildren; i += 4)
    top->removeElement(name(i));

  Vector<String> expectedMiddleShadows;
  for (int i = 0; i < kChildren; ++i) {
    bool const removed = i % 4 == 1;
    bool const overridden = i % 3 == 0;
    if (!removed && !overridden)
      expectedMiddleShadows.add(name(i));
    String const expected = overridden ? String("middle") : removed ? String("<none>") : name(i);
    EXPECT_EQ(valueOf(bottom.get(), name(i).c_str(), LS_Strategy::LOCAL_OR_BASE), expected) << i;
    EXPECT_EQ(middle->containsElement(name(i), LS_Strategy::LOCAL_ONLY), overridden) << i;
  }
  EXPECT_EQ(namesOf(middle.get(), LS_Strategy::BASE_ONLY), expectedMiddleShadows);
}

TEST(ContainerChildrenTest, ChangeElementTouchesOnlyLocalChildren) {
  Journal journal;
  RefPtr<TestContainer> base = makeContainer();
  RefPtr<TestContainer> container = makeContainer();
  container->setBase(base.get());
  LS_setDataElement<String>(base.get(), "inherited", "x");
  LS_setDataElement<String>(container.get(), "own", "y");
  ContainerWatch watch(container.get(), journal, "c");

  container->changeElement("inherited");
  container->changeElement("missing");
  container->changeElement("own");

  EXPECT_EQ(journal, (Journal{"c:change:own", "c:change"}));
}

TEST(ContainerChildrenTest, CreateElementReturnsTheExistingLocalChildOrFailsForAnUnknownClass) {
  RefPtr<TestContainer> container = makeContainer();
  LS_setDataElement<String>(container.get(), "a", "x");
  RefPtr<LS_IElement> existing;
  container->getElement("a", LS_Strategy::LOCAL_ONLY, existing);

  RefPtr<LS_IElement> found;
  EXPECT_TRUE(container->createElement("a", CID_Unknown(), found).isSuccess());
  EXPECT_EQ(found.get(), existing.get());

  RefPtr<LS_IElement> none;
  EXPECT_TRUE(container->createElement("b", CID_Unknown(), none).isFailure());
  EXPECT_FALSE(container->containsElement("b", LS_Strategy::LOCAL_OR_BASE));
  void* object = &none;
  EXPECT_TRUE(container->createElementIf("b", CID_Unknown(), LS_IElement::IID(), &object).isFailure());
  EXPECT_EQ(object, nullptr);
}

class RegisteredChild : public TestContainer {};
UUID const& testClassId() {
  static UUID const id("0d8f2a55-8a6e-4f61-9b0c-6a1d3f4e5b27", "test class");
  return id;
}
LS_ElementClassRegistration const registerTestClass(testClassId(), &LS_makeElement<RegisteredChild>);

TEST(ContainerChildrenTest, CreateElementIfMakesTheSuppliedClassAndAnswersTheInterface) {
  RefPtr<TestContainer> container = makeContainer();
  Journal journal;
  ContainerWatch watch(container.get(), journal, "c");

  RefPtr<LS_IContainer> child;
  ASSERT_TRUE(adoptInterface(child, [&](UUID const& iid, void** raw) {
                return container->createElementIf("child", testClassId(), iid, raw);
              }).isSuccess());
  EXPECT_NE(dynamic_cast<RegisteredChild*>(child.get()), nullptr);
  EXPECT_EQ(journal, (Journal{"c:add:child", "c:change"}));

  RefPtr<LS_IContainer> again;
  adoptInterface(again, [&](UUID const& iid, void** raw) {
    return container->createElementIf("child", testClassId(), iid, raw);
  });
  EXPECT_EQ(again.get(), child.get());

  RefPtr<LS_IContainerObserver> observer;
  EXPECT_TRUE(adoptInterface(observer, [&](UUID const& iid, void** raw) {
                return container->getElementIf("child", LS_Strategy::LOCAL_ONLY, iid, raw);
              }).isSuccess());
  EXPECT_TRUE(adoptInterface(observer, [&](UUID const& iid, void** raw) {
                return container->getElementIf("child", LS_Strategy::BASE_ONLY, iid, raw);
              }).isFailure());
  EXPECT_EQ(observer.get(), nullptr);
}

TEST(ContainerEventTest, ClonedEventKeepsNameAndSubject) {
  RefPtr<TestContainer> container = makeContainer();
  LS_IContainer::EvElement const event(container.get(), "name");
  auto const copy = event.clone();
  EXPECT_EQ(static_cast<LS_IContainer::EvElement&>(*copy).name, "name");
  EXPECT_EQ(copy->getSubject(), static_cast<LS_IContainer*>(container.get()));
}

TEST(ContainerLogTest, AddingAndRemovingAChildWritesTheContainerLines) {
  RefPtr<TestContainer> container = makeContainer();
  RefPtr<LS_IElement> child = adoptRef(static_cast<LS_IElement*>(new LS_CData<String>("v")));
  LogCapture log;

  container->addElement("a", child.get());
  container->removeElement("a");

  void const* self = LS_ptr(static_cast<LS_IElement*>(container.get()));
  EXPECT_TRUE(
      log.contains(formatted("LS_CElement(%p)::addElement(%s, %p)\n", self, "a", LS_ptr(child.get()))));
  EXPECT_TRUE(log.contains(formatted("LS_CElement(%p)::notifyElementAdd(%s)\n", self, "a")));
  EXPECT_TRUE(log.contains(formatted("LS_CElement(%p)::removeElement(%s)\n", self, "a")));
  EXPECT_TRUE(log.contains(formatted("LS_CElement(%p)::notifyElementRemove(%s)\n", self, "a")));
}

}  // namespace
