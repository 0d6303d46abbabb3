#include "LS_InterfaceIdentifiers.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <set>
#include <string>
#include <vector>

#include "LS_ClassIdentifiers.h"

namespace {

using Accessor = UUID const& (*)();
using MethodNameFn = char const* (*)(uint32_t);

template <class Record>
char const* nameIn(uint32_t id) {
  return Record::MID::NAME(static_cast<typename Record::MID::Type>(id));
}

struct InterfaceRow {
  Accessor iid;
  Accessor proxy;
  Accessor stub;
  MethodNameFn methodName;
  unsigned int methods;
};

template <class Holder>
InterfaceRow row(unsigned int methods) {
  return {Holder::IID, Holder::CID_PROXY, Holder::CID_STUB, nameIn<Holder>, methods};
}

std::vector<InterfaceRow> const kInterfaces = {row<LS_IAuthenticationIdentifiers>(2),
                                               row<LS_IAuthenticationConfigIdentifiers>(8),
                                               row<LS_IAuthenticationServiceIdentifiers>(15),
                                               row<LS_ICallIdentifiers>(3),
                                               row<LS_ICallConfigIdentifiers>(9),
                                               row<LS_IContainerIdentifiers>(8),
                                               row<LS_IContainerObserverIdentifiers>(3),
                                               row<LS_IElementIdentifiers>(10),
                                               row<LS_IIdentityIdentifiers>(19),
                                               row<LS_IIdentityConfigIdentifiers>(34),
                                               row<LS_IInboundIdentifiers>(2),
                                               row<LS_IInboundConfigIdentifiers>(5),
                                               row<LS_ILocationServiceIdentifiers>(10),
                                               row<LS_ILocationServiceSubjectIdentifiers>(2),
                                               row<LS_ILocationServiceConfigIdentifiers>(16),
                                               row<LS_IMasterAuthenticationServiceIdentifiers>(4),
                                               row<LS_IMasterLocationServiceIdentifiers>(4),
                                               row<LS_IMasterLocationServiceSubjectIdentifiers>(2),
                                               row<LS_IMwiSubscriptionIdentifiers>(10),
                                               row<LS_IMwiSubscriptionSubjectIdentifiers>(2),
                                               row<LS_IMwiSubscriptionConfigIdentifiers>(18),
                                               row<LS_IOutboundIdentifiers>(13),
                                               row<LS_IOutboundConfigIdentifiers>(32),
                                               row<LS_IRegistrationInboundIdentifiers>(6),
                                               row<LS_IRegistrationInboundSubjectIdentifiers>(2),
                                               row<LS_IRegistrationInboundConfigIdentifiers>(7),
                                               row<LS_IRegistrationOutboundIdentifiers>(19),
                                               row<LS_IRegistrationOutboundSubjectIdentifiers>(2),
                                               row<LS_IRegistrationOutboundConfigIdentifiers>(39)};

// Every published identifier: the three of each interface, then the class and driver identifiers.
std::vector<UUID const*> allIdentifiers() {
  std::vector<UUID const*> ids;
  for (InterfaceRow const& row : kInterfaces) {
    for (Accessor accessor : {row.iid, row.proxy, row.stub})
      ids.push_back(&accessor());
  }
  for (Accessor accessor :
       {CID_LS_Data, CID_LS_AppendList, CID_LS_Authentication, CID_LS_RegistrationOutbound,
        CID_LS_RegistrationInbound, CID_LS_MessageSubscription, CID_LS_CallOutbound, CID_LS_CallInbound,
        CID_LS_Identity, CID_LS_LocationService, CID_LS_MasterLocationService, CID_LS_AuthenticationService,
        CID_LS_MasterAuthenticationService, DID_MasterLocationService, DID_MasterAuthenticationService})
    ids.push_back(&accessor());
  return ids;
}

bool endsWith(std::string const& text, std::string const& suffix) {
  return text.size() >= suffix.size() &&
         text.compare(text.size() - suffix.size(), suffix.size(), suffix) == 0;
}

TEST(PublishedIdentifiers, AreDistinctVersionFourAndTheSameObjectOnEveryCall) {
  std::vector<UUID const*> const ids = allIdentifiers();
  ASSERT_EQ(ids.size(), 29u * 3u + 15u);
  EXPECT_EQ(allIdentifiers(), ids);
  std::set<std::string> seen;
  for (UUID const* id : ids) {
    EXPECT_TRUE(seen.insert(std::string(reinterpret_cast<char const*>(id->bytes()), 16)).second)
        << id->name();
    // Byte 7 is the high byte of the third group, stored little-endian.
    EXPECT_EQ(id->bytes()[7] >> 4, 4) << id->name();
  }
}

TEST(PublishedIdentifiers, ProxyAndStubOfAnInterfaceShareOneStem) {
  for (InterfaceRow const& row : kInterfaces) {
    std::string const proxy = row.proxy().name();
    std::string const stub = row.stub().name();
    EXPECT_EQ(std::string(row.iid().name()).rfind("LS_I", 0), 0u) << row.iid().name();
    ASSERT_TRUE(endsWith(proxy, "Proxy")) << proxy;
    ASSERT_TRUE(endsWith(stub, "Stub")) << stub;
    EXPECT_EQ(proxy.substr(0, proxy.size() - 5), stub.substr(0, stub.size() - 4));
  }
}

struct IdentifierRow {
  Accessor accessor;
  char const* text;
  char const* name;
};

// Spot values: the byte layout, the accessor-named class and driver identifiers, and the odd registered
// names.
std::vector<IdentifierRow> const kSpotIdentifiers = {
    {LS_IElementIdentifiers::IID, "192df9cc-169c-4a4e-9476-0f540f99c22c", "LS_IElement"},
    {LS_IIdentityIdentifiers::CID_PROXY, "893dca14-7bab-4186-9001-452cf3cf5dd9", "LS_ICdentityProxy"},
    {LS_IIdentityConfigIdentifiers::CID_STUB, "064d6a50-ded7-4bb5-b4ae-0f4534c270f7",
     "LS_ICdentityConfigStub"},
    {LS_IRegistrationInboundConfigIdentifiers::CID_PROXY, "59cf27f3-6570-4600-8b56-5481f795dff0",
     "LS_IRegistrationCnboundConfigProxy"},
    {CID_LS_Data, "b2b53df7-9b4e-4b87-91bc-b17ce42776d5", "CID_LS_Data"},
    {CID_LS_MasterAuthenticationService, "f4946952-0b3e-4c63-9e44-0d9cd98f8c15",
     "CID_LS_MasterAuthenticationService"},
    {DID_MasterLocationService, "ae0010e5-648d-415f-9c83-2003bd677420", "DID_MasterLocationService"},
};

TEST(PublishedIdentifiers, SpotValuesHoldTheBytesOfTheirTextAndTheirName) {
  for (IdentifierRow const& row : kSpotIdentifiers) {
    EXPECT_EQ(row.accessor(), UUID(row.text, "")) << row.name;
    EXPECT_STREQ(row.accessor().name(), row.name);
  }
}

// Identifiers are grouped by hundreds and stay below 3000.
TEST(MethodTables, NameExactlyTheirMethodsAndNothingAtTheLargestIdentifier) {
  for (InterfaceRow const& row : kInterfaces) {
    unsigned int named = 0;
    for (uint32_t id = 0; id <= 3000; ++id)
      named += row.methodName(id) != nullptr;
    EXPECT_EQ(named, row.methods) << row.iid().name();
    EXPECT_EQ(row.methodName(UINT32_MAX), nullptr) << row.iid().name();
  }
}

using IdentityConfig = LS_IIdentityConfigIdentifiers;
using OutboundConfig = LS_IOutboundConfigIdentifiers;
using RegistrationOutboundConfig = LS_IRegistrationOutboundConfigIdentifiers;

struct NamedMethodRow {
  MethodNameFn name;
  uint32_t enumerator;
  uint32_t id;
  char const* expected;  // null for a gap
};

// Rows at group edges and around gaps, where a shifted number would show.
TEST(MethodTables, NameGroupEdgesByTheirPublishedNumberAndLeaveGapsUnnamed) {
  std::vector<NamedMethodRow> const rows = {
      {nameIn<IdentityConfig>, IdentityConfig::MID::addConfigAliasRange, 406, "addConfigAliasRange"},
      {nameIn<IdentityConfig>, 0, 407, nullptr},
      {nameIn<IdentityConfig>, IdentityConfig::MID::createConfigFaceIf, 1001, "createConfigFaceIf"},
      {nameIn<IdentityConfig>, 0, 1999, nullptr},
      {nameIn<IdentityConfig>, IdentityConfig::MID::isNoIdentityConfigLoop, 2000, "isNoIdentityConfigLoop"},
      {nameIn<OutboundConfig>, 0, 300, nullptr},
      {nameIn<OutboundConfig>, OutboundConfig::MID::setConfigTrafficClass, 301, "setConfigTrafficClass"},
      {nameIn<RegistrationOutboundConfig>, 0, 703, nullptr},
      {nameIn<LS_IRegistrationOutboundIdentifiers>,
       LS_IRegistrationOutboundIdentifiers::MID::getKeepAliveInterval, 803, "getKeepAliveInterval"},
      {nameIn<LS_IElementIdentifiers>, 0, 0, nullptr},
      {nameIn<LS_IElementIdentifiers>, LS_IElementIdentifiers::MID::isDynamic, 501, "isDynamic"},
  };
  for (NamedMethodRow const& row : rows) {
    if (row.expected) {
      EXPECT_EQ(row.enumerator, row.id) << row.expected;
      EXPECT_STREQ(row.name(row.id), row.expected);
      continue;
    }
    EXPECT_EQ(row.name(row.id), nullptr) << row.id;
  }
}

}  // namespace
