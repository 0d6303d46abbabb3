#include "LS_CElement.h"

#include <gtest/gtest.h>

#include "platform/QueryInterfaceContract.h"
#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

namespace {

class PlainElement : public LS_CElement {
 public:
  XCode create(RefPtr<LS_IElement>& element) override { return LS_makeElement<PlainElement>(element); }
};

RefPtr<LS_IElement> makeElement() {
  return adoptRef(static_cast<LS_IElement*>(new PlainElement));
}

class ElementChainTest : public ::testing::Test {
 protected:
  // top <- middle <- bottom: each the base of the next.
  void SetUp() override {
    middle->setBase(top.get());
    bottom->setBase(middle.get());
  }

  Journal journal;
  RefPtr<LS_IElement> top = makeElement();
  RefPtr<LS_IElement> middle = makeElement();
  RefPtr<LS_IElement> bottom = makeElement();
};

TEST_F(ElementChainTest, ChangeOfTheInnermostBaseReachesTwoLevelsDownAsTheElementsOwnChange) {
  ElementRecorder watcher(journal, "bottom");
  bottom->addElementObserver(&watcher, 0);

  top->notifyChange();

  EXPECT_EQ(journal, Journal{"bottom:change"});
  EXPECT_EQ(watcher.lastSubject, bottom.get());
  bottom->removeElementObserver(&watcher);
}

TEST_F(ElementChainTest, NotifyDestroyingCutsEveryBasedElementLoose) {
  RefPtr<LS_IElement> sibling = makeElement();
  sibling->setBase(top.get());

  top->notifyDestroying();

  RefPtr<LS_IElement> base;
  EXPECT_TRUE(middle->getBase(base).isFailure());
  EXPECT_EQ(base.get(), nullptr);
  EXPECT_TRUE(sibling->getBase(base).isFailure());
  EXPECT_TRUE(bottom->getBase(base).isSuccess()) << "only the direct followers let go";
  ElementRecorder watcher(journal, "middle");
  middle->addElementObserver(&watcher, 0);
  top->notifyChange();
  EXPECT_TRUE(journal.empty());
  middle->removeElementObserver(&watcher);
}

TEST_F(ElementChainTest, ElementGoingAwayLeavesItsBasesObserverList) {
  bottom = nullptr;  // the last reference: bottom must unregister from middle
  ElementRecorder watcher(journal, "middle");
  middle->addElementObserver(&watcher, 0);
  top->notifyChange();
  EXPECT_EQ(journal, Journal{"middle:change"});
  middle->removeElementObserver(&watcher);
}

TEST_F(ElementChainTest, GetBaseIfAnswersTheBasesInterfaces) {
  RefPtr<LS_IElement> base;
  ASSERT_TRUE(LS_getBaseIf(bottom.get(), base).isSuccess());
  EXPECT_EQ(base.get(), middle.get());

  RefPtr<LS_IContainer> container = makeContainer();
  EXPECT_TRUE(LS_getBaseIf(bottom.get(), container).isFailure());
  EXPECT_EQ(container.get(), nullptr);
  EXPECT_TRUE(LS_getBaseIf(top.get(), base).isFailure());
  EXPECT_EQ(base.get(), nullptr);
}

TEST(ElementBaseTest, SetBaseIfWithAnObjectThatIsNoElementFailsAndKeepsTheBase) {
  RefPtr<LS_IElement> base = makeElement();
  RefPtr<LS_IElement> element = makeElement();
  element->setBase(base.get());
  Journal journal;
  RefPtr<ContainerRecorder> stranger = adoptRef(new ContainerRecorder(journal, "x"));

  RefPtr<IUnknown> strangerObject;
  stranger->queryIf(strangerObject);

  EXPECT_TRUE(element->setBaseIf(strangerObject.get()).isFailure());

  RefPtr<LS_IElement> kept;
  element->getBase(kept);
  EXPECT_EQ(kept.get(), base.get());
  EXPECT_TRUE(element->setBaseIf(nullptr).isSuccess());
  EXPECT_TRUE(element->getBase(kept).isFailure());
}

TEST(ElementBaseTest, SettingTheCurrentBaseAgainOnlyLogs) {
  RefPtr<LS_IElement> base = makeElement();
  RefPtr<LS_IElement> element = makeElement();
  element->setBase(base.get());
  LogCapture log;

  element->setBase(base.get());
  element->setBase(base.get());

  std::string const line =
      formatted("LS_CElement(%p)::setBase(%p)\n", LS_ptr(element.get()), LS_ptr(base.get()));
  EXPECT_EQ(log.lines(), (std::vector<std::string>{line, line}));
  Journal journal;
  ElementRecorder watcher(journal, "e");
  element->addElementObserver(&watcher, 0);
  base->notifyChange();
  EXPECT_EQ(journal, Journal{"e:change"}) << "registered with the base once";
  element->removeElementObserver(&watcher);
}

TEST(ElementLogTest, NotificationsWriteTheirLines) {
  RefPtr<LS_IElement> element = makeElement();
  Journal journal;
  ElementRecorder watcher(journal, "e");
  LogCapture log;

  element->addElementObserver(&watcher, 0);
  element->notifyChange();
  element->notifyDestroying();
  element->removeElementObserver(&watcher);

  void const* self = LS_ptr(element.get());
  EXPECT_EQ(log.lines(), (std::vector<std::string>{
                             formatted("LS_CElement(%p)::addElementObserver(%p)", self, LS_ptr(&watcher)),
                             formatted("LS_CElement(%p)::notifyChange()\n", self),
                             formatted("LS_CElement(%p)::notifyDestroying()\n", self),
                             formatted("LS_CElement(%p)::removeElementObserver(%p)", self, LS_ptr(&watcher)),
                         }));
}

INSTANTIATE_TEST_SUITE_P(Element,
                         QueryInterfaceContract,
                         ::testing::Values(ContractClass{
                             "PlainElement",
                             [] { return static_cast<IUnknown*>(makeElement().leakRef()); },
                             {ADVERTISED(IUnknown), ADVERTISED(LS_IElement)},
                             {&LS_IContainer::IID()}}),
                         contractRowName);

}  // namespace
