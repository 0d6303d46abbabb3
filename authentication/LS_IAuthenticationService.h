// LS_IAuthenticationService: a named set of credentials for one
// authentication protocol: user names with their passwords, and the ordered
// realms the service answers for. The lookups use it in both directions:
// to answer a peer's challenge for an identity, and to choose the realms
// and passwords with which the gateway challenges and checks a request.
// Owning and naming the services belongs to the master authentication
// service.
#pragma once

#include "Export.h"

#include "LS_AuthenticationProtocol.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "String.h"
#include "Vector.h"
#include "XCode.h"

class LS_EXPORT LS_IAuthenticationService : public LS_Interface<LS_IAuthenticationServiceIdentifiers> {
 public:
  virtual String getName() const = 0;
  virtual void setName(String const& name) = 0;
  virtual LS_AuthenticationProtocol::Type getProtocol() const = 0;
  virtual void setProtocol(LS_AuthenticationProtocol::Type protocol) = 0;

  // Whether the service answers realm of protocol; exact tells a listed
  // realm from a service without realms, which answers every realm of its
  // protocol.
  virtual bool isResponsible(LS_AuthenticationProtocol::Type protocol, String const& realm, bool& exact) const = 0;
  virtual unsigned int getNumberOfRealms() const = 0;
  // The empty text for an index past the end.
  virtual String getRealm(unsigned int index) const = 0;
  virtual void moveRealm(unsigned int index, int delta) = 0;
  virtual void modifyRealm(unsigned int index, String const& realm) = 0;
  virtual void insertRealm(unsigned int index, String const& realm) = 0;
  virtual void removeRealm(String const& realm) = 0;

  // userNames is replaced by every user name, in the order they were set.
  virtual void getAllCredentials(Vector<String>& userNames) const = 0;
  // Fails, leaving password alone, for an unknown user name.
  virtual XCode getCredentials(String const& userName, String& password) const = 0;
  virtual void setCredentials(String const& userName, String const& password) = 0;
  virtual void removeCredentials(String const& userName) = 0;

 protected:
  ~LS_IAuthenticationService() = default;
};
