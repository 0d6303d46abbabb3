// The published identity of every interface of the system: its interface
// identifier, the class identifiers of its remote-call proxy and stub, and
// its method-identifier table.
//
// Each interface class derives from its record here (LS_IElement from
// LS_IElementIdentifiers, ...), so callers write LS_IElement::IID() and
// LS_IElement::MID::NAME(...). Every accessor returns a function-local
// constant made on first use (thread-safe) and never destroyed, so every
// call returns the same object. The operations of the interfaces live with
// the classes that implement them, not here.
#pragma once

#include "Export.h"

#include <cstdint>

#include "UUID.h"

#define LS_INTERFACE_IDENTIFIER_ACCESSORS \
  static UUID const& IID();               \
  static UUID const& CID_PROXY();         \
  static UUID const& CID_STUB()

struct LS_EXPORT LS_IAuthenticationIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getNumberOfAuthenticates = 100,
      getAuthenticate = 101,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IAuthenticationConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getNumberOfConfigAuthenticates = 101,
      getConfigAuthenticate = 102,
      moveConfigAuthenticate = 103,
      modifyConfigAuthenticate = 104,
      insertConfigAuthenticate = 105,
      removeConfigAuthenticate = 106,
      clearConfigAuthenticates = 107,
      destroyConfigAuthenticates = 108,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IAuthenticationServiceIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getName = 100,
      setName = 101,
      getProtocol = 200,
      setProtocol = 201,
      isResponsible = 300,
      getNumberOfRealms = 301,
      getRealm = 302,
      moveRealm = 303,
      modifyRealm = 304,
      insertRealm = 305,
      removeRealm = 306,
      getAllCredentials = 400,
      getCredentials = 401,
      setCredentials = 402,
      removeCredentials = 403,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_ICallIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getVoipProfile = 100,
      getToneSetProfile = 200,
      getSipProfile = 300,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_ICallConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getConfigVoipProfile = 100,
      setConfigVoipProfile = 101,
      removeConfigVoipProfile = 102,
      getConfigToneSetProfile = 200,
      setConfigToneSetProfile = 201,
      removeConfigToneSetProfile = 202,
      getConfigSipProfile = 300,
      setConfigSipProfile = 301,
      removeConfigSipProfile = 302,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IContainerIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addContainerObserver = 100,
      removeContainerObserver = 101,
      containsElement = 200,
      getElement = 201,
      getElements = 202,
      addElement = 203,
      removeElement = 204,
      changeElement = 205,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IContainerObserverIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      onElementAdd = 100,
      onElementRemove = 101,
      onElementChange = 102,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IElementIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addElementObserver = 100,
      removeElementObserver = 101,
      notifyChange = 102,
      notifyDestroying = 103,
      getBase = 200,
      setBase = 201,
      reset = 300,
      create = 400,
      setDynamic = 500,
      isDynamic = 501,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IIdentityIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getName = 100,
      getBaseIdentity = 200,
      getIdentityType = 300,
      getNumberOfAliasNames = 400,
      getAliasName = 401,
      getNumberOfAliasRanges = 402,
      getAliasRange = 403,
      getNumberOfAliasExpressions = 404,
      getAliasExpression = 405,
      isResponsible = 500,
      getDisplayName = 600,
      getPhoneContext = 700,
      getUserRepresentation = 701,
      getLocationServiceIf = 800,
      getFaceIf = 900,
      createDynamicFaceIf = 901,
      removeDynamicFace = 902,
      isInboundRegistered = 903,
      isInboundUnregistered = 904,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IIdentityConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getConfigName = 100,
      setConfigName = 101,
      getConfigBaseIdentity = 200,
      setConfigBaseIdentity = 201,
      getConfigIdentityType = 300,
      setConfigIdentityType = 301,
      getNumberOfConfigAliasNames = 400,
      getConfigAliasName = 401,
      addConfigAliasName = 402,
      removeConfigAliasName = 403,
      getNumberOfConfigAliasRanges = 404,
      getConfigAliasRange = 405,
      addConfigAliasRange = 406,
      removeConfigAliasRange = 408,
      getNumberOfConfigAliasExpressions = 409,
      getConfigAliasExpression = 410,
      addConfigAliasExpression = 411,
      removeConfigAliasExpression = 412,
      clearConfigAlias = 413,
      destroyConfigAlias = 414,
      getConfigDisplayName = 500,
      setConfigDisplayName = 501,
      removeConfigDisplayName = 502,
      getConfigPhoneContext = 600,
      setConfigPhoneContext = 601,
      removeConfigPhoneContext = 602,
      getConfigUserRepresentation = 603,
      setConfigUserRepresentation = 604,
      removeConfigUserRepresentation = 605,
      getConfigLocationServiceIf = 700,
      setConfigLocationService = 701,
      getConfigFaceIf = 1000,
      createConfigFaceIf = 1001,
      isNoIdentityConfigLoop = 2000,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IInboundIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getNumberOfFilterRules = 100,
      getFilterRule = 101,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IInboundConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getNumberOfConfigFilterRules = 100,
      getConfigFilterRule = 101,
      modifyConfigFilterRule = 102,
      insertConfigFilterRule = 103,
      removeConfigFilterRule = 104,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_ILocationServiceIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getName = 100,
      getImperative = 200,
      isResponsible = 300,
      getNumberOfDomains = 301,
      getDomain = 302,
      getDefaultDomain = 400,
      getIdentityIf = 1000,
      createDynamicIdentityIf = 1001,
      removeDynamicIdentity = 1002,
      getIdentities = 1003,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_ILocationServiceSubjectIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addLocationServiceObserver = 100,
      removeLocationServiceObserver = 101,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_ILocationServiceConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getConfigName = 100,
      setConfigName = 101,
      getConfigImperative = 200,
      setConfigImperative = 201,
      getNumberOfConfigDomains = 300,
      getConfigDomain = 301,
      moveConfigDomain = 302,
      modifyConfigDomain = 303,
      insertConfigDomain = 304,
      removeConfigDomain = 305,
      getConfigDefaultDomain = 400,
      setConfigDefaultDomain = 401,
      getConfigIdentityIf = 1000,
      createConfigIdentityIf = 1001,
      removeConfigIdentity = 1002,
      getConfigIdentities = 1003,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IMasterAuthenticationServiceIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getAuthenticationServiceIf = 100,
      createAuthenticationServiceIf = 101,
      removeAuthenticationService = 102,
      getAuthenticationServices = 103,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IMasterLocationServiceIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getLocationServiceIf = 100,
      createLocationServiceIf = 101,
      removeLocationService = 102,
      getLocationServices = 103,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IMasterLocationServiceSubjectIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addMasterLocationServiceObserver = 100,
      removeMasterLocationServiceObserver = 101,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IMwiSubscriptionIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getMwiNotifier = 100,
      getConfigMwiNotifier = 101,
      getDynamicMwiNotifier = 102,
      setDynamicMwiNotifier = 103,
      removeDynamicMwiNotifier = 104,
      getLifetime = 200,
      getMwiSubscriptionMode = 300,
      getRetryTimeoutOnSystemError = 400,
      getRetryTimeoutOnClientError = 500,
      getRetryTimeoutOnServerError = 600,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IMwiSubscriptionSubjectIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addMwiSubscriptionObserver = 100,
      removeMwiSubscriptionObserver = 101,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IMwiSubscriptionConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getConfigMwiNotifier = 100,
      setConfigMwiNotifier = 101,
      removeConfigMwiNotifier = 102,
      getConfigLifetime = 200,
      setConfigLifetime = 201,
      removeConfigLifetime = 202,
      getConfigMwiSubscriptionMode = 300,
      setConfigMwiSubscriptionMode = 301,
      removeConfigMwiSubscriptionMode = 302,
      getConfigRetryTimeoutOnSystemError = 400,
      setConfigRetryTimeoutOnSystemError = 401,
      removeConfigRetryTimeoutOnSystemError = 402,
      getConfigRetryTimeoutOnClientError = 500,
      setConfigRetryTimeoutOnClientError = 501,
      removeConfigRetryTimeoutOnClientError = 502,
      getConfigRetryTimeoutOnServerError = 600,
      setConfigRetryTimeoutOnServerError = 601,
      removeConfigRetryTimeoutOnServerError = 602,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IOutboundIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getNumberOfProxies = 100,
      getProxy = 101,
      getDynamicProxy = 102,
      setDynamicProxy = 103,
      removeDynamicProxy = 104,
      getPreferredProtocol = 200,
      getTrafficClass = 300,
      getRequestUriDynamic = 301,
      getInviteTransactionTimeout = 400,
      getNonInviteTransactionTimeout = 401,
      getPenaltyBox = 402,
      getForcedDestination = 500,
      getUseFlows = 501,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IOutboundConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getNumberOfConfigProxies = 100,
      getConfigProxy = 101,
      moveConfigProxy = 102,
      modifyConfigProxy = 103,
      insertConfigProxy = 104,
      removeConfigProxy = 105,
      clearConfigProxies = 106,
      destroyConfigProxies = 107,
      setConfigPreferredProtocol = 200,
      getConfigPreferredProtocol = 201,
      removeConfigPreferredProtocol = 202,
      setConfigTrafficClass = 301,
      getConfigTrafficClass = 302,
      removeConfigTrafficClass = 303,
      setConfigRequestUriDynamicRegistrar = 304,
      getConfigRequestUriDynamicRegistrar = 305,
      removeConfigRequestUriDynamicRegistrar = 306,
      setConfigInviteTransactionTimeout = 400,
      getConfigInviteTransactionTimeout = 401,
      removeConfigInviteTransactionTimeout = 402,
      setConfigNonInviteTransactionTimeout = 403,
      getConfigNonInviteTransactionTimeout = 404,
      removeConfigNonInviteTransactionTimeout = 405,
      setConfigPenaltyBox = 406,
      getConfigPenaltyBox = 407,
      removeConfigPenaltyBox = 408,
      setConfigForcedDestination = 500,
      removeConfigForcedDestination = 501,
      getConfigForcedDestination = 502,
      setConfigUseFlows = 503,
      getConfigUseFlows = 504,
      removeConfigUseFlows = 505,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IRegistrationInboundIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getLifetimeRange = 100,
      getNumberOfContacts = 200,
      getContact = 201,
      addContact = 202,
      removeContact = 203,
      removeContacts = 204,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IRegistrationInboundSubjectIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addRegistrationInboundObserver = 100,
      removeRegistrationInboundObserver = 101,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IRegistrationInboundConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getConfigLifetimeRange = 100,
      setConfigLifetimeRange = 101,
      removeConfigLifetimeRange = 102,
      getNumberOfConfigContacts = 200,
      getConfigContact = 201,
      addConfigContact = 202,
      removeConfigContact = 203,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IRegistrationOutboundIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getRegistrar = 100,
      getConfigRegistrar = 101,
      getDynamicRegistrar = 102,
      setDynamicRegistrar = 103,
      removeDynamicRegistrar = 104,
      setRegistrarAddr = 105,
      getRegistrarAddr = 106,
      getLifetime = 200,
      getDnsSecurityCheck = 201,
      getRegistrationMode = 300,
      getUriScheme = 301,
      getRetryTimeoutOnSystemError = 400,
      getRetryTimeoutOnClientError = 500,
      getRetryTimeoutOnServerError = 600,
      getPriority = 700,
      getNatTraversalFlows = 800,
      getNatTraversalMethod = 801,
      getKeepAliveMethod = 802,
      getKeepAliveInterval = 803,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IRegistrationOutboundSubjectIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addRegistrationOutboundObserver = 100,
      removeRegistrationOutboundObserver = 101,
    };
    static char const* NAME(Type id);
  };
};

struct LS_EXPORT LS_IRegistrationOutboundConfigIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      getConfigRegistrar = 100,
      setConfigRegistrar = 101,
      removeConfigRegistrar = 102,
      getConfigLifetime = 200,
      setConfigLifetime = 201,
      removeConfigLifetime = 202,
      getConfigRegistrationMode = 300,
      setConfigRegistrationMode = 301,
      removeConfigRegistrationMode = 302,
      setConfigDnsSecurityCheck = 303,
      getConfigDnsSecurityCheck = 304,
      removeConfigDnsSecurityCheck = 305,
      getConfigUriScheme = 306,
      setConfigUriScheme = 307,
      removeConfigUriScheme = 308,
      getConfigRetryTimeoutOnSystemError = 400,
      setConfigRetryTimeoutOnSystemError = 401,
      removeConfigRetryTimeoutOnSystemError = 402,
      getConfigRetryTimeoutOnClientError = 500,
      setConfigRetryTimeoutOnClientError = 501,
      removeConfigRetryTimeoutOnClientError = 502,
      getConfigRetryTimeoutOnServerError = 600,
      setConfigRetryTimeoutOnServerError = 601,
      removeConfigRetryTimeoutOnServerError = 602,
      getConfigNatTraversalFlows = 700,
      setConfigNatTraversalFlows = 701,
      removeConfigNatTraversalFlows = 702,
      getConfigNatTraversalMethod = 704,
      setConfigNatTraversalMethod = 705,
      removeConfigNatTraversalMethod = 706,
      getConfigKeepAliveMethod = 707,
      setConfigKeepAliveMethod = 708,
      removeConfigKeepAliveMethod = 709,
      getConfigKeepAliveInterval = 710,
      setConfigKeepAliveInterval = 711,
      removeConfigKeepAliveInterval = 712,
      getConfigPriority = 800,
      setConfigPriority = 801,
      removeConfigPriority = 802,
    };
    static char const* NAME(Type id);
  };
};
