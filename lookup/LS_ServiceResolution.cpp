#include "LS_ServiceResolution.h"

#include "LS_AddressText.h"
#include "LS_ClassIdentifiers.h"
#include "LS_DriverInterface.h"
#include "LockedPtr.h"
#include "SystemRepository.h"

namespace {

// The masters' driver names, built once: a driver name is a pure function of
// the arguments it is built from, and building it took most of the time of
// finding a master.
String const& locationMasterName() {
  static String const name(LS_masterDriverName("master-location-service"));
  return name;
}
String const& authenticationMasterName() {
  static String const name(LS_masterDriverName("master-authentication-service"));
  return name;
}

template <class Master>
XCode findMaster(String& error, RefPtr<Master>& out, String const& driverName, char const* missing) {
  out = nullptr;
  RefPtr<IDriverRepository> repository = SYSTEM::DRIVER_REPOSITORY();
  if (!repository) {
    error = "DRIVER REPOSITORY DOES NOT EXIST";
    return XCode::failure();
  }
  XCode const result = getDriverInterface(repository, driverName, out);
  if (result.isFailure())
    error = missing;
  return result;
}

// The master to use: the one given, else the registered one.
template <class Master>
XCode resolveMaster(String& error,
                    Master* given,
                    RefPtr<Master>& master,
                    XCode (*findRegistered)(String&, RefPtr<Master>&)) {
  master = given;
  return given ? XCode::success() : findRegistered(error, master);
}

// The service called name, from the given or the registered master; missing
// names the service in the error text.
template <class Master, class Service>
XCode serviceByName(String& error,
                    RefPtr<Service>& out,
                    String const& name,
                    Master* given,
                    XCode (*findRegistered)(String&, RefPtr<Master>&),
                    XCode (*serviceIf)(Master*, String const&, RefPtr<Service>&),
                    char const* missing) {
  out = nullptr;
  RefPtr<Master> master;
  XCode result = resolveMaster(error, given, master, findRegistered);
  if (result.isFailure())
    return result;
  result = serviceIf(master.get(), name, out);
  if (result.isFailure())
    error.format(missing, name.c_str());
  return result;
}

// One pass over names asking isResponsible with localHostPorts: the first
// exact match, else the first partial one, else null.
RefPtr<LS_ILocationService> responsibleByDomain(LS_IMasterLocationService* master,
                                                CHostPort const& host,
                                                Vector<String> const& names,
                                                Vector<CHostPort> const& localHostPorts,
                                                LS_Imperative::Type imperative) {
  RefPtr<LS_ILocationService> partial;
  for (String const& name : names) {
    RefPtr<LS_ILocationService> service;
    if (LS_getLocationServiceIf(master, name, service).isFailure())
      continue;
    bool exact = false;
    if (!LockedPtr<LS_ILocationService>(service)->isResponsible(host, localHostPorts, imperative, exact))
      continue;
    if (exact)
      return service;
    if (!partial)
      partial = service;
  }
  return partial;
}

RefPtr<LS_ILocationService> firstDefaultDomain(LS_IMasterLocationService* master, Vector<String> const& names) {
  for (String const& name : names) {
    RefPtr<LS_ILocationService> service;
    if (LS_getLocationServiceIf(master, name, service).isSuccess() &&
        LockedPtr<LS_ILocationService>(service)->getDefaultDomain())
      return service;
  }
  return nullptr;
}

}  // namespace

XCode LS_getMasterLocationService(String& error, RefPtr<LS_IMasterLocationService>& out) {
  return findMaster(error, out, locationMasterName(), "MASTER LOCATION-SERVICE DOES NOT EXIST");
}

XCode LS_getMasterAuthenticationService(String& error, RefPtr<LS_IMasterAuthenticationService>& out) {
  return findMaster(error, out, authenticationMasterName(), "MASTER AUTHENTICATION-SERVICE DOES NOT EXIST");
}

XCode LS_getLocationService(String& error,
                            RefPtr<LS_ILocationService>& out,
                            String const& name,
                            LS_IMasterLocationService* master) {
  return serviceByName(error, out, name, master, &LS_getMasterLocationService,
                       &LS_getLocationServiceIf<LS_ILocationService>, "LOCATION-SERVICE '%s' DOES NOT EXIST");
}

XCode LS_getAuthenticationService(String& error,
                                  RefPtr<LS_IAuthenticationService>& out,
                                  String const& name,
                                  LS_IMasterAuthenticationService* master) {
  return serviceByName(error, out, name, master, &LS_getMasterAuthenticationService,
                       &LS_getAuthenticationServiceIf<LS_IAuthenticationService>,
                       "AUTHENTICATION-SERVICE '%s' DOES NOT EXIST");
}

XCode LS_getLocationService(String& error,
                            RefPtr<LS_ILocationService>& out,
                            CHostPort const& host,
                            Vector<String> const& names,
                            Vector<CHostPort> const& localHostPorts,
                            LS_Imperative::Type imperative,
                            LS_IMasterLocationService* master) {
  out = nullptr;
  RefPtr<LS_IMasterLocationService> resolved;
  XCode const result = resolveMaster(error, master, resolved, &LS_getMasterLocationService);
  if (result.isFailure())
    return result;
  out = responsibleByDomain(resolved.get(), host, names, Vector<CHostPort>(), imperative);
  if (!out)
    out = firstDefaultDomain(resolved.get(), names);
  if (!out)
    out = responsibleByDomain(resolved.get(), host, names, localHostPorts, imperative);
  if (out)
    return XCode::success();
  error.format("NO LOCATION-SERVICE IS RESPONSIBLE FOR DOMAIN '%s'", LS_hostPortToString(host).c_str());
  return XCode::failure();
}

XCode LS_getLocationService(String& error,
                            RefPtr<LS_ILocationService>& out,
                            CHostPort const& host,
                            Vector<CHostPort> const& localHostPorts,
                            LS_Imperative::Type imperative,
                            LS_IMasterLocationService* master) {
  out = nullptr;
  RefPtr<LS_IMasterLocationService> resolved;
  XCode const result = resolveMaster(error, master, resolved, &LS_getMasterLocationService);
  if (result.isFailure())
    return result;
  Vector<String> names;
  LockedPtr<LS_IMasterLocationService>(resolved)->getLocationServices(names);
  return LS_getLocationService(error, out, host, names, localHostPorts, imperative, resolved.get());
}
