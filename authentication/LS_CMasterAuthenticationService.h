// LS_CMasterAuthenticationService: the root of the authentication model and
// the driver through which the lookups find it. The driver host constructs
// it and registers it in the driver repository; it never registers itself.
// It keeps the registry of authentication services by the name each was
// created with, in creation order, and dumps itself with every service.
//
// Ownership: counted; the master holds one reference to each service, and a
// service lives on while a caller holds one too. It has no observers and
// writes no log lines. Threading: no lock (the driver is made with a null
// lock); the host serialises configuration against lookups. The running-dump
// count is process-wide and shared by every master of this class.
#pragma once

#include "Export.h"

#include "CDriver.h"
#include "CInherit.h"
#include "IInfo.h"
#include "LS_IAuthenticationService.h"
#include "LS_IMasterAuthenticationService.h"
#include "StringHashTable.h"

class LS_EXPORT LS_CMasterAuthenticationService
    : public CInherit<LS_CMasterAuthenticationService, CDriver, LS_IMasterAuthenticationService, IInfo> {
 public:
  // Identified by DID_MasterAuthenticationService() and named by
  // LS_masterDriverName("master-authentication-service"), the name the
  // lookups build too.
  LS_CMasterAuthenticationService();

  // LS_IMasterAuthenticationService
  XCode getAuthenticationServiceIf(String const& name, UUID const& iid, void** out) override;
  XCode createAuthenticationServiceIf(String const& name, UUID const& iid, void** out) override;
  void removeAuthenticationService(String const& name) override;
  void getAuthenticationServices(Vector<String>& names) const override;

  // IInfo: the heading, "Authentication-Services" ("(none)" without any),
  // then each service's own dump two levels down. A master dump running
  // inside another (a service's dump that dumps a master again) leaves the
  // services out, so that nested dumps stay finite.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 private:
  StringHashTable<RefPtr<LS_IAuthenticationService>> m_authenticationServices{32};
};
