#include "control/GatewayCommands.h"

#include <algorithm>
#include <tuple>
#include <utility>
#include <vector>

#include "ScriptSession.h"

namespace {

// The bindings of the identity, the service or all, one line each, ordered
// by identity and contact.
void printBindings(ScriptSession& session, Registrar const& registrar, Arguments const& arguments) {
  RefPtr<LS_IIdentity> identity;
  std::string prefix;
  if (arguments.has("identity"))
    identity = session.identity(arguments);
  else if (arguments.has("service"))
    prefix = session.service(arguments)->getName().str() + "/";
  struct Line {
    std::string identity;
    Registrar::BindingView binding;
  };
  std::vector<Line> lines;
  for (Registrar::BindingView& binding : registrar.bindings(identity.get())) {
    std::string path = ScriptSession::pathOf(binding.identity);
    if (path.compare(0, prefix.size(), prefix) == 0)
      lines.push_back(Line{std::move(path), std::move(binding)});
  }
  std::sort(lines.begin(), lines.end(), [](Line const& a, Line const& b) {
    return std::tie(a.identity, a.binding.contact) < std::tie(b.identity, b.binding.contact);
  });
  if (lines.empty())
    session.output() << "no bindings\n";
  for (Line const& line : lines)
    session.output() << line.identity << " <" << line.binding.contact << "> expires in "
                     << (line.binding.remainingMs + 999) / 1000 << " s, Call-ID " << line.binding.callId
                     << ", from " << line.binding.source << "\n";
}

}  // namespace

void addGatewayCommands(CommandTable& table,
                        Registrar const& registrar,
                        TrunkRegistrations const& trunks,
                        std::function<GatewayStatistics()> statistics,
                        Calls const* calls) {
  table.add("statistics", "what the gateway answered, its bindings and trunks, the library's CPU share",
            [statistics = std::move(statistics)](ScriptSession& session, Arguments const&) {
              session.output() << statistics().text();
            });
  table.add("bindings [<service>]", "the contacts registered here, of one location service or all",
            [&registrar](ScriptSession& session, Arguments const& arguments) {
              printBindings(session, registrar, arguments);
            });
  table.add("bindings <service> <identity>", "the contacts one identity registered here",
            [&registrar](ScriptSession& session, Arguments const& arguments) {
              printBindings(session, registrar, arguments);
            });
  table.add("trunks", "the gateway's own registrations: state, registrar in use and hop",
            [&trunks](ScriptSession& session, Arguments const&) {
              std::vector<std::string> const lines = trunks.describe();
              if (lines.empty())
                session.output() << "no trunks\n";
              for (std::string const& line : lines)
                session.output() << line << "\n";
            });
  if (!calls)
    return;
  table.add("calls", "the calls relayed now, with both legs and their state",
            [calls](ScriptSession& session, Arguments const&) {
              std::vector<std::string> const lines = calls->describe();
              if (lines.empty())
                session.output() << "no calls\n";
              for (std::string const& line : lines)
                session.output() << line << "\n";
            });
}

void addMessageWaitingCommand(CommandTable& table, MessageWaiting const& messageWaiting) {
  table.add("mwi", "message waiting: each identity's subscription, notifier and last state",
            [&messageWaiting](ScriptSession& session, Arguments const&) {
              std::vector<std::string> const lines = messageWaiting.describe();
              if (lines.empty())
                session.output() << "no message-waiting faces\n";
              for (std::string const& line : lines)
                session.output() << line << "\n";
            });
}
