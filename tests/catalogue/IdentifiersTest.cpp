#include "LS_InterfaceIdentifiers.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <set>
#include <string>
#include <vector>

#include "LS_ClassIdentifiers.h"

namespace {

struct IdentifierRow {
  UUID const& (*accessor)();
  char const* text;
  char const* name;
};

// Every published identifier: the three of each interface, then the class
// and driver identifiers.
std::vector<IdentifierRow> const kIdentifiers = {
    {LS_IAuthenticationIdentifiers::IID, "d650c50f-2caa-4ae3-b42c-de4a12a8b869", "LS_IAuthentication"},
    {LS_IAuthenticationIdentifiers::CID_PROXY, "544e59d2-82aa-49f2-aa85-9ad93f148544",
     "LS_CAuthenticationProxy"},
    {LS_IAuthenticationIdentifiers::CID_STUB, "f2f1d427-843f-4378-a805-d76de78b0061",
     "LS_CAuthenticationStub"},
    {LS_IAuthenticationConfigIdentifiers::IID, "e00f23c2-b2ec-4605-ade5-2f0dc2080a2b",
     "LS_IAuthenticationConfig"},
    {LS_IAuthenticationConfigIdentifiers::CID_PROXY, "490aa9ad-307d-412b-9776-ead9ece132ae",
     "LS_CAuthenticationConfigProxy"},
    {LS_IAuthenticationConfigIdentifiers::CID_STUB, "9cd81810-84cf-40c7-863f-f3c9d0a563fa",
     "LS_CAuthenticationConfigStub"},
    {LS_IAuthenticationServiceIdentifiers::IID, "8cbe2987-1c3c-47e9-bd93-a1509a1ef7a6",
     "LS_IAuthenticationService"},
    {LS_IAuthenticationServiceIdentifiers::CID_PROXY, "d1e5f625-7f57-43a1-82fb-b23b7c14780b",
     "LS_CAuthenticationServiceProxy"},
    {LS_IAuthenticationServiceIdentifiers::CID_STUB, "d66763e8-c28e-4129-911d-8b33db20cdbb",
     "LS_CAuthenticationServiceStub"},
    {LS_ICallIdentifiers::IID, "f3a1517e-f41e-420b-b80c-43ae57e54031", "LS_ICall"},
    {LS_ICallIdentifiers::CID_PROXY, "c4acff4d-8951-4bf4-b58f-ae743ebc2061", "LS_CCallProxy"},
    {LS_ICallIdentifiers::CID_STUB, "9101752d-7169-47e6-affa-8936fdfa712d", "LS_CCallStub"},
    {LS_ICallConfigIdentifiers::IID, "5116b22d-f4f8-491d-98b0-b7d7a9078fdc", "LS_ICallConfig"},
    {LS_ICallConfigIdentifiers::CID_PROXY, "1f4ef1f5-d0f1-4229-81cd-24f663fcafc4", "LS_CCallConfigProxy"},
    {LS_ICallConfigIdentifiers::CID_STUB, "4d9b89e2-0593-4fb8-b372-bf4eb815171a", "LS_CCallConfigStub"},
    {LS_IContainerIdentifiers::IID, "13011f52-4170-406a-bc6b-b9c0de4ab44d", "LS_IContainer"},
    {LS_IContainerIdentifiers::CID_PROXY, "47b9a532-f1c1-47b1-8133-a04c6a093c7c", "LS_CContainerProxy"},
    {LS_IContainerIdentifiers::CID_STUB, "b896c133-cd3a-44be-9386-3d1d25232817", "LS_CContainerStub"},
    {LS_IContainerObserverIdentifiers::IID, "12b97c54-4d1a-4fbe-accb-c778e538f520", "LS_IContainerObserver"},
    {LS_IContainerObserverIdentifiers::CID_PROXY, "3f6a153a-25e4-41fd-9be9-92c0072fb35d",
     "LS_CContainerObserverProxy"},
    {LS_IContainerObserverIdentifiers::CID_STUB, "2a142159-dc10-4800-9f31-3a09e44743a7",
     "LS_CContainerObserverStub"},
    {LS_IElementIdentifiers::IID, "192df9cc-169c-4a4e-9476-0f540f99c22c", "LS_IElement"},
    {LS_IElementIdentifiers::CID_PROXY, "f177d737-9a67-4936-8046-0278f27fc5b5", "LS_CElementProxy"},
    {LS_IElementIdentifiers::CID_STUB, "dcd21598-b973-4223-b90c-99a801395ac0", "LS_CElementStub"},
    {LS_IIdentityIdentifiers::IID, "c3ef398b-2a86-4e6d-a47a-dd1631b250f0", "LS_IIdentity"},
    {LS_IIdentityIdentifiers::CID_PROXY, "893dca14-7bab-4186-9001-452cf3cf5dd9", "LS_ICdentityProxy"},
    {LS_IIdentityIdentifiers::CID_STUB, "fa4409d3-bc05-4371-9350-329c83b8969c", "LS_ICdentityStub"},
    {LS_IIdentityConfigIdentifiers::IID, "371c621a-6597-4771-8a96-ef30e99216af", "LS_IIdentityConfig"},
    {LS_IIdentityConfigIdentifiers::CID_PROXY, "27aaa396-b8c3-46c7-bb85-0cc348cef640",
     "LS_ICdentityConfigProxy"},
    {LS_IIdentityConfigIdentifiers::CID_STUB, "064d6a50-ded7-4bb5-b4ae-0f4534c270f7",
     "LS_ICdentityConfigStub"},
    {LS_IInboundIdentifiers::IID, "0d320f73-633b-4729-9a0d-467c8439f195", "LS_IInbound"},
    {LS_IInboundIdentifiers::CID_PROXY, "218087ec-438e-4c4d-ace0-891b8f417f08", "LS_CInboundProxy"},
    {LS_IInboundIdentifiers::CID_STUB, "9c83514e-94fe-4fd9-8d53-6a38bccd105a", "LS_CInboundStub"},
    {LS_IInboundConfigIdentifiers::IID, "f8a6a790-e473-4331-9aa9-152048dd028f", "LS_IInboundConfig"},
    {LS_IInboundConfigIdentifiers::CID_PROXY, "31def778-fcab-452e-b7ae-c4192159dce8",
     "LS_CInboundConfigProxy"},
    {LS_IInboundConfigIdentifiers::CID_STUB, "01ffa63f-d1ff-44c2-b111-cf23ae8e2194", "LS_CInboundConfigStub"},
    {LS_ILocationServiceIdentifiers::IID, "8ad5f38d-53cc-4a66-9e9d-555acd7296ad", "LS_ILocationService"},
    {LS_ILocationServiceIdentifiers::CID_PROXY, "e78cd4f1-67e7-4f96-867c-bd506ba00a2a",
     "LS_CLocationServiceProxy"},
    {LS_ILocationServiceIdentifiers::CID_STUB, "841e581c-68cd-4517-9162-c7d8249d7492",
     "LS_CLocationServiceStub"},
    {LS_ILocationServiceSubjectIdentifiers::IID, "3fb5dee4-250a-4865-844b-79e476b8e92d",
     "LS_ILocationServiceSubject"},
    {LS_ILocationServiceSubjectIdentifiers::CID_PROXY, "eb16cfb9-2e2c-4d74-b19f-0f6f7fdd6f9b",
     "LS_CLocationServiceSubjectProxy"},
    {LS_ILocationServiceSubjectIdentifiers::CID_STUB, "033dcb85-e5f4-40cb-b29d-f9c9ffb16970",
     "LS_CLocationServiceSubjectStub"},
    {LS_ILocationServiceConfigIdentifiers::IID, "41287446-8caf-4187-8b9b-e9add12cdb3a",
     "LS_ILocationServiceConfig"},
    {LS_ILocationServiceConfigIdentifiers::CID_PROXY, "c75f0620-c659-4e3a-bc3e-baeaccfa4df3",
     "LS_CLocationServiceConfigProxy"},
    {LS_ILocationServiceConfigIdentifiers::CID_STUB, "2badc9a6-c173-4a56-9f94-9ac4c2b2a824",
     "LS_CLocationServiceConfigStub"},
    {LS_IMasterAuthenticationServiceIdentifiers::IID, "bf7aa236-2d7b-44a0-96df-b0236239937f",
     "LS_IMasterAuthenticationService"},
    {LS_IMasterAuthenticationServiceIdentifiers::CID_PROXY, "082fb034-1e7e-4558-add4-9a2ea5a9342e",
     "LS_CMasterAuthenticationServiceProxy"},
    {LS_IMasterAuthenticationServiceIdentifiers::CID_STUB, "39af4c0a-b531-4d6a-b1c9-13e6a21a5d9d",
     "LS_CMasterAuthenticationServiceStub"},
    {LS_IMasterLocationServiceIdentifiers::IID, "bf1ffede-e116-46b6-bfd7-aef0c5bf684f",
     "LS_IMasterLocationService"},
    {LS_IMasterLocationServiceIdentifiers::CID_PROXY, "8ee7ffe1-bbac-490d-baf3-aea1c4e47ad2",
     "LS_CMasterLocationServiceProxy"},
    {LS_IMasterLocationServiceIdentifiers::CID_STUB, "4fbf304d-8ed5-4a54-9102-3f22d7636c65",
     "LS_CMasterLocationServiceStub"},
    {LS_IMasterLocationServiceSubjectIdentifiers::IID, "ac734464-695a-440b-979e-02e78aa877e1",
     "LS_IMasterLocationServiceSubject"},
    {LS_IMasterLocationServiceSubjectIdentifiers::CID_PROXY, "a7c81959-072b-47d9-93c1-bdab41f2627e",
     "LS_CMasterLocationServiceSubjectProxy"},
    {LS_IMasterLocationServiceSubjectIdentifiers::CID_STUB, "7f64d2cc-2f29-4044-aa54-28356ca587f4",
     "LS_CMasterLocationServiceSubjectStub"},
    {LS_IMwiSubscriptionIdentifiers::IID, "986c6a82-7fd4-406b-9967-16250c3a66ef", "LS_IMwiSubscription"},
    {LS_IMwiSubscriptionIdentifiers::CID_PROXY, "49a7ded6-b21f-4d20-81f2-7abcae7509cc",
     "LS_CMwiSubscriptionProxy"},
    {LS_IMwiSubscriptionIdentifiers::CID_STUB, "6a677c9a-2c3c-4555-bb10-6bf15376b481",
     "LS_CMwiSubscriptionStub"},
    {LS_IMwiSubscriptionSubjectIdentifiers::IID, "b5653402-694e-4a5a-b388-40cdf31dcb06",
     "LS_IMwiSubscriptionSubject"},
    {LS_IMwiSubscriptionSubjectIdentifiers::CID_PROXY, "b73f01ec-ae80-4903-8432-5ddba4b37edb",
     "LS_CMwiSubscriptionSubjectProxy"},
    {LS_IMwiSubscriptionSubjectIdentifiers::CID_STUB, "798b1595-19ac-46b7-a16f-667a352e869f",
     "LS_CMwiSubscriptionSubjectStub"},
    {LS_IMwiSubscriptionConfigIdentifiers::IID, "60ae7cdc-4445-432b-8ac9-8e98a7fc89be",
     "LS_IMwiSubscriptionConfig"},
    {LS_IMwiSubscriptionConfigIdentifiers::CID_PROXY, "bac13e80-cb89-4262-bac8-6b63c6600ac0",
     "LS_CMwiSubscriptionConfigProxy"},
    {LS_IMwiSubscriptionConfigIdentifiers::CID_STUB, "f507ff65-191a-4c56-9c32-7d35fe166cae",
     "LS_CMwiSubscriptionConfigStub"},
    {LS_IOutboundIdentifiers::IID, "c31d799b-887d-48ff-9d6a-0270f224e5a2", "LS_IOutbound"},
    {LS_IOutboundIdentifiers::CID_PROXY, "aeefa9e3-5642-4493-813d-ad2b0100a7aa", "LS_COutboundProxy"},
    {LS_IOutboundIdentifiers::CID_STUB, "44f0a1cf-176a-4a45-9c3d-8d597e7ed0da", "LS_COutboundStub"},
    {LS_IOutboundConfigIdentifiers::IID, "588a164a-2a55-4d1f-be6b-886b1900691a", "LS_IOutboundConfig"},
    {LS_IOutboundConfigIdentifiers::CID_PROXY, "1c23e2c2-af57-405d-a525-12be1f1165e1",
     "LS_COutboundConfigProxy"},
    {LS_IOutboundConfigIdentifiers::CID_STUB, "5ed10054-07e7-48ba-841a-13516192582d",
     "LS_COutboundConfigStub"},
    {LS_IRegistrationInboundIdentifiers::IID, "6bf7ae43-63e7-4a2e-823a-c4502320b907",
     "LS_IRegistrationInbound"},
    {LS_IRegistrationInboundIdentifiers::CID_PROXY, "bcf29703-8126-4c7d-9c95-a14289d20723",
     "LS_CRegistrationInboundProxy"},
    {LS_IRegistrationInboundIdentifiers::CID_STUB, "1e5ab370-fe1e-466c-9127-82e5f0492e27",
     "LS_CRegistrationInboundStub"},
    {LS_IRegistrationInboundSubjectIdentifiers::IID, "88e0402a-e946-4992-80b4-eac1c89dc2c3",
     "LS_IRegistrationInboundSubject"},
    {LS_IRegistrationInboundSubjectIdentifiers::CID_PROXY, "859ff305-02ca-40db-9d78-93961e90aed5",
     "LS_CRegistrationInboundSubjectProxy"},
    {LS_IRegistrationInboundSubjectIdentifiers::CID_STUB, "c0361e42-9065-42a3-93e6-37462ca9f006",
     "LS_CRegistrationInboundSubjectStub"},
    {LS_IRegistrationInboundConfigIdentifiers::IID, "9c57b5c2-7f13-445f-8094-4e18c494b01e",
     "LS_IRegistrationInboundConfig"},
    {LS_IRegistrationInboundConfigIdentifiers::CID_PROXY, "59cf27f3-6570-4600-8b56-5481f795dff0",
     "LS_IRegistrationCnboundConfigProxy"},
    {LS_IRegistrationInboundConfigIdentifiers::CID_STUB, "a0d1928f-569b-4949-b3fc-72bbad6aba33",
     "LS_IRegistrationCnboundConfigStub"},
    {LS_IRegistrationOutboundIdentifiers::IID, "c3a0ba89-7299-47b3-b961-204780670c72",
     "LS_IRegistrationOutbound"},
    {LS_IRegistrationOutboundIdentifiers::CID_PROXY, "28ecee40-f597-4fc5-aec6-6cec6b8d11aa",
     "LS_CRegistrationOutboundProxy"},
    {LS_IRegistrationOutboundIdentifiers::CID_STUB, "1448842b-8404-437f-8e52-e73e0612d762",
     "LS_CRegistrationOutboundStub"},
    {LS_IRegistrationOutboundSubjectIdentifiers::IID, "059f2383-c9e3-443a-ab56-1e86b7e77ab2",
     "LS_IRegistrationOutboundSubject"},
    {LS_IRegistrationOutboundSubjectIdentifiers::CID_PROXY, "ae50a4aa-8a98-4b54-8066-ee170ba2830a",
     "LS_CRegistrationOutboundSubjectProxy"},
    {LS_IRegistrationOutboundSubjectIdentifiers::CID_STUB, "68f612f7-4683-4d79-b29b-00ad581efd62",
     "LS_CRegistrationOutboundSubjectStub"},
    {LS_IRegistrationOutboundConfigIdentifiers::IID, "9d7771a6-0d7c-4bee-ace1-661931e8512e",
     "LS_IRegistrationOutboundConfig"},
    {LS_IRegistrationOutboundConfigIdentifiers::CID_PROXY, "117125e1-bf95-4fe5-962d-008685c7c15e",
     "LS_CRegistrationOutboundConfigProxy"},
    {LS_IRegistrationOutboundConfigIdentifiers::CID_STUB, "ecc16b58-c34a-4393-accf-d9195decd3a4",
     "LS_CRegistrationOutboundConfigStub"},
    {DID_MasterLocationService, "ae0010e5-648d-415f-9c83-2003bd677420", "DID_MasterLocationService"},
    {DID_MasterAuthenticationService, "b1cea50b-3642-4cef-a6f5-845eb242a05d",
     "DID_MasterAuthenticationService"},
    {CID_LS_Data, "b2b53df7-9b4e-4b87-91bc-b17ce42776d5", "CID_LS_Data"},
    {CID_LS_AppendList, "c55b31ef-4559-4920-99fd-623b2b9ffe48", "CID_LS_AppendList"},
    {CID_LS_Authentication, "d13ee0d1-5ea5-4f67-b639-14269517b322", "CID_LS_Authentication"},
    {CID_LS_RegistrationOutbound, "c307765b-7e9a-4f7b-b438-f0539f6d572f", "CID_LS_RegistrationOutbound"},
    {CID_LS_RegistrationInbound, "d6dfcf79-fea9-4fc8-b842-6741a1c698cb", "CID_LS_RegistrationInbound"},
    {CID_LS_MessageSubscription, "1e2061d8-352d-4bb0-b91f-ad634d38215b", "CID_LS_MessageSubscription"},
    {CID_LS_CallOutbound, "bc1383f5-e09b-443e-8b12-d293252129b5", "CID_LS_CallOutbound"},
    {CID_LS_CallInbound, "416be71a-1322-4a7b-a6f2-f8071abffb45", "CID_LS_CallInbound"},
    {CID_LS_Identity, "a4fd1732-f7f0-4460-99d3-de5e67113bc1", "CID_LS_Identity"},
    {CID_LS_LocationService, "35d8fb06-a9cb-46d5-9c03-1895e374a5aa", "CID_LS_LocationService"},
    {CID_LS_MasterLocationService, "1b7a1326-7611-4bd9-93be-c533d48741f3", "CID_LS_MasterLocationService"},
    {CID_LS_AuthenticationService, "eb3ca04d-b15a-47be-b5b8-7f269b8496c9", "CID_LS_AuthenticationService"},
    {CID_LS_MasterAuthenticationService, "f4946952-0b3e-4c63-9e44-0d9cd98f8c15",
     "CID_LS_MasterAuthenticationService"},
};

std::string bytesOf(UUID const& id) {
  return std::string(reinterpret_cast<char const*>(id.bytes()), 16);
}

class PublishedIdentifier : public ::testing::TestWithParam<IdentifierRow> {};

TEST_P(PublishedIdentifier, HoldsTheBytesOfItsText) {
  IdentifierRow const& row = GetParam();
  EXPECT_EQ(row.accessor(), UUID(row.text, "")) << row.name;
}

TEST_P(PublishedIdentifier, CarriesItsName) {
  IdentifierRow const& row = GetParam();
  EXPECT_STREQ(row.accessor().name(), row.name);
}

TEST_P(PublishedIdentifier, IsTheSameObjectOnEveryCall) {
  IdentifierRow const& row = GetParam();
  EXPECT_EQ(&row.accessor(), &row.accessor()) << row.name;
}

INSTANTIATE_TEST_SUITE_P(All, PublishedIdentifier, ::testing::ValuesIn(kIdentifiers));

TEST(PublishedIdentifiers, AreAllDistinct) {
  std::set<std::string> seen;
  for (IdentifierRow const& row : kIdentifiers)
    EXPECT_TRUE(seen.insert(bytesOf(row.accessor())).second) << row.name;
}

TEST(PublishedIdentifiers, AreAllRandomVersionFour) {
  // Byte 7 is the high byte of the third group, stored little-endian.
  for (IdentifierRow const& row : kIdentifiers)
    EXPECT_EQ(row.accessor().bytes()[7] >> 4, 4) << row.name;
}

TEST(ElementInterfaceIdentifier, StoresItsFirstFieldLittleEndian) {
  unsigned char const* bytes = LS_IElementIdentifiers::IID().bytes();
  EXPECT_EQ(bytes[0], 0xcc);
  EXPECT_EQ(bytes[1], 0xf9);
  EXPECT_EQ(bytes[2], 0x2d);
  EXPECT_EQ(bytes[3], 0x19);
}

TEST(ElementInterfaceIdentifier, EqualsTheIdentifierBuiltFromItsText) {
  EXPECT_EQ(LS_IElementIdentifiers::IID(), UUID("192df9cc-169c-4a4e-9476-0f540f99c22c", "any name"));
}

// Method tables, reached by interface through a common signature.
using MethodNameFn = char const* (*)(uint32_t);

template <class Record>
char const* nameIn(uint32_t id) {
  return Record::MID::NAME(static_cast<typename Record::MID::Type>(id));
}

struct MethodTableRow {
  char const* interfaceName;
  MethodNameFn name;
  unsigned int methods;
};

std::vector<MethodTableRow> const kMethodTables = {
    {"LS_IAuthentication", &nameIn<LS_IAuthenticationIdentifiers>, 2},
    {"LS_IAuthenticationConfig", &nameIn<LS_IAuthenticationConfigIdentifiers>, 8},
    {"LS_IAuthenticationService", &nameIn<LS_IAuthenticationServiceIdentifiers>, 15},
    {"LS_ICall", &nameIn<LS_ICallIdentifiers>, 3},
    {"LS_ICallConfig", &nameIn<LS_ICallConfigIdentifiers>, 9},
    {"LS_IContainer", &nameIn<LS_IContainerIdentifiers>, 8},
    {"LS_IContainerObserver", &nameIn<LS_IContainerObserverIdentifiers>, 3},
    {"LS_IElement", &nameIn<LS_IElementIdentifiers>, 10},
    {"LS_IIdentity", &nameIn<LS_IIdentityIdentifiers>, 19},
    {"LS_IIdentityConfig", &nameIn<LS_IIdentityConfigIdentifiers>, 34},
    {"LS_IInbound", &nameIn<LS_IInboundIdentifiers>, 2},
    {"LS_IInboundConfig", &nameIn<LS_IInboundConfigIdentifiers>, 5},
    {"LS_ILocationService", &nameIn<LS_ILocationServiceIdentifiers>, 10},
    {"LS_ILocationServiceSubject", &nameIn<LS_ILocationServiceSubjectIdentifiers>, 2},
    {"LS_ILocationServiceConfig", &nameIn<LS_ILocationServiceConfigIdentifiers>, 16},
    {"LS_IMasterAuthenticationService", &nameIn<LS_IMasterAuthenticationServiceIdentifiers>, 4},
    {"LS_IMasterLocationService", &nameIn<LS_IMasterLocationServiceIdentifiers>, 4},
    {"LS_IMasterLocationServiceSubject", &nameIn<LS_IMasterLocationServiceSubjectIdentifiers>, 2},
    {"LS_IMwiSubscription", &nameIn<LS_IMwiSubscriptionIdentifiers>, 10},
    {"LS_IMwiSubscriptionSubject", &nameIn<LS_IMwiSubscriptionSubjectIdentifiers>, 2},
    {"LS_IMwiSubscriptionConfig", &nameIn<LS_IMwiSubscriptionConfigIdentifiers>, 18},
    {"LS_IOutbound", &nameIn<LS_IOutboundIdentifiers>, 13},
    {"LS_IOutboundConfig", &nameIn<LS_IOutboundConfigIdentifiers>, 32},
    {"LS_IRegistrationInbound", &nameIn<LS_IRegistrationInboundIdentifiers>, 6},
    {"LS_IRegistrationInboundSubject", &nameIn<LS_IRegistrationInboundSubjectIdentifiers>, 2},
    {"LS_IRegistrationInboundConfig", &nameIn<LS_IRegistrationInboundConfigIdentifiers>, 7},
    {"LS_IRegistrationOutbound", &nameIn<LS_IRegistrationOutboundIdentifiers>, 19},
    {"LS_IRegistrationOutboundSubject", &nameIn<LS_IRegistrationOutboundSubjectIdentifiers>, 2},
    {"LS_IRegistrationOutboundConfig", &nameIn<LS_IRegistrationOutboundConfigIdentifiers>, 39},
};

class MethodTable : public ::testing::TestWithParam<MethodTableRow> {};

// Identifiers are grouped by hundreds and stay below 3000.
TEST_P(MethodTable, NamesExactlyItsMethods) {
  MethodTableRow const& row = GetParam();
  unsigned int named = 0;
  for (uint32_t id = 0; id <= 3000; ++id)
    named += row.name(id) != nullptr;
  EXPECT_EQ(named, row.methods) << row.interfaceName;
}

TEST_P(MethodTable, HasNoNameForTheLargestIdentifier) {
  EXPECT_EQ(GetParam().name(UINT32_MAX), nullptr);
}

INSTANTIATE_TEST_SUITE_P(All, MethodTable, ::testing::ValuesIn(kMethodTables));

struct NamedMethodRow {
  MethodNameFn name;
  uint32_t enumerator;
  uint32_t id;
  char const* expected;
};

using IdentityConfig = LS_IIdentityConfigIdentifiers;
using OutboundConfig = LS_IOutboundConfigIdentifiers;
using RegistrationOutbound = LS_IRegistrationOutboundIdentifiers;
using RegistrationOutboundConfig = LS_IRegistrationOutboundConfigIdentifiers;
using AuthenticationConfig = LS_IAuthenticationConfigIdentifiers;
using LocationServiceConfig = LS_ILocationServiceConfigIdentifiers;

// Rows at group edges and around gaps, where a shifted number would show.
std::vector<NamedMethodRow> const kNamedMethods = {
    {&nameIn<IdentityConfig>, IdentityConfig::MID::addConfigAliasRange, 406, "addConfigAliasRange"},
    {&nameIn<IdentityConfig>, IdentityConfig::MID::removeConfigAliasRange, 408, "removeConfigAliasRange"},
    {&nameIn<IdentityConfig>, IdentityConfig::MID::destroyConfigAlias, 414, "destroyConfigAlias"},
    {&nameIn<IdentityConfig>, IdentityConfig::MID::createConfigFaceIf, 1001, "createConfigFaceIf"},
    {&nameIn<IdentityConfig>, IdentityConfig::MID::isNoIdentityConfigLoop, 2000, "isNoIdentityConfigLoop"},
    {&nameIn<AuthenticationConfig>, AuthenticationConfig::MID::getNumberOfConfigAuthenticates, 101,
     "getNumberOfConfigAuthenticates"},
    {&nameIn<OutboundConfig>, OutboundConfig::MID::removeConfigPreferredProtocol, 202,
     "removeConfigPreferredProtocol"},
    {&nameIn<OutboundConfig>, OutboundConfig::MID::setConfigTrafficClass, 301, "setConfigTrafficClass"},
    {&nameIn<OutboundConfig>, OutboundConfig::MID::removeConfigUseFlows, 505, "removeConfigUseFlows"},
    {&nameIn<RegistrationOutbound>, RegistrationOutbound::MID::getConfigRegistrar, 101, "getConfigRegistrar"},
    {&nameIn<RegistrationOutbound>, RegistrationOutbound::MID::getKeepAliveInterval, 803,
     "getKeepAliveInterval"},
    {&nameIn<RegistrationOutboundConfig>, RegistrationOutboundConfig::MID::removeConfigNatTraversalFlows, 702,
     "removeConfigNatTraversalFlows"},
    {&nameIn<RegistrationOutboundConfig>, RegistrationOutboundConfig::MID::getConfigNatTraversalMethod, 704,
     "getConfigNatTraversalMethod"},
    {&nameIn<LocationServiceConfig>, LocationServiceConfig::MID::getConfigIdentities, 1003,
     "getConfigIdentities"},
    {&nameIn<LS_IElementIdentifiers>, LS_IElementIdentifiers::MID::isDynamic, 501, "isDynamic"},
};

class NamedMethod : public ::testing::TestWithParam<NamedMethodRow> {};

TEST_P(NamedMethod, HasThePublishedNumber) {
  EXPECT_EQ(GetParam().enumerator, GetParam().id) << GetParam().expected;
}

TEST_P(NamedMethod, IsNamedByItsNumber) {
  EXPECT_STREQ(GetParam().name(GetParam().id), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(EdgesAndGaps, NamedMethod, ::testing::ValuesIn(kNamedMethods));

struct GapRow {
  char const* interfaceName;
  MethodNameFn name;
  uint32_t id;
};

std::vector<GapRow> const kGaps = {
    {"LS_IIdentityConfig", &nameIn<IdentityConfig>, 407},
    {"LS_IIdentityConfig", &nameIn<IdentityConfig>, 800},
    {"LS_IIdentityConfig", &nameIn<IdentityConfig>, 1999},
    {"LS_IAuthenticationConfig", &nameIn<AuthenticationConfig>, 100},
    {"LS_IOutboundConfig", &nameIn<OutboundConfig>, 300},
    {"LS_IRegistrationOutboundConfig", &nameIn<RegistrationOutboundConfig>, 703},
    {"LS_IElement", &nameIn<LS_IElementIdentifiers>, 0},
    {"LS_IElement", &nameIn<LS_IElementIdentifiers>, 104},
};

class MethodGap : public ::testing::TestWithParam<GapRow> {};

TEST_P(MethodGap, HasNoName) {
  EXPECT_EQ(GetParam().name(GetParam().id), nullptr) << GetParam().interfaceName << " " << GetParam().id;
}

INSTANTIATE_TEST_SUITE_P(Gaps, MethodGap, ::testing::ValuesIn(kGaps));

}  // namespace
