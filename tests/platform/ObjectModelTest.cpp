#include "CInherit.h"

#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "IUnknown.h"

namespace {

class ITestFirst : public IUnknown {
 public:
  static UUID const& IID() {
    static UUID const id("8f135d15-d700-45bd-add3-63595c7723cb", "ITestFirst");
    return id;
  }
  virtual int first() const = 0;

 protected:
  ~ITestFirst() = default;
};

class ITestSecond : public IUnknown {
 public:
  static UUID const& IID() {
    static UUID const id("b54f1f3d-ac96-4ca7-9ba8-ed9bc6cb7e9d", "ITestSecond");
    return id;
  }
  virtual int second() const = 0;

 protected:
  ~ITestSecond() = default;
};

std::atomic<int> g_destroyed{0};

class CFirst : public CInherit<CFirst, CObject, ITestFirst> {
 public:
  CFirst() = default;
  ~CFirst() override { ++g_destroyed; }
  int first() const override { return 1; }
};

// Derives from another CInherit class: the base's interfaces must still answer.
class CFirstSecond : public CInherit<CFirstSecond, CFirst, ITestSecond> {
 public:
  int second() const override { return 2; }
};

// The count an object has now, observed through addRef's answer.
template <class T>
unsigned int countOf(T* object) {
  unsigned int const count = object->addRef() - 1;
  object->release();
  return count;
}

struct ObjectModelCase {
  char const* name;
  std::function<IUnknown*()> make;  // a new object, count 1, as IUnknown
  std::vector<UUID const*> answered;
};

class QueryInterfaceContract : public testing::TestWithParam<ObjectModelCase> {
 protected:
  void SetUp() override { m_object = GetParam().make(); }
  void TearDown() override { m_object->release(); }

  IUnknown* m_object = nullptr;
};

// Every interface pointer derives from IUnknown first, so each can be asked for IUnknown again.
TEST_P(QueryInterfaceContract, EachAdvertisedInterfaceAnswersWithAReferenceAddedAndOneIdentity) {
  void* identity = nullptr;
  ASSERT_TRUE(m_object->queryInterface(IUnknown::IID(), &identity).isSuccess());
  RefPtr<IUnknown> const holdIdentity = adoptRef(static_cast<IUnknown*>(identity));
  for (UUID const* iid : GetParam().answered) {
    void* raw = nullptr;
    ASSERT_TRUE(m_object->queryInterface(*iid, &raw).isSuccess()) << iid->name();
    RefPtr<IUnknown> const asked = adoptRef(static_cast<IUnknown*>(raw));
    EXPECT_EQ(countOf(m_object), 3u) << iid->name();
    void* again = nullptr;
    ASSERT_TRUE(asked->queryInterface(IUnknown::IID(), &again).isSuccess());
    EXPECT_EQ(again, identity) << iid->name();
    static_cast<IUnknown*>(again)->release();
  }
}

TEST_P(QueryInterfaceContract, UnknownIdentifierFailsAndStoresNull) {
  void* raw = this;
  EXPECT_TRUE(
      m_object->queryInterface(UUID("d9d777fe-fe4c-4041-b0a5-79558940e228", "INobody"), &raw).isFailure());
  EXPECT_EQ(raw, nullptr);
  EXPECT_EQ(countOf(m_object), 1u);
}

INSTANTIATE_TEST_SUITE_P(
    Classes,
    QueryInterfaceContract,
    testing::Values(
        ObjectModelCase{"CObject", [] { return static_cast<IUnknown*>(new CObject); }, {&IUnknown::IID()}},
        ObjectModelCase{"CInheritOneInterface",
                        [] { return static_cast<IUnknown*>(static_cast<ITestFirst*>(new CFirst)); },
                        {&IUnknown::IID(), &ITestFirst::IID()}},
        ObjectModelCase{"CInheritOverCInherit",
                        [] { return static_cast<IUnknown*>(static_cast<ITestSecond*>(new CFirstSecond)); },
                        {&IUnknown::IID(), &ITestFirst::IID(), &ITestSecond::IID()}}),
    [](testing::TestParamInfo<ObjectModelCase> const& info) { return std::string(info.param.name); });

TEST(ObjectLifetime, CountStartsAtOneAndTheLastReleaseDestroys) {
  g_destroyed = 0;
  RefPtr<CFirst> object = adoptRef(new CFirst);
  EXPECT_EQ(countOf(object.get()), 1u);
  RefPtr<ITestFirst> second;
  ASSERT_TRUE(object->queryIf(second).isSuccess());
  object = nullptr;
  EXPECT_EQ(g_destroyed, 0);
  EXPECT_EQ(second->first(), 1);
  second = nullptr;
  EXPECT_EQ(g_destroyed, 1);
}

TEST(ObjectLifetime, CountingFromSeveralThreadsIsAtomic) {
  g_destroyed = 0;
  CFirst* const object = new CFirst;
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([object] {
      for (int i = 0; i < 20000; ++i) {
        object->addRef();
        object->release();
      }
    });
  }
  for (std::thread& thread : threads)
    thread.join();
  EXPECT_EQ(g_destroyed, 0);
  EXPECT_EQ(countOf(object), 1u);
  object->release();
  EXPECT_EQ(g_destroyed, 1);
}

TEST(ObjectLifetime, TypedQueryOfAMissingInterfaceEmptiesTheReference) {
  RefPtr<CFirst> object = adoptRef(new CFirst);
  RefPtr<ITestSecond> second = adoptRef(static_cast<ITestSecond*>(new CFirstSecond));
  EXPECT_TRUE(object->queryIf(second).isFailure());
  EXPECT_FALSE(second);
}

}  // namespace
