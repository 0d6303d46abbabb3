#include "SessionCommands.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <stdexcept>

#include "IInfo.h"
#include "InfoContainer.h"
#include "ModelSaver.h"
#include "ScriptSession.h"

namespace {

using Session = ScriptSession;
using Args = Arguments;

// Deep enough for any object of the model, and every detail.
constexpr unsigned int kAllLevels = 64;
constexpr unsigned int kAllDetails = 64;

// The object's dump as an indented outline; nothing for an object without
// a dump.
void dump(Session& session, IUnknown* object) {
  RefPtr<IInfo> info;
  if (!object || object->queryIf(info).isFailure())
    return;
  InfoContainer lines;
  info->getInfo(lines, kAllLevels, 0, kAllDetails, 0, String());
  session.output() << lines.toText().str();
}

void dumpService(Session& session, LS_ILocationService* service) {
  dump(session, service);
  Vector<String> names;
  service->getIdentities(names);
  for (String const& name : names) {
    RefPtr<LS_IIdentity> identity;
    LS_getIdentityIf(service, name, identity);
    dump(session, identity.get());
  }
}

}  // namespace

void addSessionCommands(CommandTable& table) {
  table.add("dump", "the whole model: both masters, every location service with its identities",
            [](Session& session, Args const&) {
              dump(session, session.locationMaster());
              Vector<String> names;
              session.locationMaster()->getLocationServices(names);
              for (String const& name : names) {
                RefPtr<LS_ILocationService> service;
                LS_getLocationServiceIf(session.locationMaster(), name, service);
                dumpService(session, service.get());
              }
              dump(session, session.authenticationMaster());
            });
  table.add("dump location-services", "the master location service",
            [](Session& session, Args const&) { dump(session, session.locationMaster()); });
  table.add("dump location-service <service>", "a location service and its identities",
            [](Session& session, Args const& arguments) { dumpService(session, session.service(arguments).get()); });
  table.add("dump identity <service> <identity>", "an identity with its values and faces, own or inherited",
            [](Session& session, Args const& arguments) { dump(session, session.identity(arguments).get()); });
  table.add("dump face <service> <identity> <face>", "one face of an identity, its own or the one it inherits",
            [](Session& session, Args const& arguments) {
              RefPtr<LS_IIdentity> const identity = session.identity(arguments);
              RefPtr<IUnknown> face;
              if (LS_getFaceIf(identity.get(), arguments.choice<LS_IdentityFace>("face"), face).isFailure())
                throw CommandError(arguments.column("face"), "identity \"" + arguments.text("identity") +
                                                                 "\" has no " + arguments.text("face") +
                                                                 " face, own or inherited");
              dump(session, face.get());
            });
  table.add("dump authentication-services", "the master authentication service with every service",
            [](Session& session, Args const&) { dump(session, session.authenticationMaster()); });
  table.add("dump authentication-service <authentication-service>", "one authentication service",
            [](Session& session, Args const& arguments) {
              dump(session, session.authenticationService(arguments).get());
            });
  table.add("save [<file>]", "the configuration as the script that rebuilds it, into file or shown",
            [](Session& session, Args const& arguments) {
              std::string script;
              try {
                script = ModelSaver(session).script();
              } catch (std::runtime_error const& error) {
                throw CommandError(1, error.what());
              }
              if (!arguments.has("file")) {
                session.output() << script;
                return;
              }
              std::string const& name = arguments.text("file");
              std::ofstream file(name, std::ios::binary);
              if (!(file << script).flush())
                throw CommandError(arguments.column("file"), "cannot write " + name + ": " + std::strerror(errno));
            });
  table.add("watch <on|off>", "print every event of the location model as it happens",
            [](Session& session, Args const& arguments) {
              session.watch(arguments.on("on|off"));
            });
  table.add("debug <on|off>", "show the library's debug lines (monitor 57)",
            [](Session& session, Args const& arguments) { session.showDebugLines(arguments.on("on|off")); });
  table.add("echo [<text>...]", "print the words, as a heading in a session",
            [](Session& session, Args const& arguments) {
              std::string line;
              for (Arguments::Value const& word : arguments.all("text"))
                line += (line.empty() ? "" : " ") + word.text;
              session.output() << line << "\n";
            });
}
