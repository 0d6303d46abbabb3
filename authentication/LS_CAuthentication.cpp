#include "LS_CAuthentication.h"

#include "LS_ClassIdentifiers.h"
#include "LS_Debug.h"
#include "LS_DriverInterface.h"
#include "LS_ElementClassTable.h"
#include "LS_IAuthenticationService.h"
#include "LS_IMasterAuthenticationService.h"
#include "LS_InfoRows.h"
#include "LS_ListPosition.h"
#include "LockedPtr.h"
#include "SystemRepository.h"

namespace {

LS_ElementClassRegistration const registration(CID_LS_Authentication(), &LS_makeElement<LS_CAuthentication>);

String const& listKey() {
  static String const key("authenticate");
  return key;
}

// The master authentication service as the host registered it, or null.
RefPtr<LS_IMasterAuthenticationService> registeredMaster() {
  RefPtr<LS_IMasterAuthenticationService> master;
  RefPtr<IDriverRepository> repository = SYSTEM::DRIVER_REPOSITORY();
  if (repository)
    getDriverInterface(repository, LS_masterDriverName("master-authentication-service"), master);
  return master;
}

}  // namespace

LS_CAuthentication::LS_CAuthentication() {
  LS_DEBUG("LS_CAuthentication(%p)::LS_CAuthentication()\n", logAddress());
}

LS_CAuthentication::~LS_CAuthentication() {
  LS_DEBUG("LS_CAuthentication(%p)::~LS_CAuthentication()\n", logAddress());
}

XCode LS_CAuthentication::create(RefPtr<LS_IElement>& element) {
  return LS_makeElement<LS_CAuthentication>(element);
}

LS_CAuthentication::List* LS_CAuthentication::ownList() const {
  List* list = nullptr;
  LS_getAppendListElement(this, listKey(), LS_Strategy::LOCAL_ONLY, list);
  return list;
}

LS_Authenticate const* LS_CAuthentication::entry(LS_Strategy::Type strategy, unsigned int index) const {
  List* list = nullptr;
  if (LS_getAppendListElement(this, listKey(), strategy, list).isFailure())
    return nullptr;
  return list->get(strategy, index);
}

XCode LS_CAuthentication::getNumberOfConfigAuthenticates(unsigned int& count) const {
  count = 0;
  List* const list = ownList();
  if (!list)
    return XCode::failure();
  count = list->size(LS_Strategy::LOCAL_ONLY);
  return XCode::success();
}

XCode LS_CAuthentication::getConfigAuthenticate(unsigned int index,
                                                String& authenticationService,
                                                String& userName) const {
  LS_Authenticate const* const found = entry(LS_Strategy::LOCAL_ONLY, index);
  if (!found)
    return XCode::failure();
  authenticationService = found->authenticationService;
  userName = found->userName;
  return XCode::success();
}

XCode LS_CAuthentication::moveConfigAuthenticate(unsigned int index, int delta) {
  LS_DEBUG("LS_CAuthentication(%p)::moveConfigAuthenticate(%u, %u)\n", logAddress(), index,
           static_cast<unsigned int>(delta));
  List* const list = ownList();
  if (!list || !LS_moveClamped(list->entries(), index, delta))
    return XCode::failure();
  list->notifyChange();
  return XCode::success();
}

XCode LS_CAuthentication::modifyConfigAuthenticate(unsigned int index,
                                                   String const& authenticationService,
                                                   String const& userName) {
  LS_DEBUG("LS_CAuthentication(%p)::modifyConfigAuthenticate(%u, %s, %s)\n", logAddress(), index,
           authenticationService.c_str(), userName.c_str());
  List* const list = ownList();
  if (!list || index >= list->size(LS_Strategy::LOCAL_ONLY))
    return XCode::failure();
  list->entries()[index] = LS_Authenticate{authenticationService, userName};
  list->notifyChange();
  return XCode::success();
}

XCode LS_CAuthentication::insertConfigAuthenticate(unsigned int index,
                                                   String const& authenticationService,
                                                   String const& userName) {
  LS_DEBUG("LS_CAuthentication(%p)::insertConfigAuthenticate(%u, %s, %s)\n", logAddress(), index,
           authenticationService.c_str(), userName.c_str());
  List* list = nullptr;
  XCode const result = LS_createAppendListElement(this, listKey(), list);
  if (result.isFailure())
    return result;
  LS_insertClamped(list->entries(), index, LS_Authenticate{authenticationService, userName});
  list->notifyChange();
  return XCode::success();
}

void LS_CAuthentication::removeConfigAuthenticate(unsigned int index) {
  LS_DEBUG("LS_CAuthentication(%p)::removeConfigAuthenticate(%u)\n", logAddress(), index);
  List* const list = ownList();
  if (!list || index >= list->size(LS_Strategy::LOCAL_ONLY))
    return;
  list->removeAt(index);
}

void LS_CAuthentication::clearConfigAuthenticates() {
  LS_DEBUG("LS_CAuthentication(%p)::clearConfigAuthenticate()\n", logAddress());
  List* const list = ownList();
  if (!list)
    return;
  list->entries().clear();
  list->notifyChange();
}

void LS_CAuthentication::destroyConfigAuthenticates() {
  LS_DEBUG("LS_CAuthentication(%p)::destroyConfigAuthenticate()\n", logAddress());
  removeElement(listKey());
}

unsigned int LS_CAuthentication::getNumberOfAuthenticates() const {
  List* list = nullptr;
  if (LS_getAppendListElement(this, listKey(), LS_Strategy::LOCAL_OR_BASE, list).isFailure())
    return 0;
  return list->size(LS_Strategy::LOCAL_OR_BASE);
}

XCode LS_CAuthentication::getAuthenticate(unsigned int index,
                                          String& authenticationService,
                                          String& userName) const {
  LS_Authenticate const* const found = entry(LS_Strategy::LOCAL_OR_BASE, index);
  if (!found)
    return XCode::failure();
  authenticationService = found->authenticationService;
  userName = found->userName;
  return XCode::success();
}

InfoContainer& LS_CAuthentication::getInfo(InfoContainer& info,
                                           unsigned int maxLevel,
                                           unsigned int level,
                                           unsigned int maxDetail,
                                           unsigned int detail,
                                           String const& prefix) const {
  LS_InfoRows const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Authentication"), String());
  RefPtr<LS_IMasterAuthenticationService> const master = registeredMaster();
  unsigned int const count = getNumberOfAuthenticates();
  for (unsigned int index = 0; index < count; ++index) {
    String serviceName;
    String userName;
    if (getAuthenticate(index, serviceName, userName).isFailure())
      continue;
    rows.add(level + 1, "Authentication Link", String());
    RefPtr<LS_IAuthenticationService> service;
    if (master)
      LS_getAuthenticationServiceIf(master.get(), serviceName, service);
    rows.add(level + 2, "Authentication-Service",
             service ? String().format("%s", serviceName.c_str())
                     : String().format("%s (DOES NOT EXIST)", serviceName.c_str()));
    if (userName.isEmpty())
      continue;
    String password;
    String userText;
    if (service && LockedPtr<LS_IAuthenticationService>(service)->getCredentials(userName, password).isSuccess())
      userText.format("%s", userName.c_str());
    else if (service && LockedPtr<LS_IAuthenticationService>(service)->getCredentials("DEFAULT", password).isSuccess())
      userText.format("%s (does not exist; fallback to username 'default')", userName.c_str());
    else
      userText.format("%s (DOES NOT EXIST)", userName.c_str());
    rows.add(level + 2, "User Name", userText);
  }
  return info;
}
