#include "LS_InterfaceIdentifiers.h"

#include "LS_MethodTable.h"

// Defines the three identifier accessors of Interface, each naming its
// constant: the interface by its own name, proxy and stub by the names the
// remote-call layer registered them under.
#define LS_DEFINE_INTERFACE_IDENTIFIERS(Interface, iid, proxy, proxyName, stub, stubName) \
  UUID const& Interface##Identifiers::IID() {                                             \
    static UUID const id(iid, #Interface);                                                \
    return id;                                                                            \
  }                                                                                       \
  UUID const& Interface##Identifiers::CID_PROXY() {                                       \
    static UUID const id(proxy, proxyName);                                               \
    return id;                                                                            \
  }                                                                                       \
  UUID const& Interface##Identifiers::CID_STUB() {                                        \
    static UUID const id(stub, stubName);                                                 \
    return id;                                                                            \
  }

// Defines Interface's MID::NAME over the rows that follow.
#define LS_DEFINE_METHOD_NAMES(Interface, ...)                      \
  char const* Interface##Identifiers::MID::NAME(Type id) {          \
    static LS_MethodName const kRows[] = {__VA_ARGS__};             \
    return LS_findMethodName(kRows, static_cast<unsigned int>(id)); \
  }

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IAuthentication,
                                "d650c50f-2caa-4ae3-b42c-de4a12a8b869",
                                "544e59d2-82aa-49f2-aa85-9ad93f148544",
                                "LS_CAuthenticationProxy",
                                "f2f1d427-843f-4378-a805-d76de78b0061",
                                "LS_CAuthenticationStub")
LS_DEFINE_METHOD_NAMES(LS_IAuthentication, {100, "getNumberOfAuthenticates"}, {101, "getAuthenticate"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IAuthenticationConfig,
                                "e00f23c2-b2ec-4605-ade5-2f0dc2080a2b",
                                "490aa9ad-307d-412b-9776-ead9ece132ae",
                                "LS_CAuthenticationConfigProxy",
                                "9cd81810-84cf-40c7-863f-f3c9d0a563fa",
                                "LS_CAuthenticationConfigStub")
LS_DEFINE_METHOD_NAMES(LS_IAuthenticationConfig,
                       {101, "getNumberOfConfigAuthenticates"},
                       {102, "getConfigAuthenticate"},
                       {103, "moveConfigAuthenticate"},
                       {104, "modifyConfigAuthenticate"},
                       {105, "insertConfigAuthenticate"},
                       {106, "removeConfigAuthenticate"},
                       {107, "clearConfigAuthenticates"},
                       {108, "destroyConfigAuthenticates"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IAuthenticationService,
                                "8cbe2987-1c3c-47e9-bd93-a1509a1ef7a6",
                                "d1e5f625-7f57-43a1-82fb-b23b7c14780b",
                                "LS_CAuthenticationServiceProxy",
                                "d66763e8-c28e-4129-911d-8b33db20cdbb",
                                "LS_CAuthenticationServiceStub")
LS_DEFINE_METHOD_NAMES(LS_IAuthenticationService,
                       {100, "getName"},
                       {101, "setName"},
                       {200, "getProtocol"},
                       {201, "setProtocol"},
                       {300, "isResponsible"},
                       {301, "getNumberOfRealms"},
                       {302, "getRealm"},
                       {303, "moveRealm"},
                       {304, "modifyRealm"},
                       {305, "insertRealm"},
                       {306, "removeRealm"},
                       {400, "getAllCredentials"},
                       {401, "getCredentials"},
                       {402, "setCredentials"},
                       {403, "removeCredentials"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_ICall,
                                "f3a1517e-f41e-420b-b80c-43ae57e54031",
                                "c4acff4d-8951-4bf4-b58f-ae743ebc2061",
                                "LS_CCallProxy",
                                "9101752d-7169-47e6-affa-8936fdfa712d",
                                "LS_CCallStub")
LS_DEFINE_METHOD_NAMES(LS_ICall, {100, "getVoipProfile"}, {200, "getToneSetProfile"}, {300, "getSipProfile"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_ICallConfig,
                                "5116b22d-f4f8-491d-98b0-b7d7a9078fdc",
                                "1f4ef1f5-d0f1-4229-81cd-24f663fcafc4",
                                "LS_CCallConfigProxy",
                                "4d9b89e2-0593-4fb8-b372-bf4eb815171a",
                                "LS_CCallConfigStub")
LS_DEFINE_METHOD_NAMES(LS_ICallConfig,
                       {100, "getConfigVoipProfile"},
                       {101, "setConfigVoipProfile"},
                       {102, "removeConfigVoipProfile"},
                       {200, "getConfigToneSetProfile"},
                       {201, "setConfigToneSetProfile"},
                       {202, "removeConfigToneSetProfile"},
                       {300, "getConfigSipProfile"},
                       {301, "setConfigSipProfile"},
                       {302, "removeConfigSipProfile"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IContainer,
                                "13011f52-4170-406a-bc6b-b9c0de4ab44d",
                                "47b9a532-f1c1-47b1-8133-a04c6a093c7c",
                                "LS_CContainerProxy",
                                "b896c133-cd3a-44be-9386-3d1d25232817",
                                "LS_CContainerStub")
LS_DEFINE_METHOD_NAMES(LS_IContainer,
                       {100, "addContainerObserver"},
                       {101, "removeContainerObserver"},
                       {200, "containsElement"},
                       {201, "getElement"},
                       {202, "getElements"},
                       {203, "addElement"},
                       {204, "removeElement"},
                       {205, "changeElement"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IContainerObserver,
                                "12b97c54-4d1a-4fbe-accb-c778e538f520",
                                "3f6a153a-25e4-41fd-9be9-92c0072fb35d",
                                "LS_CContainerObserverProxy",
                                "2a142159-dc10-4800-9f31-3a09e44743a7",
                                "LS_CContainerObserverStub")
LS_DEFINE_METHOD_NAMES(LS_IContainerObserver,
                       {100, "onElementAdd"},
                       {101, "onElementRemove"},
                       {102, "onElementChange"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IElement,
                                "192df9cc-169c-4a4e-9476-0f540f99c22c",
                                "f177d737-9a67-4936-8046-0278f27fc5b5",
                                "LS_CElementProxy",
                                "dcd21598-b973-4223-b90c-99a801395ac0",
                                "LS_CElementStub")
LS_DEFINE_METHOD_NAMES(LS_IElement,
                       {100, "addElementObserver"},
                       {101, "removeElementObserver"},
                       {102, "notifyChange"},
                       {103, "notifyDestroying"},
                       {200, "getBase"},
                       {201, "setBase"},
                       {300, "reset"},
                       {400, "create"},
                       {500, "setDynamic"},
                       {501, "isDynamic"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IIdentity,
                                "c3ef398b-2a86-4e6d-a47a-dd1631b250f0",
                                "893dca14-7bab-4186-9001-452cf3cf5dd9",
                                "LS_ICdentityProxy",
                                "fa4409d3-bc05-4371-9350-329c83b8969c",
                                "LS_ICdentityStub")
LS_DEFINE_METHOD_NAMES(LS_IIdentity,
                       {100, "getName"},
                       {200, "getBaseIdentity"},
                       {300, "getIdentityType"},
                       {400, "getNumberOfAliasNames"},
                       {401, "getAliasName"},
                       {402, "getNumberOfAliasRanges"},
                       {403, "getAliasRange"},
                       {404, "getNumberOfAliasExpressions"},
                       {405, "getAliasExpression"},
                       {500, "isResponsible"},
                       {600, "getDisplayName"},
                       {700, "getPhoneContext"},
                       {701, "getUserRepresentation"},
                       {800, "getLocationServiceIf"},
                       {900, "getFaceIf"},
                       {901, "createDynamicFaceIf"},
                       {902, "removeDynamicFace"},
                       {903, "isInboundRegistered"},
                       {904, "isInboundUnregistered"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IIdentityConfig,
                                "371c621a-6597-4771-8a96-ef30e99216af",
                                "27aaa396-b8c3-46c7-bb85-0cc348cef640",
                                "LS_ICdentityConfigProxy",
                                "064d6a50-ded7-4bb5-b4ae-0f4534c270f7",
                                "LS_ICdentityConfigStub")
LS_DEFINE_METHOD_NAMES(LS_IIdentityConfig,
                       {100, "getConfigName"},
                       {101, "setConfigName"},
                       {200, "getConfigBaseIdentity"},
                       {201, "setConfigBaseIdentity"},
                       {300, "getConfigIdentityType"},
                       {301, "setConfigIdentityType"},
                       {400, "getNumberOfConfigAliasNames"},
                       {401, "getConfigAliasName"},
                       {402, "addConfigAliasName"},
                       {403, "removeConfigAliasName"},
                       {404, "getNumberOfConfigAliasRanges"},
                       {405, "getConfigAliasRange"},
                       {406, "addConfigAliasRange"},
                       {408, "removeConfigAliasRange"},
                       {409, "getNumberOfConfigAliasExpressions"},
                       {410, "getConfigAliasExpression"},
                       {411, "addConfigAliasExpression"},
                       {412, "removeConfigAliasExpression"},
                       {413, "clearConfigAlias"},
                       {414, "destroyConfigAlias"},
                       {500, "getConfigDisplayName"},
                       {501, "setConfigDisplayName"},
                       {502, "removeConfigDisplayName"},
                       {600, "getConfigPhoneContext"},
                       {601, "setConfigPhoneContext"},
                       {602, "removeConfigPhoneContext"},
                       {603, "getConfigUserRepresentation"},
                       {604, "setConfigUserRepresentation"},
                       {605, "removeConfigUserRepresentation"},
                       {700, "getConfigLocationServiceIf"},
                       {701, "setConfigLocationService"},
                       {1000, "getConfigFaceIf"},
                       {1001, "createConfigFaceIf"},
                       {2000, "isNoIdentityConfigLoop"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IInbound,
                                "0d320f73-633b-4729-9a0d-467c8439f195",
                                "218087ec-438e-4c4d-ace0-891b8f417f08",
                                "LS_CInboundProxy",
                                "9c83514e-94fe-4fd9-8d53-6a38bccd105a",
                                "LS_CInboundStub")
LS_DEFINE_METHOD_NAMES(LS_IInbound, {100, "getNumberOfFilterRules"}, {101, "getFilterRule"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IInboundConfig,
                                "f8a6a790-e473-4331-9aa9-152048dd028f",
                                "31def778-fcab-452e-b7ae-c4192159dce8",
                                "LS_CInboundConfigProxy",
                                "01ffa63f-d1ff-44c2-b111-cf23ae8e2194",
                                "LS_CInboundConfigStub")
LS_DEFINE_METHOD_NAMES(LS_IInboundConfig,
                       {100, "getNumberOfConfigFilterRules"},
                       {101, "getConfigFilterRule"},
                       {102, "modifyConfigFilterRule"},
                       {103, "insertConfigFilterRule"},
                       {104, "removeConfigFilterRule"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_ILocationService,
                                "8ad5f38d-53cc-4a66-9e9d-555acd7296ad",
                                "e78cd4f1-67e7-4f96-867c-bd506ba00a2a",
                                "LS_CLocationServiceProxy",
                                "841e581c-68cd-4517-9162-c7d8249d7492",
                                "LS_CLocationServiceStub")
LS_DEFINE_METHOD_NAMES(LS_ILocationService,
                       {100, "getName"},
                       {200, "getImperative"},
                       {300, "isResponsible"},
                       {301, "getNumberOfDomains"},
                       {302, "getDomain"},
                       {400, "getDefaultDomain"},
                       {1000, "getIdentityIf"},
                       {1001, "createDynamicIdentityIf"},
                       {1002, "removeDynamicIdentity"},
                       {1003, "getIdentities"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_ILocationServiceSubject,
                                "3fb5dee4-250a-4865-844b-79e476b8e92d",
                                "eb16cfb9-2e2c-4d74-b19f-0f6f7fdd6f9b",
                                "LS_CLocationServiceSubjectProxy",
                                "033dcb85-e5f4-40cb-b29d-f9c9ffb16970",
                                "LS_CLocationServiceSubjectStub")
LS_DEFINE_METHOD_NAMES(LS_ILocationServiceSubject,
                       {100, "addLocationServiceObserver"},
                       {101, "removeLocationServiceObserver"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_ILocationServiceConfig,
                                "41287446-8caf-4187-8b9b-e9add12cdb3a",
                                "c75f0620-c659-4e3a-bc3e-baeaccfa4df3",
                                "LS_CLocationServiceConfigProxy",
                                "2badc9a6-c173-4a56-9f94-9ac4c2b2a824",
                                "LS_CLocationServiceConfigStub")
LS_DEFINE_METHOD_NAMES(LS_ILocationServiceConfig,
                       {100, "getConfigName"},
                       {101, "setConfigName"},
                       {200, "getConfigImperative"},
                       {201, "setConfigImperative"},
                       {300, "getNumberOfConfigDomains"},
                       {301, "getConfigDomain"},
                       {302, "moveConfigDomain"},
                       {303, "modifyConfigDomain"},
                       {304, "insertConfigDomain"},
                       {305, "removeConfigDomain"},
                       {400, "getConfigDefaultDomain"},
                       {401, "setConfigDefaultDomain"},
                       {1000, "getConfigIdentityIf"},
                       {1001, "createConfigIdentityIf"},
                       {1002, "removeConfigIdentity"},
                       {1003, "getConfigIdentities"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IMasterAuthenticationService,
                                "bf7aa236-2d7b-44a0-96df-b0236239937f",
                                "082fb034-1e7e-4558-add4-9a2ea5a9342e",
                                "LS_CMasterAuthenticationServiceProxy",
                                "39af4c0a-b531-4d6a-b1c9-13e6a21a5d9d",
                                "LS_CMasterAuthenticationServiceStub")
LS_DEFINE_METHOD_NAMES(LS_IMasterAuthenticationService,
                       {100, "getAuthenticationServiceIf"},
                       {101, "createAuthenticationServiceIf"},
                       {102, "removeAuthenticationService"},
                       {103, "getAuthenticationServices"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IMasterLocationService,
                                "bf1ffede-e116-46b6-bfd7-aef0c5bf684f",
                                "8ee7ffe1-bbac-490d-baf3-aea1c4e47ad2",
                                "LS_CMasterLocationServiceProxy",
                                "4fbf304d-8ed5-4a54-9102-3f22d7636c65",
                                "LS_CMasterLocationServiceStub")
LS_DEFINE_METHOD_NAMES(LS_IMasterLocationService,
                       {100, "getLocationServiceIf"},
                       {101, "createLocationServiceIf"},
                       {102, "removeLocationService"},
                       {103, "getLocationServices"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IMasterLocationServiceSubject,
                                "ac734464-695a-440b-979e-02e78aa877e1",
                                "a7c81959-072b-47d9-93c1-bdab41f2627e",
                                "LS_CMasterLocationServiceSubjectProxy",
                                "7f64d2cc-2f29-4044-aa54-28356ca587f4",
                                "LS_CMasterLocationServiceSubjectStub")
LS_DEFINE_METHOD_NAMES(LS_IMasterLocationServiceSubject,
                       {100, "addMasterLocationServiceObserver"},
                       {101, "removeMasterLocationServiceObserver"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IMwiSubscription,
                                "986c6a82-7fd4-406b-9967-16250c3a66ef",
                                "49a7ded6-b21f-4d20-81f2-7abcae7509cc",
                                "LS_CMwiSubscriptionProxy",
                                "6a677c9a-2c3c-4555-bb10-6bf15376b481",
                                "LS_CMwiSubscriptionStub")
LS_DEFINE_METHOD_NAMES(LS_IMwiSubscription,
                       {100, "getMwiNotifier"},
                       {101, "getConfigMwiNotifier"},
                       {102, "getDynamicMwiNotifier"},
                       {103, "setDynamicMwiNotifier"},
                       {104, "removeDynamicMwiNotifier"},
                       {200, "getLifetime"},
                       {300, "getMwiSubscriptionMode"},
                       {400, "getRetryTimeoutOnSystemError"},
                       {500, "getRetryTimeoutOnClientError"},
                       {600, "getRetryTimeoutOnServerError"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IMwiSubscriptionSubject,
                                "b5653402-694e-4a5a-b388-40cdf31dcb06",
                                "b73f01ec-ae80-4903-8432-5ddba4b37edb",
                                "LS_CMwiSubscriptionSubjectProxy",
                                "798b1595-19ac-46b7-a16f-667a352e869f",
                                "LS_CMwiSubscriptionSubjectStub")
LS_DEFINE_METHOD_NAMES(LS_IMwiSubscriptionSubject,
                       {100, "addMwiSubscriptionObserver"},
                       {101, "removeMwiSubscriptionObserver"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IMwiSubscriptionConfig,
                                "60ae7cdc-4445-432b-8ac9-8e98a7fc89be",
                                "bac13e80-cb89-4262-bac8-6b63c6600ac0",
                                "LS_CMwiSubscriptionConfigProxy",
                                "f507ff65-191a-4c56-9c32-7d35fe166cae",
                                "LS_CMwiSubscriptionConfigStub")
LS_DEFINE_METHOD_NAMES(LS_IMwiSubscriptionConfig,
                       {100, "getConfigMwiNotifier"},
                       {101, "setConfigMwiNotifier"},
                       {102, "removeConfigMwiNotifier"},
                       {200, "getConfigLifetime"},
                       {201, "setConfigLifetime"},
                       {202, "removeConfigLifetime"},
                       {300, "getConfigMwiSubscriptionMode"},
                       {301, "setConfigMwiSubscriptionMode"},
                       {302, "removeConfigMwiSubscriptionMode"},
                       {400, "getConfigRetryTimeoutOnSystemError"},
                       {401, "setConfigRetryTimeoutOnSystemError"},
                       {402, "removeConfigRetryTimeoutOnSystemError"},
                       {500, "getConfigRetryTimeoutOnClientError"},
                       {501, "setConfigRetryTimeoutOnClientError"},
                       {502, "removeConfigRetryTimeoutOnClientError"},
                       {600, "getConfigRetryTimeoutOnServerError"},
                       {601, "setConfigRetryTimeoutOnServerError"},
                       {602, "removeConfigRetryTimeoutOnServerError"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IOutbound,
                                "c31d799b-887d-48ff-9d6a-0270f224e5a2",
                                "aeefa9e3-5642-4493-813d-ad2b0100a7aa",
                                "LS_COutboundProxy",
                                "44f0a1cf-176a-4a45-9c3d-8d597e7ed0da",
                                "LS_COutboundStub")
LS_DEFINE_METHOD_NAMES(LS_IOutbound,
                       {100, "getNumberOfProxies"},
                       {101, "getProxy"},
                       {102, "getDynamicProxy"},
                       {103, "setDynamicProxy"},
                       {104, "removeDynamicProxy"},
                       {200, "getPreferredProtocol"},
                       {300, "getTrafficClass"},
                       {301, "getRequestUriDynamic"},
                       {400, "getInviteTransactionTimeout"},
                       {401, "getNonInviteTransactionTimeout"},
                       {402, "getPenaltyBox"},
                       {500, "getForcedDestination"},
                       {501, "getUseFlows"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IOutboundConfig,
                                "588a164a-2a55-4d1f-be6b-886b1900691a",
                                "1c23e2c2-af57-405d-a525-12be1f1165e1",
                                "LS_COutboundConfigProxy",
                                "5ed10054-07e7-48ba-841a-13516192582d",
                                "LS_COutboundConfigStub")
LS_DEFINE_METHOD_NAMES(LS_IOutboundConfig,
                       {100, "getNumberOfConfigProxies"},
                       {101, "getConfigProxy"},
                       {102, "moveConfigProxy"},
                       {103, "modifyConfigProxy"},
                       {104, "insertConfigProxy"},
                       {105, "removeConfigProxy"},
                       {106, "clearConfigProxies"},
                       {107, "destroyConfigProxies"},
                       {200, "setConfigPreferredProtocol"},
                       {201, "getConfigPreferredProtocol"},
                       {202, "removeConfigPreferredProtocol"},
                       {301, "setConfigTrafficClass"},
                       {302, "getConfigTrafficClass"},
                       {303, "removeConfigTrafficClass"},
                       {304, "setConfigRequestUriDynamicRegistrar"},
                       {305, "getConfigRequestUriDynamicRegistrar"},
                       {306, "removeConfigRequestUriDynamicRegistrar"},
                       {400, "setConfigInviteTransactionTimeout"},
                       {401, "getConfigInviteTransactionTimeout"},
                       {402, "removeConfigInviteTransactionTimeout"},
                       {403, "setConfigNonInviteTransactionTimeout"},
                       {404, "getConfigNonInviteTransactionTimeout"},
                       {405, "removeConfigNonInviteTransactionTimeout"},
                       {406, "setConfigPenaltyBox"},
                       {407, "getConfigPenaltyBox"},
                       {408, "removeConfigPenaltyBox"},
                       {500, "setConfigForcedDestination"},
                       {501, "removeConfigForcedDestination"},
                       {502, "getConfigForcedDestination"},
                       {503, "setConfigUseFlows"},
                       {504, "getConfigUseFlows"},
                       {505, "removeConfigUseFlows"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IRegistrationInbound,
                                "6bf7ae43-63e7-4a2e-823a-c4502320b907",
                                "bcf29703-8126-4c7d-9c95-a14289d20723",
                                "LS_CRegistrationInboundProxy",
                                "1e5ab370-fe1e-466c-9127-82e5f0492e27",
                                "LS_CRegistrationInboundStub")
LS_DEFINE_METHOD_NAMES(LS_IRegistrationInbound,
                       {100, "getLifetimeRange"},
                       {200, "getNumberOfContacts"},
                       {201, "getContact"},
                       {202, "addContact"},
                       {203, "removeContact"},
                       {204, "removeContacts"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IRegistrationInboundSubject,
                                "88e0402a-e946-4992-80b4-eac1c89dc2c3",
                                "859ff305-02ca-40db-9d78-93961e90aed5",
                                "LS_CRegistrationInboundSubjectProxy",
                                "c0361e42-9065-42a3-93e6-37462ca9f006",
                                "LS_CRegistrationInboundSubjectStub")
LS_DEFINE_METHOD_NAMES(LS_IRegistrationInboundSubject,
                       {100, "addRegistrationInboundObserver"},
                       {101, "removeRegistrationInboundObserver"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IRegistrationInboundConfig,
                                "9c57b5c2-7f13-445f-8094-4e18c494b01e",
                                "59cf27f3-6570-4600-8b56-5481f795dff0",
                                "LS_IRegistrationCnboundConfigProxy",
                                "a0d1928f-569b-4949-b3fc-72bbad6aba33",
                                "LS_IRegistrationCnboundConfigStub")
LS_DEFINE_METHOD_NAMES(LS_IRegistrationInboundConfig,
                       {100, "getConfigLifetimeRange"},
                       {101, "setConfigLifetimeRange"},
                       {102, "removeConfigLifetimeRange"},
                       {200, "getNumberOfConfigContacts"},
                       {201, "getConfigContact"},
                       {202, "addConfigContact"},
                       {203, "removeConfigContact"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IRegistrationOutbound,
                                "c3a0ba89-7299-47b3-b961-204780670c72",
                                "28ecee40-f597-4fc5-aec6-6cec6b8d11aa",
                                "LS_CRegistrationOutboundProxy",
                                "1448842b-8404-437f-8e52-e73e0612d762",
                                "LS_CRegistrationOutboundStub")
LS_DEFINE_METHOD_NAMES(LS_IRegistrationOutbound,
                       {100, "getRegistrar"},
                       {101, "getConfigRegistrar"},
                       {102, "getDynamicRegistrar"},
                       {103, "setDynamicRegistrar"},
                       {104, "removeDynamicRegistrar"},
                       {105, "setRegistrarAddr"},
                       {106, "getRegistrarAddr"},
                       {200, "getLifetime"},
                       {201, "getDnsSecurityCheck"},
                       {300, "getRegistrationMode"},
                       {301, "getUriScheme"},
                       {400, "getRetryTimeoutOnSystemError"},
                       {500, "getRetryTimeoutOnClientError"},
                       {600, "getRetryTimeoutOnServerError"},
                       {700, "getPriority"},
                       {800, "getNatTraversalFlows"},
                       {801, "getNatTraversalMethod"},
                       {802, "getKeepAliveMethod"},
                       {803, "getKeepAliveInterval"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IRegistrationOutboundSubject,
                                "059f2383-c9e3-443a-ab56-1e86b7e77ab2",
                                "ae50a4aa-8a98-4b54-8066-ee170ba2830a",
                                "LS_CRegistrationOutboundSubjectProxy",
                                "68f612f7-4683-4d79-b29b-00ad581efd62",
                                "LS_CRegistrationOutboundSubjectStub")
LS_DEFINE_METHOD_NAMES(LS_IRegistrationOutboundSubject,
                       {100, "addRegistrationOutboundObserver"},
                       {101, "removeRegistrationOutboundObserver"})

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IRegistrationOutboundConfig,
                                "9d7771a6-0d7c-4bee-ace1-661931e8512e",
                                "117125e1-bf95-4fe5-962d-008685c7c15e",
                                "LS_CRegistrationOutboundConfigProxy",
                                "ecc16b58-c34a-4393-accf-d9195decd3a4",
                                "LS_CRegistrationOutboundConfigStub")
LS_DEFINE_METHOD_NAMES(LS_IRegistrationOutboundConfig,
                       {100, "getConfigRegistrar"},
                       {101, "setConfigRegistrar"},
                       {102, "removeConfigRegistrar"},
                       {200, "getConfigLifetime"},
                       {201, "setConfigLifetime"},
                       {202, "removeConfigLifetime"},
                       {300, "getConfigRegistrationMode"},
                       {301, "setConfigRegistrationMode"},
                       {302, "removeConfigRegistrationMode"},
                       {303, "setConfigDnsSecurityCheck"},
                       {304, "getConfigDnsSecurityCheck"},
                       {305, "removeConfigDnsSecurityCheck"},
                       {306, "getConfigUriScheme"},
                       {307, "setConfigUriScheme"},
                       {308, "removeConfigUriScheme"},
                       {400, "getConfigRetryTimeoutOnSystemError"},
                       {401, "setConfigRetryTimeoutOnSystemError"},
                       {402, "removeConfigRetryTimeoutOnSystemError"},
                       {500, "getConfigRetryTimeoutOnClientError"},
                       {501, "setConfigRetryTimeoutOnClientError"},
                       {502, "removeConfigRetryTimeoutOnClientError"},
                       {600, "getConfigRetryTimeoutOnServerError"},
                       {601, "setConfigRetryTimeoutOnServerError"},
                       {602, "removeConfigRetryTimeoutOnServerError"},
                       {700, "getConfigNatTraversalFlows"},
                       {701, "setConfigNatTraversalFlows"},
                       {702, "removeConfigNatTraversalFlows"},
                       {704, "getConfigNatTraversalMethod"},
                       {705, "setConfigNatTraversalMethod"},
                       {706, "removeConfigNatTraversalMethod"},
                       {707, "getConfigKeepAliveMethod"},
                       {708, "setConfigKeepAliveMethod"},
                       {709, "removeConfigKeepAliveMethod"},
                       {710, "getConfigKeepAliveInterval"},
                       {711, "setConfigKeepAliveInterval"},
                       {712, "removeConfigKeepAliveInterval"},
                       {800, "getConfigPriority"},
                       {801, "setConfigPriority"},
                       {802, "removeConfigPriority"})
