// The queryInterface contract every class of the object model keeps: each
// advertised interface answers with one reference added and leads back to one
// IUnknown, and an identifier the class does not implement fails, stores null
// and adds no reference. A test file instantiates QueryInterfaceContract with
// one row per class.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include "IUnknown.h"

struct AdvertisedInterface {
  char const* name;
  UUID const& (*iid)();
  IUnknown* (*asUnknown)(void* raw);  // the stored interface pointer as its IUnknown
};

template <class T>
AdvertisedInterface advertised(char const* name) {
  return {name, &T::IID, [](void* raw) { return static_cast<IUnknown*>(static_cast<T*>(raw)); }};
}
#define ADVERTISED(T) advertised<T>(#T)

struct ContractClass {
  std::string name;
  std::function<IUnknown*()> make;  // a new object, count 1, as its IUnknown
  std::vector<AdvertisedInterface> interfaces;
  std::vector<UUID const*> refused;  // besides the nil identifier and a stranger's
};

inline void PrintTo(ContractClass const& row, std::ostream* out) {
  *out << row.name;
}

// The count an object has now, observed through addRef's answer.
inline unsigned int countOf(IUnknown* object) {
  unsigned int const count = object->addRef() - 1;
  object->release();
  return count;
}

// The object's IUnknown as a pointer value only: the reference is given back.
inline IUnknown* identityOf(IUnknown* object) {
  void* raw = nullptr;
  EXPECT_TRUE(object->queryInterface(IUnknown::IID(), &raw).isSuccess());
  auto* const identity = static_cast<IUnknown*>(raw);
  if (identity)
    identity->release();
  return identity;
}

class QueryInterfaceContract : public ::testing::TestWithParam<ContractClass> {
 protected:
  void SetUp() override { m_object = GetParam().make(); }
  void TearDown() override { m_object->release(); }

  IUnknown* m_object = nullptr;
};

TEST_P(QueryInterfaceContract, EachAdvertisedInterfaceAnswersWithAReferenceAddedAndOneIdentity) {
  IUnknown* const identity = identityOf(m_object);
  ASSERT_NE(identity, nullptr);
  unsigned int const count = countOf(m_object);
  for (AdvertisedInterface const& entry : GetParam().interfaces) {
    void* raw = nullptr;
    ASSERT_TRUE(m_object->queryInterface(entry.iid(), &raw).isSuccess()) << entry.name;
    ASSERT_NE(raw, nullptr) << entry.name;
    IUnknown* const asked = entry.asUnknown(raw);
    EXPECT_EQ(countOf(m_object), count + 1) << entry.name;
    EXPECT_EQ(identityOf(asked), identity) << entry.name;
    asked->release();
  }
}

TEST_P(QueryInterfaceContract, UnknownIdentifierFailsStoresNullAndAddsNoReference) {
  unsigned int const count = countOf(m_object);
  UUID const nil;
  UUID const stranger("d9d777fe-fe4c-4041-b0a5-79558940e228", "INobody");
  std::vector<UUID const*> refused = GetParam().refused;
  refused.insert(refused.end(), {&nil, &stranger});
  for (UUID const* iid : refused) {
    void* raw = this;
    EXPECT_TRUE(m_object->queryInterface(*iid, &raw).isFailure()) << iid->name();
    EXPECT_EQ(raw, nullptr) << iid->name();
  }
  EXPECT_EQ(countOf(m_object), count);
}

inline std::string contractRowName(::testing::TestParamInfo<ContractClass> const& info) {
  return info.param.name;
}
