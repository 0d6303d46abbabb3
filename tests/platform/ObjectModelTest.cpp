#include "CInherit.h"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "IUnknown.h"
#include "QueryInterfaceContract.h"

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

INSTANTIATE_TEST_SUITE_P(
    Classes,
    QueryInterfaceContract,
    testing::Values(ContractClass{"CObject",
                                  [] { return static_cast<IUnknown*>(new CObject); },
                                  {ADVERTISED(IUnknown)},
                                  {&ITestFirst::IID()}},
                    ContractClass{"CInheritOneInterface",
                                  [] { return static_cast<IUnknown*>(static_cast<ITestFirst*>(new CFirst)); },
                                  {ADVERTISED(IUnknown), ADVERTISED(ITestFirst)},
                                  {&ITestSecond::IID()}},
                    ContractClass{
                        "CInheritOverCInherit",
                        [] { return static_cast<IUnknown*>(static_cast<ITestSecond*>(new CFirstSecond)); },
                        {ADVERTISED(IUnknown), ADVERTISED(ITestFirst), ADVERTISED(ITestSecond)},
                        {}}),
    contractRowName);

TEST(ObjectLifetime, CountStartsAtOneAndTheLastReleaseDestroys) {
  g_destroyed = 0;
  RefPtr<CFirst> object = adoptRef(new CFirst);
  EXPECT_EQ(countOf(static_cast<ITestFirst*>(object.get())), 1u);
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
  EXPECT_EQ(countOf(static_cast<ITestFirst*>(object)), 1u);
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
