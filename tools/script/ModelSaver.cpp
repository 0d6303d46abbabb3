#include "ModelSaver.h"

#include <algorithm>
#include <optional>
#include <stdexcept>
#include <unordered_map>

#include "CommandTable.h"
#include "FaceNames.h"
#include "LS_AddressText.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_ICallConfig.h"
#include "LS_IElement.h"
#include "LS_IInboundConfig.h"
#include "LS_IMwiSubscription.h"
#include "LS_IMwiSubscriptionConfig.h"
#include "LS_IOutbound.h"
#include "LS_IOutboundConfig.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutbound.h"
#include "LS_IRegistrationOutboundConfig.h"
#include "ScriptLine.h"
#include "SipStatistics.h"

namespace {

using Words = std::vector<std::string>;

Words operator+(Words words, Words const& more) {
  words.insert(words.end(), more.begin(), more.end());
  return words;
}

std::string numberWord(unsigned int number) {
  return std::to_string(number);
}

std::string switchWord(bool on) {
  return on ? "on" : "off";
}

std::string textWord(String const& text) {
  return text.str();
}

template <class Enumeration>
std::string enumerationWordOf(typename Enumeration::Type value) {
  return enumerationWord(Enumeration::NAME(value));
}

bool isEmpty(CHostPort const& hostPort) {
  return hostPort == CHostPort();
}

std::string hostPortWord(CHostPort const& hostPort) {
  return hostPortStr(hostPort).str();
}

// "any", the bare address for a host mask, else address/mask.
std::string ipAddressWord(IpAddress const& address) {
  if (address.isEmpty())
    return "any";
  String text;
  String mask;
  address.getIpAddrAsString(text);
  address.getNetMaskAsString(mask);
  IpAddress host;
  if (host.set(text, String()) && host == address)
    return text.str();
  return text.str() + "/" + mask.str();
}

// The value's word when the object holds the setting itself.
template <class T, class V, class Word>
std::optional<std::string> ownSetting(T const* config, XCode (T::*get)(V&) const, Word word) {
  V value{};
  if ((config->*get)(value).isFailure())
    return std::nullopt;
  return word(value);
}

std::string counted(unsigned int count, char const* one, char const* many) {
  return std::to_string(count) + " " + (count == 1 ? one : many);
}

template <class T>
RefPtr<T> faceOf(LS_IIdentity const* identity, LS_IdentityFace::Type face) {
  RefPtr<T> found;
  if (identity)
    LS_getFaceIf(identity, face, found);
  return found;
}

// Faces the identity holds itself that the SIP side made to record what it
// learnt: not configuration.
unsigned int dynamicFaces(LS_IIdentity const* identity) {
  unsigned int count = 0;
  for (size_t face = 0; face < faceNames().size(); ++face) {
    RefPtr<LS_IElement> const element = faceOf<LS_IElement>(identity, static_cast<LS_IdentityFace::Type>(face));
    count += element && element->isDynamic() ? 1 : 0;
  }
  return count;
}

// The proxy, registrar and message server learnt on the identity's face,
// its own or the one it inherits, one text each.
std::vector<std::string> learntOn(LS_IIdentity const* identity, LS_IdentityFace::Type face) {
  std::vector<std::string> learnt;
  CHostPort address;
  bool strict = false;
  RefPtr<LS_IOutbound> const outbound = faceOf<LS_IOutbound>(identity, face);
  if (outbound && outbound->getDynamicProxy(address, strict).isSuccess())
    learnt.push_back("proxy " + hostPortWord(address) + " " + switchWord(strict));
  RefPtr<LS_IRegistrationOutbound> const registration = faceOf<LS_IRegistrationOutbound>(identity, face);
  if (registration && registration->getDynamicRegistrar(address).isSuccess())
    learnt.push_back("registrar " + hostPortWord(address));
  RefPtr<LS_IMwiSubscription> const subscription = faceOf<LS_IMwiSubscription>(identity, face);
  if (subscription && subscription->getDynamicMwiNotifier(address).isSuccess())
    learnt.push_back("notifier " + hostPortWord(address));
  return learnt;
}

// Learnt values read through to the faces of derived identities; each is
// counted on the identity that holds it, so a group's learnt registrar
// counts once, not once for every member.
unsigned int learntValues(LS_IIdentity const* identity) {
  RefPtr<LS_IIdentity> base;
  identity->getBaseIdentity(base);
  unsigned int count = 0;
  for (size_t face = 0; face < faceNames().size(); ++face) {
    LS_IdentityFace::Type const type = static_cast<LS_IdentityFace::Type>(face);
    std::vector<std::string> const inherited = learntOn(base.get(), type);
    for (std::string const& learnt : learntOn(identity, type))
      count += std::find(inherited.begin(), inherited.end(), learnt) == inherited.end() ? 1 : 0;
  }
  return count;
}

}  // namespace

struct ModelSaver::Identity {
  // "identity <service> <name>", the start of each of its lines.
  Words words;
  RefPtr<LS_IIdentityConfig> config;
  // The index of its base among the service's identities; its own index
  // when it has none.
  size_t base;
};

std::string ModelSaver::script() {
  m_out.str(std::string());
  m_out << leftOutComment();
  Vector<String> names;
  m_session.authenticationMaster()->getAuthenticationServices(names);
  for (String const& name : names)
    saveAuthenticationService(name);
  m_session.locationMaster()->getLocationServices(names);
  for (String const& name : names)
    saveLocationService(name);
  for (String const& name : names)
    saveIdentities(name);
  return m_out.str();
}

void ModelSaver::line(Words const& words) {
  std::string text;
  for (std::string const& word : words) {
    if (word.find('\n') != std::string::npos)
      throw std::runtime_error("cannot save " + quotedWord(word) + ": a script line cannot hold a line break");
    text += (text.empty() ? "" : " ") + scriptWord(word);
  }
  m_out << text << "\n";
}

std::string ModelSaver::leftOutComment() const {
  unsigned int dynamicIdentities = 0;
  unsigned int faces = 0;
  unsigned int learnt = 0;
  Vector<String> services;
  m_session.locationMaster()->getLocationServices(services);
  for (String const& name : services) {
    RefPtr<LS_ILocationService> service;
    LS_getLocationServiceIf(m_session.locationMaster(), name, service);
    RefPtr<LS_ILocationServiceConfig> config;
    service->queryIf(config);
    Vector<String> identities;
    Vector<String> configured;
    service->getIdentities(identities);
    config->getConfigIdentities(configured);
    dynamicIdentities += static_cast<unsigned int>(identities.size() - configured.size());
    for (String const& identityName : identities) {
      RefPtr<LS_IIdentity> identity;
      LS_getIdentityIf(service.get(), identityName, identity);
      faces += dynamicFaces(identity.get());
      learnt += learntValues(identity.get());
    }
  }
  // Counts every contact of the process; a host program holds one model.
  int const registered = s_sipStatistics.getInboundRegistrations();
  std::string const contacts =
      counted(registered > 0 ? static_cast<unsigned int>(registered) : 0, "registered contact", "registered contacts");
  return "# left out as run-time state: " + counted(dynamicIdentities, "dynamic identity", "dynamic identities") +
         ", " + counted(faces, "dynamic face", "dynamic faces") + ", " + contacts + ", " +
         counted(learnt, "learnt proxy, registrar or message server",
                 "learnt proxies, registrars and message servers") +
         "\n";
}

void ModelSaver::saveAuthenticationService(String const& name) {
  RefPtr<LS_IAuthenticationService> service;
  LS_getAuthenticationServiceIf(m_session.authenticationMaster(), name, service);
  Words const prefix = {"authentication-service", name.str()};
  line(prefix + Words{"create"});
  if (!(service->getName() == name))
    line(prefix + Words{"name", "set", service->getName().str()});
  line(prefix + Words{"protocol", "set", enumerationWordOf<LS_AuthenticationProtocol>(service->getProtocol())});
  for (unsigned int index = 0; index < service->getNumberOfRealms(); ++index)
    line(prefix + Words{"realm", "insert", numberWord(index), service->getRealm(index).str()});
  Vector<String> users;
  service->getAllCredentials(users);
  for (String const& user : users) {
    String password;
    if (service->getCredentials(user, password).isSuccess())
      line(prefix + Words{"credentials", "set", user.str(), password.str()});
  }
}

void ModelSaver::saveLocationService(String const& name) {
  RefPtr<LS_ILocationServiceConfig> service;
  LS_getLocationServiceIf(m_session.locationMaster(), name, service);
  Words const prefix = {"location-service", name.str()};
  line(prefix + Words{"create"});
  if (!(service->getConfigName() == name))
    line(prefix + Words{"name", "set", service->getConfigName().str()});
  line(prefix + Words{"imperative", "set", enumerationWordOf<LS_Imperative>(service->getConfigImperative())});
  line(prefix + Words{"default-domain", "set", switchWord(service->getConfigDefaultDomain())});
  for (unsigned int index = 0; index < service->getNumberOfConfigDomains(); ++index)
    line(prefix + Words{"domain", "insert", numberWord(index), hostPortWord(service->getConfigDomain(index))});
}

std::string ModelSaver::listedName(LS_ILocationServiceConfig const* service) const {
  Vector<String> names;
  m_session.locationMaster()->getLocationServices(names);
  for (String const& name : names) {
    RefPtr<LS_ILocationServiceConfig> candidate;
    LS_getLocationServiceIf(m_session.locationMaster(), name, candidate);
    if (candidate.get() == service)
      return name.str();
  }
  return std::string();
}

// In the order the service lists its identities, so that the rebuilt
// service lists them alike. An identity whose base comes later in that order
// (its base was set after both existed) is created without one, and its
// base is set as soon as the base exists.
void ModelSaver::saveIdentities(String const& serviceName) {
  RefPtr<LS_ILocationServiceConfig> service;
  LS_getLocationServiceIf(m_session.locationMaster(), serviceName, service);
  Vector<String> names;
  service->getConfigIdentities(names);
  std::vector<Identity> identities;
  for (String const& name : names) {
    Identity identity{Words{"identity", serviceName.str(), name.str()}, nullptr, identities.size()};
    LS_getConfigIdentityIf(service.get(), name, identity.config);
    identities.push_back(identity);
  }
  // By a map and lists made once, not by a search of every identity for
  // each: with 100,000 subscribers the searches took seconds.
  std::unordered_map<LS_IIdentityConfig const*, size_t> indexOf;
  for (Identity const& identity : identities)
    indexOf.emplace(identity.config.get(), indexOf.size());
  for (Identity& identity : identities) {
    RefPtr<LS_IIdentityConfig> base;
    if (identity.config->getConfigBaseIdentity(base).isFailure())
      continue;
    auto const found = indexOf.find(base.get());
    identity.base = found == indexOf.end() ? identities.size() : found->second;
    // Only the configuration interfaces, not the language, can base an
    // identity on one that its service does not list.
    if (identity.base == identities.size())
      m_out << "# the base of " << scriptWord(identity.words.back())
            << " is no configured identity of its location service and is left out\n";
  }
  // The identities written before their base, by base, in script order.
  std::vector<std::vector<size_t>> earlierDerived(identities.size());
  for (size_t index = 0; index < identities.size(); ++index)
    if (identities[index].base > index && identities[index].base < identities.size())
      earlierDerived[identities[index].base].push_back(index);
  for (size_t index = 0; index < identities.size(); ++index) {
    Identity const& identity = identities[index];
    Words create =
        identity.words + Words{"create", enumerationWordOf<LS_IdentityType>(identity.config->getConfigIdentityType())};
    if (identity.base < index)
      create.push_back(identities[identity.base].words.back());
    line(create);
    saveIdentity(identity.words, identity.config.get(), serviceName);
    for (size_t derived : earlierDerived[index])
      line(identities[derived].words + Words{"base", "set", identity.words.back()});
  }
}

void ModelSaver::saveIdentity(Words const& identity, LS_IIdentityConfig* config, String const& serviceName) {
  if (!(config->getConfigName() == identity.back().c_str()))
    line(identity + Words{"name", "set", config->getConfigName().str()});
  RefPtr<LS_ILocationServiceConfig> linked;
  adoptInterface(linked,
                 [config](UUID const& iid, void** raw) { return config->getConfigLocationServiceIf(iid, raw); });
  std::string const linkedName = listedName(linked.get());
  if (!linkedName.empty() && linkedName != serviceName.str())
    line(identity + Words{"location-service", "set", linkedName});
  saveAliases(identity, config);
  saveValues(identity, config);
  for (size_t face = 0; face < faceNames().size(); ++face) {
    RefPtr<IUnknown> own;
    adoptInterface(own, [config, face](UUID const& iid, void** raw) {
      return config->getConfigFaceIf(static_cast<LS_IdentityFace::Type>(face), iid, raw);
    });
    Words const prefix = {"face", identity[1], identity[2], faceNames()[face]};
    if (own)
      saveFace(identity, prefix, own.get());
  }
}

// An own record without any alias is written as "alias clear": it hides the
// base's aliases, which no record would not.
void ModelSaver::saveAliases(Words const& identity, LS_IIdentityConfig* config) {
  unsigned int names = 0;
  unsigned int ranges = 0;
  unsigned int expressions = 0;
  if (config->getNumberOfConfigAliasNames(names).isFailure())
    return;
  config->getNumberOfConfigAliasRanges(ranges);
  config->getNumberOfConfigAliasExpressions(expressions);
  if (names + ranges + expressions == 0)
    line(identity + Words{"alias", "clear"});
  for (unsigned int index = 0; index < names; ++index) {
    String name;
    config->getConfigAliasName(index, name);
    line(identity + Words{"alias-name", "add", name.str()});
  }
  for (unsigned int index = 0; index < ranges; ++index) {
    String from;
    String to;
    config->getConfigAliasRange(index, from, to);
    line(identity + Words{"alias-range", "add", from.str(), to.str()});
  }
  for (unsigned int index = 0; index < expressions; ++index) {
    String expression;
    config->getConfigAliasExpression(index, expression);
    line(identity + Words{"alias-expression", "add", expression.str()});
  }
}

void ModelSaver::saveValues(Words const& identity, LS_IIdentityConfig* config) {
  setting(identity, "display-name", ownSetting(config, &LS_IIdentityConfig::getConfigDisplayName, textWord));
  setting(identity, "phone-context", ownSetting(config, &LS_IIdentityConfig::getConfigPhoneContext, textWord));
  setting(identity, "user-representation",
          ownSetting(config, &LS_IIdentityConfig::getConfigUserRepresentation, enumerationWordOf<LS_User>));
}

void ModelSaver::setting(Words const& prefix, char const* name, std::optional<std::string> const& value) {
  if (value)
    line(prefix + Words{name, "set", *value});
}

void ModelSaver::saveFace(Words const& identity, Words const& face, IUnknown* config) {
  line(identity + Words{"face", face.back(), "create"});
  saveOutbound(face, config);
  saveInbound(face, config);
  saveRegistrationOutbound(face, config);
  saveRegistrationInbound(face, config);
  saveMwiSubscription(face, config);
  saveCall(face, config);
  saveAuthentication(face, config);
}

void ModelSaver::saveOutbound(Words const& face, IUnknown* config) {
  RefPtr<LS_IOutboundConfig> outbound;
  if (config->queryIf(outbound).isFailure())
    return;
  unsigned int proxies = 0;
  if (outbound->getNumberOfConfigProxies(proxies).isSuccess() && proxies == 0)
    line(face + Words{"proxies", "clear"});
  for (unsigned int index = 0; index < proxies; ++index) {
    CHostPort proxy;
    CHostPort tlsProxy;
    bool strict = false;
    outbound->getConfigProxy(index, proxy, tlsProxy, strict);
    Words words = face + Words{"proxy", "insert", numberWord(index), hostPortWord(proxy), strict ? "strict" : "loose"};
    if (!isEmpty(tlsProxy))
      words.push_back(hostPortWord(tlsProxy));
    line(words);
  }
  using Config = LS_IOutboundConfig;
  Config const* const get = outbound.get();
  setting(face, "preferred-protocol",
          ownSetting(get, &Config::getConfigPreferredProtocol, enumerationWordOf<LS_ProtocolConfig>));
  setting(face, "traffic-class", ownSetting(get, &Config::getConfigTrafficClass, numberWord));
  setting(face, "invite-transaction-timeout", ownSetting(get, &Config::getConfigInviteTransactionTimeout, numberWord));
  setting(face, "non-invite-transaction-timeout",
          ownSetting(get, &Config::getConfigNonInviteTransactionTimeout, numberWord));
  setting(face, "penalty-box", ownSetting(get, &Config::getConfigPenaltyBox, switchWord));
  setting(face, "request-uri-dynamic-registrar",
          ownSetting(get, &Config::getConfigRequestUriDynamicRegistrar, switchWord));
  setting(face, "use-flows", ownSetting(get, &Config::getConfigUseFlows, switchWord));
  LS_ForcedDestination destination;
  if (outbound->getConfigForcedDestination(destination).isFailure())
    return;
  Words words = face + Words{"forced-destination", "set", enumerationWordOf<LS_ForcedDestination>(destination.type)};
  // The language has no word for an empty host-port, so a TLS destination
  // is written only behind a plain one.
  if (!isEmpty(destination.udpTcpAddress)) {
    words.push_back(hostPortWord(destination.udpTcpAddress));
    if (!isEmpty(destination.tlsDestination))
      words.push_back(hostPortWord(destination.tlsDestination));
  }
  line(words);
}

void ModelSaver::saveInbound(Words const& face, IUnknown* config) {
  RefPtr<LS_IInboundConfig> inbound;
  if (config->queryIf(inbound).isFailure())
    return;
  for (unsigned int index = 0; index < inbound->getNumberOfConfigFilterRules(); ++index) {
    LS_FilterType::Type type = LS_FilterType::Type();
    IpAddress address;
    inbound->getConfigFilterRule(index, type, address);
    line(face + Words{"filter-rule", "insert", numberWord(index), enumerationWordOf<LS_FilterType>(type),
                      ipAddressWord(address)});
  }
}

// What the outbound-registration and message-waiting faces share, each
// under its own interface: the server with its TLS counterpart, the lifetime
// and the retry timeouts. The server's getter fails without the TLS
// address, though it has filled in the plain one.
template <class Config>
void ModelSaver::saveServer(Words const& face,
                            char const* server,
                            Config const* get,
                            XCode (Config::*getServer)(CHostPort&, CHostPort&) const) {
  CHostPort address;
  CHostPort tls;
  (get->*getServer)(address, tls);
  if (!isEmpty(address)) {
    Words words = face + Words{server, "set", hostPortWord(address)};
    if (!isEmpty(tls))
      words.push_back(hostPortWord(tls));
    line(words);
  }
  setting(face, "lifetime", ownSetting(get, &Config::getConfigLifetime, numberWord));
  setting(face, "retry-timeout-on-system-error",
          ownSetting(get, &Config::getConfigRetryTimeoutOnSystemError, numberWord));
  setting(face, "retry-timeout-on-client-error",
          ownSetting(get, &Config::getConfigRetryTimeoutOnClientError, numberWord));
  setting(face, "retry-timeout-on-server-error",
          ownSetting(get, &Config::getConfigRetryTimeoutOnServerError, numberWord));
}

void ModelSaver::saveRegistrationOutbound(Words const& face, IUnknown* config) {
  RefPtr<LS_IRegistrationOutboundConfig> registration;
  if (config->queryIf(registration).isFailure())
    return;
  using Config = LS_IRegistrationOutboundConfig;
  Config const* const get = registration.get();
  saveServer(face, "registrar", get, &Config::getConfigRegistrar);
  setting(face, "dns-security-check", ownSetting(get, &Config::getConfigDnsSecurityCheck, switchWord));
  setting(face, "registration-mode",
          ownSetting(get, &Config::getConfigRegistrationMode, enumerationWordOf<LS_RegistrationMode>));
  setting(face, "uri-scheme", ownSetting(get, &Config::getConfigUriScheme, enumerationWordOf<LS_UriScheme>));
  setting(face, "nat-traversal-flows", ownSetting(get, &Config::getConfigNatTraversalFlows, switchWord));
  setting(face, "nat-traversal-method",
          ownSetting(get, &Config::getConfigNatTraversalMethod, enumerationWordOf<LS_NatTraversalMethod>));
  setting(face, "keep-alive-method",
          ownSetting(get, &Config::getConfigKeepAliveMethod, enumerationWordOf<LS_KeepAliveMethod>));
  setting(face, "keep-alive-interval", ownSetting(get, &Config::getConfigKeepAliveInterval, numberWord));
  setting(face, "priority", ownSetting(get, &Config::getConfigPriority, numberWord));
}

void ModelSaver::saveRegistrationInbound(Words const& face, IUnknown* config) {
  RefPtr<LS_IRegistrationInboundConfig> registration;
  if (config->queryIf(registration).isFailure())
    return;
  unsigned int minimum = 0;
  unsigned int maximum = 0;
  unsigned int defaultLifetime = 0;
  if (registration->getConfigLifetimeRange(minimum, maximum, defaultLifetime).isSuccess())
    line(face + Words{"lifetime-range", "set", numberWord(minimum), numberWord(maximum), numberWord(defaultLifetime)});
  for (unsigned int index = 0; index < registration->getNumberOfConfigContacts(); ++index) {
    CNameAddr contact;
    String context;
    String provider;
    unsigned int priority = 0;
    registration->getConfigContact(index, contact, context, provider, priority);
    line(face + Words{"contact", "add", LS_nameAddrToString(contact).str(), context.str(), provider.str(),
                      numberWord(priority)});
  }
}

void ModelSaver::saveMwiSubscription(Words const& face, IUnknown* config) {
  RefPtr<LS_IMwiSubscriptionConfig> subscription;
  if (config->queryIf(subscription).isFailure())
    return;
  using Config = LS_IMwiSubscriptionConfig;
  Config const* const get = subscription.get();
  saveServer(face, "mwi-notifier", get, &Config::getConfigMwiNotifier);
  setting(face, "mwi-subscription-mode",
          ownSetting(get, &Config::getConfigMwiSubscriptionMode, enumerationWordOf<LS_MwiSubscriptionMode>));
}

void ModelSaver::saveCall(Words const& face, IUnknown* config) {
  RefPtr<LS_ICallConfig> call;
  if (config->queryIf(call).isFailure())
    return;
  LS_ICallConfig const* const get = call.get();
  setting(face, "voip-profile", ownSetting(get, &LS_ICallConfig::getConfigVoipProfile, textWord));
  setting(face, "tone-set-profile", ownSetting(get, &LS_ICallConfig::getConfigToneSetProfile, textWord));
  setting(face, "sip-profile", ownSetting(get, &LS_ICallConfig::getConfigSipProfile, textWord));
}

// An own list without entries is left out: entries add to the base's, so an
// empty list changes nothing, and the language makes one only from a list
// that had entries.
void ModelSaver::saveAuthentication(Words const& face, IUnknown* config) {
  RefPtr<LS_IAuthenticationConfig> authentication;
  if (config->queryIf(authentication).isFailure())
    return;
  unsigned int entries = 0;
  authentication->getNumberOfConfigAuthenticates(entries);
  for (unsigned int index = 0; index < entries; ++index) {
    String service;
    String user;
    authentication->getConfigAuthenticate(index, service, user);
    Words words = face + Words{"authenticate", "insert", numberWord(index), service.str()};
    if (!user.isEmpty())
      words.push_back(user.str());
    line(words);
  }
}
