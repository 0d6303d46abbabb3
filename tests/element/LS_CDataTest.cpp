#include "LS_CData.h"

#include <gtest/gtest.h>

#include "CHostPort.h"
#include "LS_Alias.h"
#include "LS_ForcedDestination.h"
#include "LS_KeepAliveMethod.h"
#include "LS_LifetimeRange.h"
#include "LS_MwiSubscriptionMode.h"
#include "LS_NatTraversalMethod.h"
#include "LS_ProtocolConfig.h"
#include "LS_Proxy.h"
#include "LS_RegistrationMode.h"
#include "LS_UriScheme.h"
#include "LS_User.h"
#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

namespace {

// An identity-like pair: derived inherits from base.
class DataValueTest : public ::testing::Test {
 protected:
  void SetUp() override { derived->setBase(base.get()); }

  String read(LS_IContainer const* container, LS_Strategy::Type strategy) {
    String value("<none>");
    LS_getDataElement(container, "display-name", strategy, value);
    return value;
  }

  Journal journal;
  RefPtr<TestContainer> base = makeContainer();
  RefPtr<TestContainer> derived = makeContainer();
};

TEST_F(DataValueTest, InheritedValueIsSeenByLocalOrBaseAndBaseOnlyButNotLocalOnly) {
  LS_setDataElement<String>(base.get(), "display-name", "Base");

  EXPECT_EQ(read(derived.get(), LS_Strategy::LOCAL_OR_BASE), "Base");
  EXPECT_EQ(read(derived.get(), LS_Strategy::BASE_ONLY), "Base");
  EXPECT_EQ(read(derived.get(), LS_Strategy::LOCAL_ONLY), "<none>");
}

TEST_F(DataValueTest, LocalValueOverridesAndHidesLaterChangesOfTheBase) {
  LS_setDataElement<String>(base.get(), "display-name", "Base");
  LS_setDataElement<String>(derived.get(), "display-name", "Derived");
  ContainerWatch watch(derived.get(), journal, "derived");

  LS_setDataElement<String>(base.get(), "display-name", "Base 2");

  EXPECT_EQ(read(derived.get(), LS_Strategy::LOCAL_OR_BASE), "Derived");
  EXPECT_EQ(read(derived.get(), LS_Strategy::BASE_ONLY), "<none>");
  EXPECT_TRUE(journal.empty());
}

TEST_F(DataValueTest, RemovingTheLocalValueShowsTheBaseAndResumesPropagation) {
  LS_setDataElement<String>(base.get(), "display-name", "Base");
  LS_setDataElement<String>(derived.get(), "display-name", "Derived");
  derived->removeElement("display-name");
  ContainerWatch watch(derived.get(), journal, "derived");

  LS_setDataElement<String>(base.get(), "display-name", "Base 2");

  EXPECT_EQ(read(derived.get(), LS_Strategy::LOCAL_OR_BASE), "Base 2");
  EXPECT_EQ(journal, (Journal{"derived:change:display-name", "derived:change"}));
}

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

// Every type the model stores as a single value: written on a base, read
// through the derived container, overridden there without touching the base.
template <class T>
class StoredTypeTest : public ::testing::Test {};

template <class T>
struct Sample;
template <>
struct Sample<String> {
  static String first() { return "a"; }
  static String second() { return "b"; }
};
template <>
struct Sample<bool> {
  static bool first() { return true; }
  static bool second() { return false; }
};
template <>
struct Sample<unsigned int> {
  static unsigned int first() { return 4294967295u; }
  static unsigned int second() { return 0; }
};
template <>
struct Sample<CHostPort> {
  static CHostPort first() { return CHostPort("a.example", 5060); }
  static CHostPort second() { return CHostPort("a.example", 5061); }
};
template <>
struct Sample<LS_Proxy> {
  static LS_Proxy first() { return LS_Proxy(Sample<CHostPort>::first(), CHostPort(), false); }
  static LS_Proxy second() { return LS_Proxy(Sample<CHostPort>::first(), CHostPort(), true); }
};
template <>
struct Sample<LS_ForcedDestination> {
  static LS_ForcedDestination first() { return LS_ForcedDestination(); }
  static LS_ForcedDestination second() {
    LS_ForcedDestination destination;
    destination.type = LS_ForcedDestination::REGISTRAR_ADDRESS;
    return destination;
  }
};
template <>
struct Sample<LS_LifetimeRange> {
  static LS_LifetimeRange first() { return LS_LifetimeRange{1, 2, 3}; }
  static LS_LifetimeRange second() { return LS_LifetimeRange{1, 2, 4}; }
};
template <class Enumeration>
struct EnumerationSample {
  static Enumeration first() { return static_cast<Enumeration>(1); }
  static Enumeration second() { return static_cast<Enumeration>(2); }
};
template <>
struct Sample<LS_User::Type> : EnumerationSample<LS_User::Type> {};
template <>
struct Sample<LS_MwiSubscriptionMode::Type> : EnumerationSample<LS_MwiSubscriptionMode::Type> {};
template <>
struct Sample<LS_ProtocolConfig::Type> : EnumerationSample<LS_ProtocolConfig::Type> {};
template <>
struct Sample<LS_RegistrationMode::Type> : EnumerationSample<LS_RegistrationMode::Type> {};
template <>
struct Sample<LS_UriScheme::Type> : EnumerationSample<LS_UriScheme::Type> {};
template <>
struct Sample<LS_NatTraversalMethod::Type> : EnumerationSample<LS_NatTraversalMethod::Type> {};
template <>
struct Sample<LS_KeepAliveMethod::Type> : EnumerationSample<LS_KeepAliveMethod::Type> {};

using StoredTypes = ::testing::Types<String,
                                     bool,
                                     unsigned int,
                                     CHostPort,
                                     LS_Proxy,
                                     LS_ForcedDestination,
                                     LS_LifetimeRange,
                                     LS_User::Type,
                                     LS_MwiSubscriptionMode::Type,
                                     LS_ProtocolConfig::Type,
                                     LS_RegistrationMode::Type,
                                     LS_UriScheme::Type,
                                     LS_NatTraversalMethod::Type,
                                     LS_KeepAliveMethod::Type>;
TYPED_TEST_SUITE(StoredTypeTest, StoredTypes);

TYPED_TEST(StoredTypeTest, InheritsAndOverridesWithoutTouchingTheBase) {
  RefPtr<TestContainer> base = makeContainer();
  RefPtr<TestContainer> derived = makeContainer();
  derived->setBase(base.get());
  LS_setDataElement(base.get(), "value", Sample<TypeParam>::first());

  TypeParam value = Sample<TypeParam>::second();
  ASSERT_TRUE(LS_getDataElement(derived.get(), "value", LS_Strategy::LOCAL_OR_BASE, value).isSuccess());
  EXPECT_TRUE(value == Sample<TypeParam>::first());

  LS_setDataElement(derived.get(), "value", Sample<TypeParam>::second());
  LS_getDataElement(derived.get(), "value", LS_Strategy::LOCAL_OR_BASE, value);
  EXPECT_TRUE(value == Sample<TypeParam>::second());
  LS_getDataElement(base.get(), "value", LS_Strategy::LOCAL_OR_BASE, value);
  EXPECT_TRUE(value == Sample<TypeParam>::first());
}

TEST(StoredRecordTest, AliasRecordStartsEmptyAndIsEditedInPlace) {
  RefPtr<TestContainer> container = makeContainer();
  LS_Alias* alias = nullptr;
  ASSERT_TRUE(LS_createDataElementPointer(container.get(), "alias", alias).isSuccess());
  EXPECT_TRUE(alias->names.isEmpty() && alias->ranges.isEmpty() && alias->expressions.isEmpty() &&
              alias->patterns.isEmpty());
  alias->names.add("x");
  LS_Alias const* shown = nullptr;
  ASSERT_TRUE(LS_getDataElementPointer(container.get(), "alias", LS_Strategy::LOCAL_ONLY, shown).isSuccess());
  EXPECT_EQ(shown->names[0], "x");
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
