#include "LS_CMasterAuthenticationService.h"

#include "LS_CAuthenticationService.h"
#include "LS_ClassIdentifiers.h"
#include "LS_InfoRows.h"
#include "LockedPtr.h"

namespace {

// getInfo calls of this class now running, in every thread and object.
unsigned int s_runningDumps = 0;

// Counts one running dump for as long as it lives.
class RunningDump {
 public:
  RunningDump() { ++s_runningDumps; }
  ~RunningDump() { --s_runningDumps; }
  RunningDump(RunningDump const&) = delete;
  RunningDump& operator=(RunningDump const&) = delete;

  bool isOutermost() const { return s_runningDumps == 1; }
};

XCode failWithNull(void** out) {
  if (out)
    *out = nullptr;
  return XCode::failure();
}

}  // namespace

LS_CMasterAuthenticationService::LS_CMasterAuthenticationService()
    : CInherit(DID_MasterAuthenticationService(), String(), nullptr) {
  setDriverName(LS_masterDriverName("master-authentication-service"));
}

XCode LS_CMasterAuthenticationService::getAuthenticationServiceIf(String const& name, UUID const& iid, void** out) {
  RefPtr<LS_IAuthenticationService> const* const found = m_authenticationServices.get(name);
  if (!found)
    return failWithNull(out);
  return LockedPtr<LS_IAuthenticationService>(*found)->queryInterface(iid, out);
}

XCode LS_CMasterAuthenticationService::createAuthenticationServiceIf(String const& name,
                                                                     UUID const& iid,
                                                                     void** out) {
  if (m_authenticationServices.contains(name))
    return getAuthenticationServiceIf(name, iid, out);
  RefPtr<LS_IAuthenticationService> const service =
      adoptRef(static_cast<LS_IAuthenticationService*>(new LS_CAuthenticationService));
  XCode const result = LockedPtr<LS_IAuthenticationService>(service)->queryInterface(iid, out);
  if (result.isFailure())
    return result;
  LockedPtr<LS_IAuthenticationService>(service)->setName(name);
  m_authenticationServices.add(name, service);
  return XCode::success();
}

void LS_CMasterAuthenticationService::removeAuthenticationService(String const& name) {
  m_authenticationServices.remove(name);
}

void LS_CMasterAuthenticationService::getAuthenticationServices(Vector<String>& names) const {
  names.clear();
  for (auto const& entry : m_authenticationServices)
    names.add(entry.key);
}

InfoContainer& LS_CMasterAuthenticationService::getInfo(InfoContainer& info,
                                                        unsigned int maxLevel,
                                                        unsigned int level,
                                                        unsigned int maxDetail,
                                                        unsigned int detail,
                                                        String const& prefix) const {
  RunningDump const dump;
  LS_InfoRows const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Master Authentication-Service"), String());
  rows.add(level + 1, "Authentication-Services", m_authenticationServices.isEmpty() ? "(none)" : "");
  if (!rows.accepts(level + 2) || !dump.isOutermost())
    return info;
  for (auto const& entry : m_authenticationServices) {
    RefPtr<IInfo> service;
    if (LockedPtr<LS_IAuthenticationService>(entry.value)->queryIf(service).isSuccess())
      LockedPtr<IInfo>(service)->getInfo(info, maxLevel, level + 2, maxDetail, detail, String());
  }
  return info;
}
