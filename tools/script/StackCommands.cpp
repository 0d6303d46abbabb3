#include "StackCommands.h"

#include "FaceNames.h"
#include "LS_AddressText.h"
#include "LS_CredentialLookup.h"
#include "LS_IMwiSubscription.h"
#include "LS_IOutbound.h"
#include "LS_IRegistrationInbound.h"
#include "LS_IRegistrationInboundConfig.h"
#include "LS_IRegistrationOutbound.h"
#include "LS_IdentityResolution.h"
#include "LS_ServiceResolution.h"
#include "ResolutionExplainer.h"
#include "ScriptLine.h"
#include "ScriptSession.h"
#include "SipStatistics.h"

namespace {

using Session = ScriptSession;
using Args = Arguments;

std::string quoted(String const& text) {
  return quotedWord(text.str());
}

// The message a lookup left, when it left one: a lookup may leave one even
// when it succeeds (a listed service that does not exist, an entry naming a
// missing authentication service).
void printError(Session& session, String const& error) {
  if (!error.isEmpty())
    session.output() << "error text: " << error.str() << "\n";
}

// The identity's own face of that kind, created as a dynamic face when it
// has none: where the SIP stack records what it learns, so that a group's
// face is never written through one of its members.
template <class T>
RefPtr<T> dynamicFace(Session& session, Args const& arguments, LS_IdentityFace::Type face) {
  RefPtr<LS_IIdentity> const identity = session.identity(arguments);
  RefPtr<T> created;
  adoptInterface(created, [&](UUID const& iid, void** raw) { return identity->createDynamicFaceIf(face, iid, raw); });
  if (!created)
    throw CommandError(arguments.column("identity"), "the identity refused to create its " + faceNames()[face] +
                                                         " face");
  return created;
}

// The identity's face of that kind as getFaceIf finds it, else null. An
// inherited face is the identity's own shadow of its base's face, which
// holds nothing of its own: removing a run-time entry from it finds nothing,
// and the base's face is never touched.
template <class T>
RefPtr<T> effectiveFace(Session& session, Args const& arguments, LS_IdentityFace::Type face) {
  RefPtr<T> found;
  LS_getFaceIf(session.identity(arguments).get(), face, found);
  return found;
}

// The identity's own configured face of that kind, else null.
template <class T>
RefPtr<T> configuredFace(Session& session, Args const& arguments, LS_IdentityFace::Type face) {
  RefPtr<LS_IIdentityConfig> identity;
  session.identity(arguments)->queryIf(identity);
  RefPtr<T> own;
  if (identity)
    adoptInterface(own, [&](UUID const& iid, void** raw) { return identity->getConfigFaceIf(face, iid, raw); });
  return own;
}

void printContactCount(Session& session) {
  session.output() << "registered contacts: " << s_sipStatistics.getInboundRegistrations() << "\n";
}

bool isOutboundFace(LS_IdentityFace::Type face) {
  return face == LS_IdentityFace::REGISTRATION_OUTBOUND || face == LS_IdentityFace::MESSAGE_SUBSCRIPTION ||
         face == LS_IdentityFace::CALL_OUTBOUND;
}

void addSettingsCommands(CommandTable& table) {
  table.add("stack services all", "ask every location service, in creation order (the start-up setting)",
            [](Session& session, Args const&) { session.stack().services = Vector<String>(); });
  table.add("stack services <service>...", "ask these location services, in this order",
            [](Session& session, Args const& arguments) {
              Vector<String> names;
              for (Arguments::Value const& name : arguments.all("service"))
                names.add(name.text.c_str());
              session.stack().services = names;
            });
  table.add("stack local-host-ports [<host-port>...]",
            "the gateway's own host-ports: \"local-host\" stands for the first, and the third pass needs one",
            [](Session& session, Args const& arguments) {
              Vector<CHostPort> hostPorts;
              for (Arguments::Value const& hostPort : arguments.all("host-port"))
                hostPorts.add(hostPort.hostPort);
              session.stack().localHostPorts = hostPorts;
            });
  table.add("stack imperative <imperative>", "the imperative of the questions (foreign at start-up)",
            [](Session& session, Args const& arguments) {
              session.stack().imperative = arguments.choice<LS_Imperative>("imperative");
            });
  table.add("stack use-default <on|off>", "whether the \"DEFAULT\" group answers unknown users (on at start-up)",
            [](Session& session, Args const& arguments) { session.stack().useDefault = arguments.on("on|off"); });
}

void addRunTimeCommands(CommandTable& table) {
  table.add("dynamic-identity <service> <identity> create", "LS_ILocationService::createDynamicIdentityIf",
            [](Session& session, Args const& arguments) {
              RefPtr<LS_ILocationService> const service = session.service(arguments);
              std::string const& name = arguments.text("identity");
              RefPtr<LS_IIdentity> created;
              if (LS_getIdentityIf(service.get(), name.c_str(), created).isSuccess())
                throw CommandError(arguments.column("identity"), "identity \"" + name + "\" exists already");
              if (adoptInterface(created, [&](UUID const& iid, void** raw) {
                    return service->createDynamicIdentityIf(name.c_str(), iid, raw);
                  }).isFailure())
                throw CommandError(arguments.column("identity"), "the location service refused to create \"" + name +
                                                                     "\"");
            });
  table.add("dynamic-identity <service> <identity> remove", "LS_ILocationService::removeDynamicIdentity",
            [](Session& session, Args const& arguments) {
              session.identity(arguments);
              session.service(arguments)->removeDynamicIdentity(arguments.text("identity").c_str());
            });
  table.add("register <service> <identity> <contact> <call-id> <expires> [<received>]",
            "LS_IRegistrationInbound::addContact on the identity's own face; prints the registered contacts",
            [](Session& session, Args const& arguments) {
              // A statically configured contact cannot be registered; checked
              // first so that the refusal leaves no new face behind.
              if (RefPtr<LS_IRegistrationInboundConfig> const own =
                      configuredFace<LS_IRegistrationInboundConfig>(session, arguments,
                                                                    LS_IdentityFace::REGISTRATION_INBOUND)) {
                CNameAddr contact;
                String ignored;
                unsigned int priority = 0;
                for (unsigned int i = 0; i < own->getNumberOfConfigContacts(); ++i)
                  if (own->getConfigContact(i, contact, ignored, ignored, priority).isSuccess() &&
                      contact == arguments.nameAddr("contact"))
                    throw CommandError(arguments.column("contact"), "this contact is configured statically");
              }
              RefPtr<LS_IRegistrationInbound> const face =
                  dynamicFace<LS_IRegistrationInbound>(session, arguments, LS_IdentityFace::REGISTRATION_INBOUND);
              if (face->addContact(arguments.text("call-id").c_str(), arguments.nameAddr("contact"),
                                   arguments.hostPort("received"), "", "", 0, arguments.number("expires"))
                      .isFailure())
                throw CommandError(arguments.column("contact"), "the face refused the registration");
              printContactCount(session);
            });
  table.add("unregister <service> <identity> <contact> [<call-id>]",
            "LS_IRegistrationInbound::removeContact; prints the registered contacts",
            [](Session& session, Args const& arguments) {
              std::string const callId = arguments.has("call-id") ? arguments.text("call-id") : std::string();
              if (RefPtr<LS_IRegistrationInbound> const face =
                      effectiveFace<LS_IRegistrationInbound>(session, arguments, LS_IdentityFace::REGISTRATION_INBOUND))
                face->removeContact(arguments.nameAddr("contact"), callId.c_str());
              printContactCount(session);
            });
  table.add("unregister-all <service> <identity>",
            "LS_IRegistrationInbound::removeContacts; prints the registered contacts",
            [](Session& session, Args const& arguments) {
              if (RefPtr<LS_IRegistrationInbound> const face =
                      effectiveFace<LS_IRegistrationInbound>(session, arguments, LS_IdentityFace::REGISTRATION_INBOUND))
                face->removeContacts();
              printContactCount(session);
            });
  table.add("inbound-registered <service> <identity>", "LS_IIdentity::isInboundRegistered",
            [](Session& session, Args const& arguments) { session.identity(arguments)->isInboundRegistered(); });
  table.add("inbound-unregistered <service> <identity>", "LS_IIdentity::isInboundUnregistered",
            [](Session& session, Args const& arguments) { session.identity(arguments)->isInboundUnregistered(); });
  table.add("learn proxy <service> <identity> <face> <proxy> <route>", "LS_IOutbound::setDynamicProxy",
            [](Session& session, Args const& arguments) {
              LS_IdentityFace::Type const face = arguments.choice<LS_IdentityFace>("face");
              if (!isOutboundFace(face))
                throw CommandError(arguments.column("face"), "the " + arguments.text("face") + " face has no proxies");
              dynamicFace<LS_IOutbound>(session, arguments, face)
                  ->setDynamicProxy(arguments.hostPort("proxy"), arguments.number("route") == 1);
            });
  table.add("forget proxy <service> <identity> <face>", "LS_IOutbound::removeDynamicProxy",
            [](Session& session, Args const& arguments) {
              if (RefPtr<LS_IOutbound> const own =
                      effectiveFace<LS_IOutbound>(session, arguments, arguments.choice<LS_IdentityFace>("face")))
                own->removeDynamicProxy();
            });
  table.add("learn registrar <service> <identity> <registrar>", "LS_IRegistrationOutbound::setDynamicRegistrar",
            [](Session& session, Args const& arguments) {
              dynamicFace<LS_IRegistrationOutbound>(session, arguments, LS_IdentityFace::REGISTRATION_OUTBOUND)
                  ->setDynamicRegistrar(arguments.hostPort("registrar"));
            });
  table.add("forget registrar <service> <identity>", "LS_IRegistrationOutbound::removeDynamicRegistrar",
            [](Session& session, Args const& arguments) {
              if (RefPtr<LS_IRegistrationOutbound> const own =
                      effectiveFace<LS_IRegistrationOutbound>(session, arguments, LS_IdentityFace::REGISTRATION_OUTBOUND))
                own->removeDynamicRegistrar();
            });
  table.add("learn mwi-notifier <service> <identity> <notifier>", "LS_IMwiSubscription::setDynamicMwiNotifier",
            [](Session& session, Args const& arguments) {
              dynamicFace<LS_IMwiSubscription>(session, arguments, LS_IdentityFace::MESSAGE_SUBSCRIPTION)
                  ->setDynamicMwiNotifier(arguments.hostPort("notifier"));
            });
  table.add("forget mwi-notifier <service> <identity>", "LS_IMwiSubscription::removeDynamicMwiNotifier",
            [](Session& session, Args const& arguments) {
              if (RefPtr<LS_IMwiSubscription> const own =
                      effectiveFace<LS_IMwiSubscription>(session, arguments, LS_IdentityFace::MESSAGE_SUBSCRIPTION))
                own->removeDynamicMwiNotifier();
            });
}

std::string identityText(LS_IIdentity const* identity) {
  return identity ? "identity " + Session::pathOf(identity) : "no identity";
}

// The questions go through the driver repository for both masters, as the
// SIP stack's do, and over the services of the stack settings.
void addQuestionCommands(CommandTable& table) {
  table.add("service-for <host-port>", "LS_getLocationService: the location service responsible for a host",
            [](Session& session, Args const& arguments) {
              Session::StackSettings const& stack = session.stack();
              String error;
              RefPtr<LS_ILocationService> found;
              CHostPort const host = arguments.hostPort("host-port");
              if (stack.services.isEmpty())
                LS_getLocationService(error, found, host, stack.localHostPorts, stack.imperative, nullptr);
              else
                LS_getLocationService(error, found, host, stack.services, stack.localHostPorts, stack.imperative,
                                      nullptr);
              if (found)
                session.output() << "location service " << found->getName().str() << "\n";
              else
                session.output() << "no location service\n";
              printError(session, error);
            });
  table.add("resolve <name-addr>", "LS_getIdentity: the identity a request's name-addr denotes",
            [](Session& session, Args const& arguments) {
              String error;
              RefPtr<LS_IIdentity> const found = session.resolve(error, arguments.nameAddr("name-addr"));
              session.output() << identityText(found.get()) << "\n";
              printError(session, error);
            });
  table.add("explain <name-addr>", "how the identity of a name-addr is found, pass by pass",
            [](Session& session, Args const& arguments) {
              CNameAddr const& nameAddr = arguments.nameAddr("name-addr");
              RefPtr<LS_IIdentity> const explained = ResolutionExplainer(session, session.output()).explain(nameAddr);
              session.output() << "  result: " << identityText(explained.get()) << "\n";
              String error;
              RefPtr<LS_IIdentity> const found = session.resolve(error, nameAddr);
              if (found != explained)
                session.output() << "  but the library answers " << identityText(found.get()) << "\n";
            });
  table.add("challenge <name-addr>", "LS_getInboundAuthenticationChallenge: the realms to challenge a request with",
            [](Session& session, Args const& arguments) {
              Session::StackSettings const& stack = session.stack();
              String error;
              Vector<LS_ProtocolRealm> realms;
              CNameAddr const& nameAddr = arguments.nameAddr("name-addr");
              XCode const result =
                  stack.services.isEmpty()
                      ? LS_getInboundAuthenticationChallenge(error, realms, nameAddr, stack.useDefault,
                                                             stack.localHostPorts, stack.imperative, nullptr, nullptr)
                      : LS_getInboundAuthenticationChallenge(error, realms, nameAddr, stack.services,
                                                             stack.useDefault, stack.localHostPorts, stack.imperative,
                                                             nullptr, nullptr);
              if (result.isFailure() || realms.isEmpty())
                session.output() << "no challenge\n";
              for (LS_ProtocolRealm const& realm : realms)
                session.output() << "challenge " << LS_AuthenticationProtocol::NAME(realm.protocol) << " realm "
                                 << quoted(realm.realm) << "\n";
              printError(session, error);
            });
  table.add("response <name-addr> <protocol> <realm> <user>",
            "LS_getInboundAuthenticationResponse: the passwords to check a response against",
            [](Session& session, Args const& arguments) {
              Session::StackSettings const& stack = session.stack();
              String error;
              Vector<String> passwords;
              CNameAddr const& nameAddr = arguments.nameAddr("name-addr");
              auto const protocol = arguments.choice<LS_AuthenticationProtocol>("protocol");
              String const realm = arguments.text("realm").c_str();
              String const user = arguments.text("user").c_str();
              XCode const result =
                  stack.services.isEmpty()
                      ? LS_getInboundAuthenticationResponse(error, passwords, nameAddr, protocol, realm, user,
                                                            stack.useDefault, stack.localHostPorts, stack.imperative,
                                                            nullptr, nullptr)
                      : LS_getInboundAuthenticationResponse(error, passwords, nameAddr, protocol, realm, user,
                                                            stack.services, stack.useDefault, stack.localHostPorts,
                                                            stack.imperative, nullptr, nullptr);
              if (result.isFailure() || passwords.isEmpty())
                session.output() << "no passwords\n";
              for (String const& password : passwords)
                session.output() << "password " << quoted(password) << "\n";
              printError(session, error);
            });
  table.add("credentials <name-addr> <protocol> <realm>",
            "LS_getOutboundAuthenticationCredentials: the user name and password to answer a challenge with",
            [](Session& session, Args const& arguments) {
              Session::StackSettings const& stack = session.stack();
              String error;
              String user;
              String password;
              CNameAddr const& nameAddr = arguments.nameAddr("name-addr");
              auto const protocol = arguments.choice<LS_AuthenticationProtocol>("protocol");
              String const realm = arguments.text("realm").c_str();
              XCode const result =
                  stack.services.isEmpty()
                      ? LS_getOutboundAuthenticationCredentials(error, user, password, nameAddr, protocol, realm,
                                                                stack.useDefault, stack.localHostPorts,
                                                                stack.imperative, nullptr, nullptr)
                      : LS_getOutboundAuthenticationCredentials(error, user, password, nameAddr, protocol, realm,
                                                                stack.services, stack.useDefault,
                                                                stack.localHostPorts, stack.imperative, nullptr,
                                                                nullptr);
              if (result.isFailure())
                session.output() << "no credentials\n";
              else
                session.output() << "user " << quoted(user) << " password " << quoted(password) << "\n";
              printError(session, error);
            });
}

}  // namespace

void addStackCommands(CommandTable& table) {
  addSettingsCommands(table);
  addRunTimeCommands(table);
  addQuestionCommands(table);
}
