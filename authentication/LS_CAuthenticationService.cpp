#include "LS_CAuthenticationService.h"

#include "LS_Debug.h"
#include "LS_InfoRows.h"
#include "LS_ListPosition.h"

LS_CAuthenticationService::LS_CAuthenticationService() {
  LS_DEBUG("LS_CAuthenticationService(%p)::LS_CAuthenticationService()\n", LS_ptr(this));
}

LS_CAuthenticationService::~LS_CAuthenticationService() {
  LS_DEBUG("LS_CAuthenticationService(%p)::~LS_CAuthenticationService()\n", LS_ptr(this));
}

bool LS_CAuthenticationService::isResponsible(LS_AuthenticationProtocol::Type protocol,
                                              String const& realm,
                                              bool& exact) const {
  exact = false;
  if (protocol != m_protocol)
    return false;
  if (m_realms.isEmpty())
    return true;
  for (String const& own : m_realms) {
    if (own == realm) {
      exact = true;
      return true;
    }
  }
  return false;
}

String LS_CAuthenticationService::getRealm(unsigned int index) const {
  return index < m_realms.size() ? m_realms[index] : String();
}

void LS_CAuthenticationService::moveRealm(unsigned int index, int delta) {
  LS_moveClamped(m_realms, index, delta);
}

unsigned int LS_CAuthenticationService::withoutRealm(unsigned int index, String const& realm) {
  for (size_t position = 0; position < m_realms.size(); ++position) {
    if (m_realms[position] != realm)
      continue;
    m_realms.remove(position);
    return position < index ? index - 1 : index;
  }
  return index;
}

void LS_CAuthenticationService::modifyRealm(unsigned int index, String const& realm) {
  index = withoutRealm(index, realm);
  if (index < m_realms.size())
    m_realms[index] = realm;
  else
    m_realms.add(realm);
}

void LS_CAuthenticationService::insertRealm(unsigned int index, String const& realm) {
  LS_insertClamped(m_realms, withoutRealm(index, realm), realm);
}

void LS_CAuthenticationService::removeRealm(String const& realm) {
  for (size_t position = m_realms.size(); position-- > 0;) {
    if (m_realms[position] == realm)
      m_realms.remove(position);
  }
}

void LS_CAuthenticationService::getAllCredentials(Vector<String>& userNames) const {
  userNames.clear();
  for (auto const& entry : m_credentials)
    userNames.add(entry.key);
}

XCode LS_CAuthenticationService::getCredentials(String const& userName, String& password) const {
  String const* const found = m_credentials.get(userName);
  if (!found)
    return XCode::failure();
  password = *found;
  return XCode::success();
}

void LS_CAuthenticationService::setCredentials(String const& userName, String const& password) {
  LS_DEBUG("LS_CAuthenticationService(%p)::createCredentials(%s, %s)\n", LS_ptr(this), userName.c_str(),
           password.c_str());
  m_credentials.remove(userName);
  m_credentials.add(userName, password);
}

void LS_CAuthenticationService::removeCredentials(String const& userName) {
  LS_DEBUG("LS_CAuthenticationService(%p)::removeCredentials(%s)\n", LS_ptr(this), userName.c_str());
  m_credentials.remove(userName);
}

InfoContainer& LS_CAuthenticationService::getInfo(InfoContainer& info,
                                                  unsigned int maxLevel,
                                                  unsigned int level,
                                                  unsigned int maxDetail,
                                                  unsigned int detail,
                                                  String const& prefix) const {
  LS_InfoRows const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Authentication-Service"), String().format("%s", m_name.c_str()));
  rows.add(level + 1, "Protocol", LS_AuthenticationProtocol::NAME(m_protocol));
  rows.add(level + 1, "Realms", m_realms.isEmpty() ? "(none)" : "");
  for (size_t position = 0; position < m_realms.size(); ++position)
    rows.add(level + 2, m_realms[position], position == 0 ? "(master)" : "");
  rows.add(level + 1, "Credentials", m_credentials.isEmpty() ? "(none)" : "");
  Vector<String> userNames;
  getAllCredentials(userNames);
  String password;
  for (String const& userName : userNames) {
    if (getCredentials(userName, password).isSuccess())
      rows.add(level + 2, userName, String());
  }
  return info;
}
