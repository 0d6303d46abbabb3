#include "ScriptSession.h"

#include <iostream>

#include "DebugMonitor.h"
#include "FaceNames.h"
#include "LS_IdentityResolution.h"
#include "LS_ServiceResolution.h"
#include "ModelWatcher.h"
#include "SystemRepository.h"

namespace {

// The debug monitor the library writes its lines to, at level 0.
constexpr unsigned int kLibraryMonitor = 57;

}  // namespace

ScriptSession::ScriptSession()
    : m_repository(adoptRef(new CDriverRepository)),
      m_locationMaster(adoptRef(new LS_CMasterLocationService)),
      m_authenticationMaster(adoptRef(new LS_CMasterAuthenticationService)),
      m_watcher(std::make_unique<ModelWatcher>(*this)) {
  // As the driver host starts a gateway: the lookups find the masters by
  // their driver names in the system repository.
  m_repository->registerDriver(m_locationMaster.get());
  m_repository->registerDriver(m_authenticationMaster.get());
  SYSTEM::SET_DRIVER_REPOSITORY(m_repository.get());
}

ScriptSession::~ScriptSession() {
  showDebugLines(false);
  m_watcher.reset();
  SYSTEM::SET_DRIVER_REPOSITORY(nullptr);
}

std::string ScriptSession::takeOutput() {
  std::string const text = m_output.str();
  m_output.str(std::string());
  return text;
}

void ScriptSession::watch(bool on) {
  if (m_watchHost)
    return m_watchHost->watch(on);
  if (on)
    m_watcher->start();
  else
    m_watcher->stop();
}

void ScriptSession::event(std::string const& line) {
  if (m_watchHost)
    return m_watchHost->event(line);
  m_output << line;
}

void ScriptSession::showDebugLines(bool show) {
  if (!show) {
    DebugMonitor::disable(kLibraryMonitor);
    return;
  }
  DebugMonitor::enable(kLibraryMonitor, 0, [this](char const* line) {
    std::string text = line;
    // A few formats end without a line break; each still gets a line here.
    if (text.empty() || text.back() != '\n')
      text += '\n';
    m_output << "debug: " << text;
  });
}

void ScriptSession::flushDebugLines() {
  if (m_output.tellp() == 0)
    return;
  std::cerr << takeOutput() << std::flush;
}

template <class T>
RefPtr<T> ScriptSession::serviceAs(Arguments const& arguments) const {
  RefPtr<T> found;
  if (LS_getLocationServiceIf(m_locationMaster.get(), arguments.text("service").c_str(), found).isFailure())
    throw CommandError(arguments.column("service"),
                       "no location service \"" + arguments.text("service") + "\"");
  return found;
}

RefPtr<LS_ILocationServiceConfig> ScriptSession::serviceConfig(Arguments const& arguments) const {
  return serviceAs<LS_ILocationServiceConfig>(arguments);
}

RefPtr<LS_ILocationService> ScriptSession::service(Arguments const& arguments) const {
  return serviceAs<LS_ILocationService>(arguments);
}

RefPtr<LS_IIdentityConfig> ScriptSession::identityConfig(Arguments const& arguments) const {
  RefPtr<LS_IIdentityConfig> found;
  if (LS_getConfigIdentityIf(serviceConfig(arguments).get(), arguments.text("identity").c_str(), found)
          .isFailure())
    throw CommandError(arguments.column("identity"),
                       "no configured identity \"" + arguments.text("identity") +
                           "\" in location service \"" + arguments.text("service") + "\"");
  return found;
}

RefPtr<LS_IIdentity> ScriptSession::identity(Arguments const& arguments) const {
  RefPtr<LS_IIdentity> found;
  if (LS_getIdentityIf(service(arguments).get(), arguments.text("identity").c_str(), found).isFailure())
    throw CommandError(arguments.column("identity"), "no identity \"" + arguments.text("identity") +
                                                         "\" in location service \"" +
                                                         arguments.text("service") + "\"");
  return found;
}

RefPtr<LS_IAuthenticationService> ScriptSession::authenticationService(Arguments const& arguments) const {
  RefPtr<LS_IAuthenticationService> found;
  std::string const& name = arguments.text("authentication-service");
  if (LS_getAuthenticationServiceIf(m_authenticationMaster.get(), name.c_str(), found).isFailure())
    throw CommandError(arguments.column("authentication-service"),
                       "no authentication service \"" + name + "\"");
  return found;
}

RefPtr<IUnknown> ScriptSession::ownFace(Arguments const& arguments) const {
  RefPtr<LS_IIdentityConfig> const identity = identityConfig(arguments);
  RefPtr<IUnknown> face;
  LS_IdentityFace::Type const type = arguments.choice<LS_IdentityFace>("face");
  if (adoptInterface(face, [&](UUID const& iid, void** raw) {
        return identity->getConfigFaceIf(type, iid, raw);
      }).isFailure())
    throw CommandError(arguments.column("face"),
                       "identity \"" + arguments.text("identity") + "\" has no " + arguments.text("face") +
                           " face of its own; create it with: " + "identity " + arguments.text("service") +
                           " " + arguments.text("identity") + " face " + faceNames()[type] + " create");
  return face;
}

RefPtr<LS_IIdentity> ScriptSession::resolve(String& error, CNameAddr const& nameAddr) const {
  RefPtr<LS_IIdentity> found;
  if (m_stack.services.isEmpty())
    LS_getIdentity(error, found, nameAddr, m_stack.useDefault, m_stack.localHostPorts, m_stack.imperative,
                   nullptr);
  else
    LS_getIdentity(error, found, nameAddr, m_stack.services, m_stack.useDefault, m_stack.localHostPorts,
                   m_stack.imperative, nullptr);
  return found;
}

RefPtr<LS_ILocationService> ScriptSession::serviceFor(String& error, CHostPort const& host) const {
  RefPtr<LS_ILocationService> found;
  if (m_stack.services.isEmpty())
    LS_getLocationService(error, found, host, m_stack.localHostPorts, m_stack.imperative, locationMaster());
  else
    LS_getLocationService(error, found, host, m_stack.services, m_stack.localHostPorts, m_stack.imperative,
                          locationMaster());
  return found;
}

void ScriptSession::forEachIdentity(
    std::function<void(LS_IIdentity* identity, std::string const& path)> const& visit) const {
  Vector<String> services;
  m_locationMaster->getLocationServices(services);
  for (String const& serviceName : services) {
    RefPtr<LS_ILocationService> service;
    if (LS_getLocationServiceIf(m_locationMaster.get(), serviceName, service).isFailure())
      continue;
    Vector<String> identities;
    service->getIdentities(identities);
    for (String const& name : identities) {
      RefPtr<LS_IIdentity> identity;
      if (LS_getIdentityIf(service.get(), name, identity).isFailure())
        continue;
      visit(identity.get(), serviceName.str() + "/" + name.str());
    }
  }
}

std::string ScriptSession::pathOf(LS_IIdentity const* identity) {
  RefPtr<LS_ILocationService> service;
  adoptInterface(service,
                 [&](UUID const& iid, void** raw) { return identity->getLocationServiceIf(iid, raw); });
  return (service ? service->getName().str() : std::string("?")) + "/" + identity->getName().str();
}
