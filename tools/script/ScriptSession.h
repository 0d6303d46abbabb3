// ScriptSession: what a host program of the script language (the console, the
// SIP front-end) stands in for, held together for one run: the driver host
// (both masters, built and registered in an installed driver repository), the
// configuration layer's way to name objects, and the SIP stack's settings for
// the questions it asks (which location services to ask, the gateway's own
// host-ports, the imperative, the "DEFAULT" fallback). Commands reach the
// model only through the library's public interfaces.
//
// Everything a command prints goes to output(); the script runner decides
// when to show it. The session dies before the process leaves main: it
// stops watching, removes the repository and releases the masters, which
// releases the whole model.
#pragma once

#include <functional>
#include <memory>
#include <sstream>

#include "CDriverRepository.h"
#include "CommandTable.h"
#include "LS_CMasterAuthenticationService.h"
#include "LS_CMasterLocationService.h"
#include "LS_IAuthenticationService.h"
#include "LS_IIdentity.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationService.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_IMasterAuthenticationService.h"
#include "LS_IMasterLocationService.h"
#include "LS_IdentityFace.h"
#include "LS_Imperative.h"
#include "RefPtr.h"
#include "Vector.h"

class ModelWatcher;

class ScriptSession {
 public:
  // What the SIP stack passes to every lookup.
  struct StackSettings {
    // Asked in this order; empty means every location service of the
    // master, in creation order.
    Vector<String> services;
    Vector<CHostPort> localHostPorts;
    LS_Imperative::Type imperative = LS_Imperative::FOREIGN;
    bool useDefault = true;
  };

  // A host program that serves several clients at once (the gateway's
  // control socket) decides itself which of them watch: the watch command
  // and the watcher's event lines go to it instead of the session's own
  // watcher and output. Borrowed; the host unsets itself before it dies.
  class WatchHost {
   public:
    virtual void watch(bool on) = 0;
    // One complete line, "event: ...\n".
    virtual void event(std::string const& line) = 0;

   protected:
    ~WatchHost() = default;
  };

  ScriptSession();
  ~ScriptSession();
  ScriptSession(ScriptSession const&) = delete;
  ScriptSession& operator=(ScriptSession const&) = delete;

  std::ostringstream& output() { return m_output; }
  // What was printed since the last call.
  std::string takeOutput();

  LS_IMasterLocationService* locationMaster() const { return m_locationMaster.get(); }
  LS_IMasterAuthenticationService* authenticationMaster() const { return m_authenticationMaster.get(); }
  StackSettings& stack() { return m_stack; }
  ModelWatcher& watcher() { return *m_watcher; }
  void setWatchHost(WatchHost* host) { m_watchHost = host; }
  // The watch command: the host's, else the session's own watcher.
  void watch(bool on);
  // An event line of the watcher: to the host, else into output().
  void event(std::string const& line);
  // Shows the debug monitor's lines in the output, or stops showing them.
  void showDebugLines(bool show);
  // For a host program that serves rather than runs a script: writes the
  // debug lines gathered so far to standard error.
  void flushDebugLines();

  // The objects a command names, by the argument names the patterns use
  // ("service", "identity", "face", "authentication-service"). Each throws a
  // CommandError at the name when the object does not exist.
  RefPtr<LS_ILocationServiceConfig> serviceConfig(Arguments const& arguments) const;
  RefPtr<LS_ILocationService> service(Arguments const& arguments) const;
  RefPtr<LS_IIdentityConfig> identityConfig(Arguments const& arguments) const;
  // Configured or dynamic.
  RefPtr<LS_IIdentity> identity(Arguments const& arguments) const;
  RefPtr<LS_IAuthenticationService> authenticationService(Arguments const& arguments) const;
  // Interface T of the identity's own configured face: a face it only
  // inherits is its base's, and changing it there would change every
  // identity of the group.
  template <class T>
  RefPtr<T> faceConfig(Arguments const& arguments) const {
    RefPtr<T> face = faceIf<T>(arguments);
    if (!face)
      throw CommandError(arguments.column("face"),
                         "the " + arguments.text("face") + " face has no such setting");
    return face;
  }
  // The same, or null when the face does not implement T.
  template <class T>
  RefPtr<T> faceIf(Arguments const& arguments) const {
    RefPtr<T> face;
    ownFace(arguments)->queryIf(face);
    return face;
  }

  // The identity's own face, configured or dynamic; throws when it has none.
  RefPtr<IUnknown> ownFace(Arguments const& arguments) const;

  // LS_getIdentity with the stack settings: the identity nameAddr denotes,
  // or null, with the lookup's message in error.
  RefPtr<LS_IIdentity> resolve(String& error, CNameAddr const& nameAddr) const;
  // LS_getLocationService with the stack settings: the location service
  // responsible for host, or null, with the lookup's message in error.
  RefPtr<LS_ILocationService> serviceFor(String& error, CHostPort const& host) const;

  // "service/identity", as the host programs name identities in what they print.
  static std::string pathOf(LS_IIdentity const* identity);
  // Every identity of every location service, groups included, with its
  // pathOf(), service by service in the model's order.
  void forEachIdentity(
      std::function<void(LS_IIdentity* identity, std::string const& path)> const& visit) const;

 private:
  template <class T>
  RefPtr<T> serviceAs(Arguments const& arguments) const;

  std::ostringstream m_output;
  RefPtr<CDriverRepository> m_repository;
  RefPtr<LS_CMasterLocationService> m_locationMaster;
  RefPtr<LS_CMasterAuthenticationService> m_authenticationMaster;
  StackSettings m_stack;
  std::unique_ptr<ModelWatcher> m_watcher;
  WatchHost* m_watchHost = nullptr;
};
