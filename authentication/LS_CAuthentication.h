// LS_CAuthentication: an identity's authentication face, outbound or inbound
// (the children "authentication-outbound" and "authentication-inbound"): an
// ordered list of authentication entries, each an authentication service
// name and a user name in it.
//
// The entries live in the append list "authenticate": the configuration
// view is the face's own list, the run-time view the base identity's
// entries followed by the own ones. Every edit announces the list's change,
// so faces based on this one follow. Whether the services and users exist
// is not checked here; the dump marks those that do not.
//
// Ownership: counted; its identity's container holds it. It supplies itself
// to the container's class-identifier table under CID_LS_Authentication.
// Threading: no lock of its own; callers hold the identity's lock.
#pragma once

#include "CInherit.h"
#include "IInfo.h"
#include "LS_Authenticate.h"
#include "LS_CAppendList.h"
#include "LS_CContainer.h"
#include "LS_IAuthentication.h"
#include "LS_IAuthenticationConfig.h"

class LS_CAuthentication
    : public CInherit<LS_CAuthentication, LS_CContainer, LS_IAuthenticationConfig, LS_IAuthentication, IInfo> {
 public:
  LS_CAuthentication();
  ~LS_CAuthentication() override;

  // LS_IElement
  XCode create(RefPtr<LS_IElement>& element) override;

  // LS_IAuthenticationConfig
  XCode getNumberOfConfigAuthenticates(unsigned int& count) const override;
  XCode getConfigAuthenticate(unsigned int index, String& authenticationService, String& userName) const override;
  XCode moveConfigAuthenticate(unsigned int index, int delta) override;
  XCode modifyConfigAuthenticate(unsigned int index,
                                 String const& authenticationService,
                                 String const& userName) override;
  XCode insertConfigAuthenticate(unsigned int index,
                                 String const& authenticationService,
                                 String const& userName) override;
  void removeConfigAuthenticate(unsigned int index) override;
  void clearConfigAuthenticates() override;
  void destroyConfigAuthenticates() override;

  // LS_IAuthentication
  unsigned int getNumberOfAuthenticates() const override;
  XCode getAuthenticate(unsigned int index, String& authenticationService, String& userName) const override;

  // IInfo: the heading, then for each run-time entry an "Authentication
  // Link" with the service and the user name, each marked when the master
  // authentication service (found through the driver repository) does not
  // know it.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 private:
  using List = LS_CAppendList<LS_Authenticate>;

  // The own list, or null.
  List* ownList() const;
  // The entry strategy shows at index, or null.
  LS_Authenticate const* entry(LS_Strategy::Type strategy, unsigned int index) const;
};
