#include "ConfigCommands.h"

#include <functional>
#include <type_traits>

#include "FaceNames.h"
#include "LS_IAuthenticationConfig.h"
#include "LS_ICallConfig.h"
#include "LS_IInboundConfig.h"
#include "LS_IMwiSubscriptionConfig.h"
#include "LS_IOutboundConfig.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutboundConfig.h"
#include "RegEx.h"
#include "ScriptSession.h"

namespace {

using Session = ScriptSession;
using Args = Arguments;

// The longest base chain the location service accepts above a new identity.
constexpr unsigned int kMaximumBaseChain = 10;

// Library operations that fail say nothing about why; the console names the
// operation and the usual causes.
void require(XCode result, size_t column, std::string const& message) {
  if (result.isFailure())
    throw CommandError(column, message);
}

// The value of a setting's placeholder, of the type its setter takes.
template <class V>
V valueOf(Args const& arguments, char const* name) {
  if constexpr (std::is_same_v<V, bool>)
    return arguments.on(name);
  else if constexpr (std::is_enum_v<V>)
    return static_cast<V>(arguments.number(name));
  else if constexpr (std::is_same_v<V, unsigned int>)
    return arguments.number(name);
  else
    return String(arguments.text(name).c_str());
}

// A setting with a setter and a remover ("<prefix> <setting> set <value>",
// "<prefix> <setting> remove") that lives on one or more interfaces: face
// settings such as lifetime exist on two faces under one name. A line
// applies to the first interface the named object implements.
class Settings {
 public:
  // Applies the line to one interface; false when the object lacks it.
  using Apply = std::function<bool(Session&, Args const&, bool set)>;

  Settings(std::string prefix, std::string owner) : m_prefix(std::move(prefix)), m_owner(std::move(owner)) {}

  template <class T, class V>
  void add(char const* setting,
           char const* placeholder,
           char const* operation,
           RefPtr<T> (*find)(Session&, Args const&),
           void (T::*set)(V),
           void (T::*remove)()) {
    Entry& entry = entryFor(setting, placeholder);
    if (entry.operations.empty())
      entry.operations = std::string("setConfig") + operation + ", removeConfig" + operation;
    entry.appliers.push_back([=](Session& session, Args const& arguments, bool setting) {
      RefPtr<T> const target = find(session, arguments);
      if (!target)
        return false;
      if (setting)
        (target.get()->*set)(valueOf<std::decay_t<V>>(arguments, placeholder));
      else
        (target.get()->*remove)();
      return true;
    });
  }

  void addTo(CommandTable& table) const {
    for (Entry const& entry : m_entries) {
      std::string const start = m_prefix + " " + entry.setting;
      for (bool const setting : {true, false}) {
        std::string const pattern = start + (setting ? " set <" + entry.placeholder + ">" : " remove");
        std::string const owner = m_owner;
        table.add(pattern, entry.operations, [entry, setting, owner](Session& session, Args const& arguments) {
          for (Apply const& apply : entry.appliers)
            if (apply(session, arguments, setting))
              return;
          throw CommandError(arguments.column(owner.c_str()),
                             "the " + arguments.text(owner.c_str()) + " face has no " + entry.setting);
        });
      }
    }
  }

 private:
  struct Entry {
    std::string setting;
    std::string placeholder;
    std::string operations;
    std::vector<Apply> appliers;
  };

  Entry& entryFor(char const* setting, char const* placeholder) {
    for (Entry& entry : m_entries)
      if (entry.setting == setting)
        return entry;
    m_entries.push_back(Entry{setting, placeholder, std::string(), {}});
    return m_entries.back();
  }

  std::string m_prefix;
  // The argument that names the object, for complaints.
  std::string m_owner;
  std::vector<Entry> m_entries;
};

template <class T>
RefPtr<T> faceOf(Session& session, Args const& arguments) {
  return session.faceIf<T>(arguments);
}

RefPtr<LS_IIdentityConfig> identityOf(Session& session, Args const& arguments) {
  return session.identityConfig(arguments);
}

void addLocationServiceCommands(CommandTable& table) {
  table.add("location-service <service> create", "LS_IMasterLocationService::createLocationServiceIf",
            [](Session& session, Args const& arguments) {
              RefPtr<LS_ILocationServiceConfig> created;
              std::string const& name = arguments.text("service");
              if (LS_getLocationServiceIf(session.locationMaster(), name.c_str(), created).isSuccess())
                throw CommandError(arguments.column("service"), "location service \"" + name + "\" exists already");
              require(adoptInterface(created,
                                     [&](UUID const& iid, void** raw) {
                                       return session.locationMaster()->createLocationServiceIf(name.c_str(), iid, raw);
                                     }),
                      arguments.column("service"), "the master refused to create location service \"" + name + "\"");
            });
  table.add("location-service <service> remove", "LS_IMasterLocationService::removeLocationService",
            [](Session& session, Args const& arguments) {
              session.service(arguments);
              session.locationMaster()->removeLocationService(arguments.text("service").c_str());
            });
  table.add("location-service <service> name set <name>", "LS_ILocationServiceConfig::setConfigName",
            [](Session& session, Args const& arguments) {
              session.serviceConfig(arguments)->setConfigName(arguments.text("name").c_str());
            });
  table.add("location-service <service> imperative set <imperative>",
            "LS_ILocationServiceConfig::setConfigImperative", [](Session& session, Args const& arguments) {
              session.serviceConfig(arguments)->setConfigImperative(arguments.choice<LS_Imperative>("imperative"));
            });
  table.add("location-service <service> default-domain set <on|off>",
            "LS_ILocationServiceConfig::setConfigDefaultDomain", [](Session& session, Args const& arguments) {
              session.serviceConfig(arguments)->setConfigDefaultDomain(arguments.on("on|off"));
            });
  table.add("location-service <service> domain insert <index> <domain>",
            "LS_ILocationServiceConfig::insertConfigDomain", [](Session& session, Args const& arguments) {
              session.serviceConfig(arguments)->insertConfigDomain(arguments.number("index"),
                                                                   arguments.hostPort("domain"));
            });
  table.add("location-service <service> domain modify <index> <domain>",
            "LS_ILocationServiceConfig::modifyConfigDomain", [](Session& session, Args const& arguments) {
              session.serviceConfig(arguments)->modifyConfigDomain(arguments.number("index"),
                                                                   arguments.hostPort("domain"));
            });
  table.add("location-service <service> domain move <index> <delta>", "LS_ILocationServiceConfig::moveConfigDomain",
            [](Session& session, Args const& arguments) {
              session.serviceConfig(arguments)->moveConfigDomain(arguments.number("index"), arguments.delta("delta"));
            });
  table.add("location-service <service> domain remove <domain>", "LS_ILocationServiceConfig::removeConfigDomain",
            [](Session& session, Args const& arguments) {
              session.serviceConfig(arguments)->removeConfigDomain(arguments.hostPort("domain"));
            });
}

void addIdentityCommands(CommandTable& table) {
  table.add("identity <service> <identity> create <identity-type> [<base>]",
            "LS_ILocationServiceConfig::createConfigIdentityIf", [](Session& session, Args const& arguments) {
              RefPtr<LS_ILocationServiceConfig> const service = session.serviceConfig(arguments);
              std::string const& name = arguments.text("identity");
              RefPtr<LS_IIdentity> existing;
              if (LS_getIdentityIf(session.service(arguments).get(), name.c_str(), existing).isSuccess())
                throw CommandError(arguments.column("identity"), "identity \"" + name + "\" exists already");
              std::string const base = arguments.has("base") ? arguments.text("base") : std::string();
              RefPtr<LS_IIdentityConfig> baseIdentity;
              if (!base.empty() && LS_getConfigIdentityIf(service.get(), base.c_str(), baseIdentity).isFailure())
                throw CommandError(arguments.column("base"), "no configured identity \"" + base +
                                                                 "\" in location service \"" +
                                                                 arguments.text("service") + "\" to base it on");
              RefPtr<LS_IIdentityConfig> created;
              require(adoptInterface(created,
                                     [&](UUID const& iid, void** raw) {
                                       return service->createConfigIdentityIf(
                                           name.c_str(), base.c_str(),
                                           arguments.choice<LS_IdentityType>("identity-type"), iid, raw);
                                     }),
                      arguments.column("identity"), "the location service refused to create \"" + name + "\"");
            });
  table.add("identity <service> <identity> remove", "LS_ILocationServiceConfig::removeConfigIdentity",
            [](Session& session, Args const& arguments) {
              session.identityConfig(arguments);
              session.serviceConfig(arguments)->removeConfigIdentity(arguments.text("identity").c_str());
            });
  table.add("identity <service> <identity> name set <name>", "LS_IIdentityConfig::setConfigName",
            [](Session& session, Args const& arguments) {
              session.identityConfig(arguments)->setConfigName(arguments.text("name").c_str());
            });
  table.add("identity <service> <identity> type set <identity-type>", "LS_IIdentityConfig::setConfigIdentityType",
            [](Session& session, Args const& arguments) {
              session.identityConfig(arguments)->setConfigIdentityType(
                  arguments.choice<LS_IdentityType>("identity-type"));
            });
  table.add("identity <service> <identity> base set <base>", "LS_IIdentityConfig::setConfigBaseIdentity",
            [](Session& session, Args const& arguments) {
              RefPtr<LS_IIdentityConfig> const identity = session.identityConfig(arguments);
              RefPtr<LS_IIdentityConfig> base;
              if (LS_getConfigIdentityIf(session.serviceConfig(arguments).get(), arguments.text("base").c_str(), base)
                      .isFailure())
                throw CommandError(arguments.column("base"), "no configured identity \"" + arguments.text("base") +
                                                                 "\" in location service \"" +
                                                                 arguments.text("service") + "\"");
              // The check the location service makes when it creates an
              // identity with a base; setting the base itself checks nothing.
              require(base->isNoIdentityConfigLoop(identity.get(), kMaximumBaseChain), arguments.column("base"),
                      "\"" + arguments.text("base") + "\" cannot be the base: the bases would form a loop or a chain "
                      "longer than " + std::to_string(kMaximumBaseChain));
              require(identity->setConfigBaseIdentity(base.get()), arguments.column("base"),
                      "the identity refused \"" + arguments.text("base") + "\" as its base");
            });
  table.add("identity <service> <identity> base remove", "LS_IIdentityConfig::setConfigBaseIdentity with none",
            [](Session& session, Args const& arguments) {
              session.identityConfig(arguments)->setConfigBaseIdentity(nullptr);
            });
  table.add("identity <service> <identity> location-service set <new-service>",
            "LS_IIdentityConfig::setConfigLocationService", [](Session& session, Args const& arguments) {
              RefPtr<LS_IIdentityConfig> const identity = session.identityConfig(arguments);
              RefPtr<LS_ILocationServiceConfig> target;
              std::string const& name = arguments.text("new-service");
              if (LS_getLocationServiceIf(session.locationMaster(), name.c_str(), target).isFailure())
                throw CommandError(arguments.column("new-service"), "no location service \"" + name + "\"");
              require(identity->setConfigLocationService(target.get()), arguments.column("new-service"),
                      "the identity refused location service \"" + name + "\"");
            });
  table.add("identity <service> <identity> alias-name add <name>", "LS_IIdentityConfig::addConfigAliasName",
            [](Session& session, Args const& arguments) {
              require(session.identityConfig(arguments)->addConfigAliasName(arguments.text("name").c_str()),
                      arguments.column("name"), "the identity refused alias name \"" + arguments.text("name") + "\"");
            });
  table.add("identity <service> <identity> alias-name remove <name>", "LS_IIdentityConfig::removeConfigAliasName",
            [](Session& session, Args const& arguments) {
              session.identityConfig(arguments)->removeConfigAliasName(arguments.text("name").c_str());
            });
  table.add("identity <service> <identity> alias-range add <from> <to>", "LS_IIdentityConfig::addConfigAliasRange",
            [](Session& session, Args const& arguments) {
              require(session.identityConfig(arguments)->addConfigAliasRange(arguments.text("from").c_str(),
                                                                             arguments.text("to").c_str()),
                      arguments.column("from"), "the identity refused the alias range");
            });
  table.add("identity <service> <identity> alias-range remove <from> <to>",
            "LS_IIdentityConfig::removeConfigAliasRange", [](Session& session, Args const& arguments) {
              session.identityConfig(arguments)->removeConfigAliasRange(arguments.text("from").c_str(),
                                                                        arguments.text("to").c_str());
            });
  table.add("identity <service> <identity> alias-expression add <expression>",
            "LS_IIdentityConfig::addConfigAliasExpression", [](Session& session, Args const& arguments) {
              RefPtr<LS_IIdentityConfig> const identity = session.identityConfig(arguments);
              String const expression = arguments.text("expression").c_str();
              // The identity takes an expression that does not compile
              // without a word and matches nothing with it.
              if (!RegEx::COMPILE_EXPRESSION(expression))
                throw CommandError(arguments.column("expression"),
                                   "expected a regular expression; \"" + expression.str() + "\" does not compile");
              require(identity->addConfigAliasExpression(expression), arguments.column("expression"),
                      "the identity refused alias expression \"" + expression.str() + "\"");
            });
  table.add("identity <service> <identity> alias-expression remove <expression>",
            "LS_IIdentityConfig::removeConfigAliasExpression", [](Session& session, Args const& arguments) {
              session.identityConfig(arguments)->removeConfigAliasExpression(arguments.text("expression").c_str());
            });
  table.add("identity <service> <identity> alias clear", "LS_IIdentityConfig::clearConfigAlias",
            [](Session& session, Args const& arguments) { session.identityConfig(arguments)->clearConfigAlias(); });
  table.add("identity <service> <identity> alias destroy", "LS_IIdentityConfig::destroyConfigAlias",
            [](Session& session, Args const& arguments) { session.identityConfig(arguments)->destroyConfigAlias(); });

  Settings values("identity <service> <identity>", "identity");
  values.add("display-name", "text", "DisplayName", identityOf, &LS_IIdentityConfig::setConfigDisplayName,
             &LS_IIdentityConfig::removeConfigDisplayName);
  values.add("phone-context", "text", "PhoneContext", identityOf, &LS_IIdentityConfig::setConfigPhoneContext,
             &LS_IIdentityConfig::removeConfigPhoneContext);
  values.add("user-representation", "user-representation", "UserRepresentation", identityOf,
             &LS_IIdentityConfig::setConfigUserRepresentation, &LS_IIdentityConfig::removeConfigUserRepresentation);
  values.addTo(table);

  table.add("identity <service> <identity> face <face> create", "LS_IIdentityConfig::createConfigFaceIf",
            [](Session& session, Args const& arguments) {
              RefPtr<LS_IIdentityConfig> const identity = session.identityConfig(arguments);
              RefPtr<IUnknown> face;
              require(adoptInterface(face,
                                     [&](UUID const& iid, void** raw) {
                                       return identity->createConfigFaceIf(arguments.choice<LS_IdentityFace>("face"),
                                                                           iid, raw);
                                     }),
                      arguments.column("face"), "the identity refused to create its " + arguments.text("face") +
                                                    " face");
            });
  table.add("identity <service> <identity> face <face> remove", "LS_IIdentityConfig::removeConfigFace",
            [](Session& session, Args const& arguments) {
              session.ownFace(arguments);
              session.identityConfig(arguments)->removeConfigFace(arguments.choice<LS_IdentityFace>("face"));
            });
}

// "face <service> <identity> <face> ..." on the identity's own face.
void addFaceCommands(CommandTable& table) {
  std::string const face = "face <service> <identity> <face> ";
  table.add(face + "proxy insert <index> <proxy> <route> [<tls-proxy>]", "LS_IOutboundConfig::insertConfigProxy",
            [](Session& session, Args const& arguments) {
              require(session.faceConfig<LS_IOutboundConfig>(arguments)->insertConfigProxy(
                          arguments.number("index"), arguments.hostPort("proxy"), arguments.hostPort("tls-proxy"),
                          arguments.number("route") == 1),
                      arguments.column("index"), "the face refused to insert a proxy at this index");
            });
  table.add(face + "proxy modify <index> <proxy> <route> [<tls-proxy>]", "LS_IOutboundConfig::modifyConfigProxy",
            [](Session& session, Args const& arguments) {
              require(session.faceConfig<LS_IOutboundConfig>(arguments)->modifyConfigProxy(
                          arguments.number("index"), arguments.hostPort("proxy"), arguments.hostPort("tls-proxy"),
                          arguments.number("route") == 1),
                      arguments.column("index"), "the face has no own proxy at this index");
            });
  table.add(face + "proxy move <index> <delta>", "LS_IOutboundConfig::moveConfigProxy",
            [](Session& session, Args const& arguments) {
              require(session.faceConfig<LS_IOutboundConfig>(arguments)->moveConfigProxy(arguments.number("index"),
                                                                                          arguments.delta("delta")),
                      arguments.column("index"), "the face cannot move its proxy at this index");
            });
  table.add(face + "proxy remove <index>", "LS_IOutboundConfig::removeConfigProxy",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IOutboundConfig>(arguments)->removeConfigProxy(arguments.number("index"));
            });
  table.add(face + "proxies clear", "LS_IOutboundConfig::clearConfigProxies",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IOutboundConfig>(arguments)->clearConfigProxies();
            });
  table.add(face + "proxies destroy", "LS_IOutboundConfig::destroyConfigProxies",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IOutboundConfig>(arguments)->destroyConfigProxies();
            });
  table.add(face + "forced-destination set <destination-type> [<destination>] [<tls-destination>]",
            "LS_IOutboundConfig::setConfigForcedDestination", [](Session& session, Args const& arguments) {
              LS_ForcedDestination destination;
              destination.type = arguments.choice<LS_ForcedDestination>("destination-type");
              destination.udpTcpAddress = arguments.hostPort("destination");
              destination.tlsDestination = arguments.hostPort("tls-destination");
              session.faceConfig<LS_IOutboundConfig>(arguments)->setConfigForcedDestination(destination);
            });
  table.add(face + "forced-destination remove", "LS_IOutboundConfig::removeConfigForcedDestination",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IOutboundConfig>(arguments)->removeConfigForcedDestination();
            });
  table.add(face + "filter-rule insert <index> <filter-type> <ip-address>",
            "LS_IInboundConfig::insertConfigFilterRule", [](Session& session, Args const& arguments) {
              require(session.faceConfig<LS_IInboundConfig>(arguments)->insertConfigFilterRule(
                          arguments.number("index"), arguments.choice<LS_FilterType>("filter-type"),
                          arguments.ipAddress("ip-address")),
                      arguments.column("index"), "the face refused to insert a filter rule at this index");
            });
  table.add(face + "filter-rule modify <index> <filter-type> <ip-address>",
            "LS_IInboundConfig::modifyConfigFilterRule", [](Session& session, Args const& arguments) {
              require(session.faceConfig<LS_IInboundConfig>(arguments)->modifyConfigFilterRule(
                          arguments.number("index"), arguments.choice<LS_FilterType>("filter-type"),
                          arguments.ipAddress("ip-address")),
                      arguments.column("index"), "the face has no own filter rule at this index");
            });
  table.add(face + "filter-rule remove <index>", "LS_IInboundConfig::removeConfigFilterRule",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IInboundConfig>(arguments)->removeConfigFilterRule(arguments.number("index"));
            });
  table.add(face + "registrar set <registrar> [<tls-registrar>]", "LS_IRegistrationOutboundConfig::setConfigRegistrar",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IRegistrationOutboundConfig>(arguments)->setConfigRegistrar(
                  arguments.hostPort("registrar"), arguments.hostPort("tls-registrar"));
            });
  table.add(face + "registrar remove", "LS_IRegistrationOutboundConfig::removeConfigRegistrar",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IRegistrationOutboundConfig>(arguments)->removeConfigRegistrar();
            });
  table.add(face + "lifetime-range set <minimum> <maximum> <default>",
            "LS_IRegistrationInboundConfig::setConfigLifetimeRange", [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IRegistrationInboundConfig>(arguments)->setConfigLifetimeRange(
                  arguments.number("minimum"), arguments.number("maximum"), arguments.number("default"));
            });
  table.add(face + "lifetime-range remove", "LS_IRegistrationInboundConfig::removeConfigLifetimeRange",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IRegistrationInboundConfig>(arguments)->removeConfigLifetimeRange();
            });
  table.add(face + "contact add <contact> <context> <provider> <priority>",
            "LS_IRegistrationInboundConfig::addConfigContact", [](Session& session, Args const& arguments) {
              require(session.faceConfig<LS_IRegistrationInboundConfig>(arguments)->addConfigContact(
                          arguments.nameAddr("contact"), arguments.text("context").c_str(),
                          arguments.text("provider").c_str(), arguments.number("priority")),
                      arguments.column("contact"), "the face refused the contact");
            });
  table.add(face + "contact remove <contact>", "LS_IRegistrationInboundConfig::removeConfigContact",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IRegistrationInboundConfig>(arguments)->removeConfigContact(
                  arguments.nameAddr("contact"));
            });
  table.add(face + "mwi-notifier set <notifier> [<tls-notifier>]", "LS_IMwiSubscriptionConfig::setConfigMwiNotifier",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IMwiSubscriptionConfig>(arguments)->setConfigMwiNotifier(
                  arguments.hostPort("notifier"), arguments.hostPort("tls-notifier"));
            });
  table.add(face + "mwi-notifier remove", "LS_IMwiSubscriptionConfig::removeConfigMwiNotifier",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IMwiSubscriptionConfig>(arguments)->removeConfigMwiNotifier();
            });
  table.add(face + "authenticate insert <index> <authentication-service> [<user>]",
            "LS_IAuthenticationConfig::insertConfigAuthenticate", [](Session& session, Args const& arguments) {
              std::string const user = arguments.has("user") ? arguments.text("user") : std::string();
              require(session.faceConfig<LS_IAuthenticationConfig>(arguments)->insertConfigAuthenticate(
                          arguments.number("index"), arguments.text("authentication-service").c_str(), user.c_str()),
                      arguments.column("index"), "the face refused to insert an entry at this index");
            });
  table.add(face + "authenticate modify <index> <authentication-service> [<user>]",
            "LS_IAuthenticationConfig::modifyConfigAuthenticate", [](Session& session, Args const& arguments) {
              std::string const user = arguments.has("user") ? arguments.text("user") : std::string();
              require(session.faceConfig<LS_IAuthenticationConfig>(arguments)->modifyConfigAuthenticate(
                          arguments.number("index"), arguments.text("authentication-service").c_str(), user.c_str()),
                      arguments.column("index"), "the face has no own entry at this index");
            });
  table.add(face + "authenticate move <index> <delta>", "LS_IAuthenticationConfig::moveConfigAuthenticate",
            [](Session& session, Args const& arguments) {
              require(session.faceConfig<LS_IAuthenticationConfig>(arguments)->moveConfigAuthenticate(
                          arguments.number("index"), arguments.delta("delta")),
                      arguments.column("index"), "the face cannot move its entry at this index");
            });
  table.add(face + "authenticate remove <index>", "LS_IAuthenticationConfig::removeConfigAuthenticate",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IAuthenticationConfig>(arguments)->removeConfigAuthenticate(
                  arguments.number("index"));
            });
  table.add(face + "authenticates clear", "LS_IAuthenticationConfig::clearConfigAuthenticates",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IAuthenticationConfig>(arguments)->clearConfigAuthenticates();
            });
  table.add(face + "authenticates destroy", "LS_IAuthenticationConfig::destroyConfigAuthenticates",
            [](Session& session, Args const& arguments) {
              session.faceConfig<LS_IAuthenticationConfig>(arguments)->destroyConfigAuthenticates();
            });

  using Outbound = LS_IOutboundConfig;
  using RegistrationOutbound = LS_IRegistrationOutboundConfig;
  using Mwi = LS_IMwiSubscriptionConfig;
  using Call = LS_ICallConfig;
  Settings settings("face <service> <identity> <face>", "face");
  settings.add("preferred-protocol", "preferred-protocol", "PreferredProtocol", faceOf<Outbound>,
               &Outbound::setConfigPreferredProtocol, &Outbound::removeConfigPreferredProtocol);
  settings.add("traffic-class", "traffic-class", "TrafficClass", faceOf<Outbound>, &Outbound::setConfigTrafficClass,
               &Outbound::removeConfigTrafficClass);
  settings.add("invite-transaction-timeout", "timeout", "InviteTransactionTimeout", faceOf<Outbound>,
               &Outbound::setConfigInviteTransactionTimeout, &Outbound::removeConfigInviteTransactionTimeout);
  settings.add("non-invite-transaction-timeout", "timeout", "NonInviteTransactionTimeout", faceOf<Outbound>,
               &Outbound::setConfigNonInviteTransactionTimeout, &Outbound::removeConfigNonInviteTransactionTimeout);
  settings.add("penalty-box", "on|off", "PenaltyBox", faceOf<Outbound>, &Outbound::setConfigPenaltyBox,
               &Outbound::removeConfigPenaltyBox);
  settings.add("request-uri-dynamic-registrar", "on|off", "RequestUriDynamicRegistrar", faceOf<Outbound>,
               &Outbound::setConfigRequestUriDynamicRegistrar, &Outbound::removeConfigRequestUriDynamicRegistrar);
  settings.add("use-flows", "on|off", "UseFlows", faceOf<Outbound>, &Outbound::setConfigUseFlows,
               &Outbound::removeConfigUseFlows);
  settings.add("lifetime", "lifetime", "Lifetime", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigLifetime, &RegistrationOutbound::removeConfigLifetime);
  settings.add("lifetime", "lifetime", "Lifetime", faceOf<Mwi>, &Mwi::setConfigLifetime, &Mwi::removeConfigLifetime);
  settings.add("dns-security-check", "on|off", "DnsSecurityCheck", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigDnsSecurityCheck, &RegistrationOutbound::removeConfigDnsSecurityCheck);
  settings.add("registration-mode", "registration-mode", "RegistrationMode", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigRegistrationMode, &RegistrationOutbound::removeConfigRegistrationMode);
  settings.add("uri-scheme", "uri-scheme", "UriScheme", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigUriScheme, &RegistrationOutbound::removeConfigUriScheme);
  settings.add("retry-timeout-on-system-error", "timeout", "RetryTimeoutOnSystemError", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigRetryTimeoutOnSystemError,
               &RegistrationOutbound::removeConfigRetryTimeoutOnSystemError);
  settings.add("retry-timeout-on-system-error", "timeout", "RetryTimeoutOnSystemError", faceOf<Mwi>,
               &Mwi::setConfigRetryTimeoutOnSystemError, &Mwi::removeConfigRetryTimeoutOnSystemError);
  settings.add("retry-timeout-on-client-error", "timeout", "RetryTimeoutOnClientError", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigRetryTimeoutOnClientError,
               &RegistrationOutbound::removeConfigRetryTimeoutOnClientError);
  settings.add("retry-timeout-on-client-error", "timeout", "RetryTimeoutOnClientError", faceOf<Mwi>,
               &Mwi::setConfigRetryTimeoutOnClientError, &Mwi::removeConfigRetryTimeoutOnClientError);
  settings.add("retry-timeout-on-server-error", "timeout", "RetryTimeoutOnServerError", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigRetryTimeoutOnServerError,
               &RegistrationOutbound::removeConfigRetryTimeoutOnServerError);
  settings.add("retry-timeout-on-server-error", "timeout", "RetryTimeoutOnServerError", faceOf<Mwi>,
               &Mwi::setConfigRetryTimeoutOnServerError, &Mwi::removeConfigRetryTimeoutOnServerError);
  settings.add("nat-traversal-flows", "on|off", "NatTraversalFlows", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigNatTraversalFlows, &RegistrationOutbound::removeConfigNatTraversalFlows);
  settings.add("nat-traversal-method", "nat-traversal-method", "NatTraversalMethod", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigNatTraversalMethod,
               &RegistrationOutbound::removeConfigNatTraversalMethod);
  settings.add("keep-alive-method", "keep-alive-method", "KeepAliveMethod", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigKeepAliveMethod, &RegistrationOutbound::removeConfigKeepAliveMethod);
  settings.add("keep-alive-interval", "interval", "KeepAliveInterval", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigKeepAliveInterval,
               &RegistrationOutbound::removeConfigKeepAliveInterval);
  settings.add("priority", "priority", "Priority", faceOf<RegistrationOutbound>,
               &RegistrationOutbound::setConfigPriority, &RegistrationOutbound::removeConfigPriority);
  settings.add("mwi-subscription-mode", "mwi-subscription-mode", "MwiSubscriptionMode", faceOf<Mwi>,
               &Mwi::setConfigMwiSubscriptionMode, &Mwi::removeConfigMwiSubscriptionMode);
  settings.add("voip-profile", "profile", "VoipProfile", faceOf<Call>, &Call::setConfigVoipProfile,
               &Call::removeConfigVoipProfile);
  settings.add("tone-set-profile", "profile", "ToneSetProfile", faceOf<Call>, &Call::setConfigToneSetProfile,
               &Call::removeConfigToneSetProfile);
  settings.add("sip-profile", "profile", "SipProfile", faceOf<Call>, &Call::setConfigSipProfile,
               &Call::removeConfigSipProfile);
  settings.addTo(table);
}

void addAuthenticationServiceCommands(CommandTable& table) {
  std::string const service = "authentication-service <authentication-service> ";
  table.add(service + "create", "LS_IMasterAuthenticationService::createAuthenticationServiceIf",
            [](Session& session, Args const& arguments) {
              std::string const& name = arguments.text("authentication-service");
              RefPtr<LS_IAuthenticationService> created;
              if (LS_getAuthenticationServiceIf(session.authenticationMaster(), name.c_str(), created).isSuccess())
                throw CommandError(arguments.column("authentication-service"),
                                   "authentication service \"" + name + "\" exists already");
              require(adoptInterface(created,
                                     [&](UUID const& iid, void** raw) {
                                       return session.authenticationMaster()->createAuthenticationServiceIf(
                                           name.c_str(), iid, raw);
                                     }),
                      arguments.column("authentication-service"),
                      "the master refused to create authentication service \"" + name + "\"");
            });
  table.add(service + "remove", "LS_IMasterAuthenticationService::removeAuthenticationService",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments);
              session.authenticationMaster()->removeAuthenticationService(
                  arguments.text("authentication-service").c_str());
            });
  table.add(service + "name set <name>", "LS_IAuthenticationService::setName",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->setName(arguments.text("name").c_str());
            });
  table.add(service + "protocol set <protocol>", "LS_IAuthenticationService::setProtocol",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->setProtocol(
                  arguments.choice<LS_AuthenticationProtocol>("protocol"));
            });
  table.add(service + "realm insert <index> <realm>", "LS_IAuthenticationService::insertRealm",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->insertRealm(arguments.number("index"),
                                                                    arguments.text("realm").c_str());
            });
  table.add(service + "realm modify <index> <realm>", "LS_IAuthenticationService::modifyRealm",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->modifyRealm(arguments.number("index"),
                                                                    arguments.text("realm").c_str());
            });
  table.add(service + "realm move <index> <delta>", "LS_IAuthenticationService::moveRealm",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->moveRealm(arguments.number("index"),
                                                                  arguments.delta("delta"));
            });
  table.add(service + "realm remove <realm>", "LS_IAuthenticationService::removeRealm",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->removeRealm(arguments.text("realm").c_str());
            });
  table.add(service + "credentials set <user> <password>", "LS_IAuthenticationService::setCredentials",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->setCredentials(arguments.text("user").c_str(),
                                                                       arguments.text("password").c_str());
            });
  table.add(service + "credentials remove <user>", "LS_IAuthenticationService::removeCredentials",
            [](Session& session, Args const& arguments) {
              session.authenticationService(arguments)->removeCredentials(arguments.text("user").c_str());
            });
}

}  // namespace

void addConfigCommands(CommandTable& table) {
  addLocationServiceCommands(table);
  addIdentityCommands(table);
  addFaceCommands(table);
  addAuthenticationServiceCommands(table);
}
