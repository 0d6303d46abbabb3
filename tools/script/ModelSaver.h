// ModelSaver: writes the configuration the model holds now as a script of
// the host programs' own language that rebuilds it in a fresh session:
// authentication services, then location services, then each service's
// configured identities in the service's order, with their aliases, values
// and faces, each base link written once its base exists. It reads only the
// configuration interfaces and writes only what each object holds itself,
// never what it inherits. Run-time state (dynamic identities and faces,
// registered contacts, learnt proxies, registrars and message servers) is
// no configuration: one comment line says how much of it was left out.
// Where the script goes belongs to the save command.
#pragma once

#include <optional>
#include <sstream>
#include <string>
#include <vector>

#include "ScriptSession.h"

class ModelSaver {
 public:
  explicit ModelSaver(ScriptSession const& session) : m_session(session) {}

  // The whole script. Throws std::runtime_error for a text that holds a
  // line break, which no line of a script can hold.
  std::string script();

 private:
  using Words = std::vector<std::string>;
  struct Identity;

  // One line of the given words, each quoted where it has to be.
  void line(Words const& words);
  std::string leftOutComment() const;
  void saveAuthenticationService(String const& name);
  void saveLocationService(String const& name);
  void saveIdentities(String const& serviceName);
  // All but the line that creates it.
  void saveIdentity(Words const& identity, LS_IIdentityConfig* config, String const& serviceName);
  void saveAliases(Words const& identity, LS_IIdentityConfig* config);
  void saveValues(Words const& identity, LS_IIdentityConfig* config);
  // "<name> set <value>" after prefix, when there is a value.
  void setting(Words const& prefix, char const* name, std::optional<std::string> const& value);
  void saveFace(Words const& identity, Words const& face, IUnknown* config);
  void saveOutbound(Words const& face, IUnknown* config);
  void saveInbound(Words const& face, IUnknown* config);
  template <class Config>
  void saveServer(Words const& face,
                  char const* server,
                  Config const* get,
                  XCode (Config::*getServer)(CHostPort&, CHostPort&) const);
  void saveRegistrationOutbound(Words const& face, IUnknown* config);
  void saveRegistrationInbound(Words const& face, IUnknown* config);
  void saveMwiSubscription(Words const& face, IUnknown* config);
  void saveCall(Words const& face, IUnknown* config);
  void saveAuthentication(Words const& face, IUnknown* config);
  // The name the master lists service under; empty for a service it does
  // not list.
  std::string listedName(LS_ILocationServiceConfig const* service) const;

  ScriptSession const& m_session;
  std::ostringstream m_out;
};
