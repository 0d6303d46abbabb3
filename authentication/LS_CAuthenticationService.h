// LS_CAuthenticationService: one authentication service: its protocol, its
// ordered realms and its table of user names with their passwords.
//
// Invariants: realms are compared and users looked up byte for byte; the
// realm edits never leave two equal realms; the credentials list in the
// order they were last set (setting a user again moves it to the end).
// Ownership: counted; the master authentication service holds one reference
// and names the service once, right after making it. Threading: no lock of
// its own (made with a null lock); the host serialises configuration
// against lookups. Which service a lookup uses belongs to the lookups.
#pragma once

#include "CInherit.h"
#include "IInfo.h"
#include "LS_IAuthenticationService.h"
#include "StringHashTable.h"

class LS_CAuthenticationService
    : public CInherit<LS_CAuthenticationService, CObject, LS_IAuthenticationService, IInfo> {
 public:
  LS_CAuthenticationService();
  ~LS_CAuthenticationService() override;

  // LS_IAuthenticationService
  String getName() const override { return m_name; }
  void setName(String const& name) override { m_name = name; }
  LS_AuthenticationProtocol::Type getProtocol() const override { return m_protocol; }
  void setProtocol(LS_AuthenticationProtocol::Type protocol) override { m_protocol = protocol; }
  bool isResponsible(LS_AuthenticationProtocol::Type protocol, String const& realm, bool& exact) const override;
  unsigned int getNumberOfRealms() const override { return static_cast<unsigned int>(m_realms.size()); }
  String getRealm(unsigned int index) const override;
  // Moves the realm delta places, stopping at either end; an index past the
  // end does nothing.
  void moveRealm(unsigned int index, int delta) override;
  // An equal realm elsewhere goes first (the index follows it when it stood
  // before); an index past the end appends.
  void modifyRealm(unsigned int index, String const& realm) override;
  void insertRealm(unsigned int index, String const& realm) override;
  // Removes every realm equal to realm.
  void removeRealm(String const& realm) override;
  void getAllCredentials(Vector<String>& userNames) const override;
  XCode getCredentials(String const& userName, String& password) const override;
  void setCredentials(String const& userName, String const& password) override;
  void removeCredentials(String const& userName) override;

  // IInfo: heading with the name, the protocol, the realms (the first marked
  // "(master)") and the user names. Passwords are never shown.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 private:
  // Takes out a realm equal to realm, if there is one, and returns index
  // corrected for a removal in front of it.
  unsigned int withoutRealm(unsigned int index, String const& realm);

  String m_name;
  LS_AuthenticationProtocol::Type m_protocol = LS_AuthenticationProtocol::HTTP;
  Vector<String> m_realms;
  StringHashTable<String> m_credentials{32};
};
