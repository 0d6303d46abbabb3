// LS_IIdentity: the run-time view of an identity, as the SIP side and the
// lookups read it: every getter shows the inherited view, the identity's own
// value or else the one of its base identity chain. It also hands out the
// identity's faces and takes the SIP side's reports that the identity became
// registered or unregistered at this gateway. Configuration belongs to
// LS_IIdentityConfig, the notifications to the three face subjects.
#pragma once

#include "Export.h"

#include "IUnknown.h"
#include "LS_IdentityFace.h"
#include "LS_IdentityType.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "LS_User.h"
#include "RefPtr.h"
#include "String.h"
#include "XCode.h"

class LS_EXPORT LS_IIdentity : public LS_Interface<LS_IIdentityIdentifiers> {
 public:
  virtual String getName() const = 0;
  // Failure, and base null, when the identity has no base identity.
  virtual XCode getBaseIdentity(RefPtr<LS_IIdentity>& base) const = 0;
  virtual LS_IdentityType::Type getIdentityType() const = 0;

  // The alias record in effect: the identity's own, else its base's. Counts
  // are 0 without one; indexed getters fail, with empty texts, past the end.
  virtual unsigned int getNumberOfAliasNames() const = 0;
  virtual XCode getAliasName(unsigned int index, String& name) const = 0;
  virtual unsigned int getNumberOfAliasRanges() const = 0;
  virtual XCode getAliasRange(unsigned int index, String& from, String& to) const = 0;
  virtual unsigned int getNumberOfAliasExpressions() const = 0;
  virtual XCode getAliasExpression(unsigned int index, String& expression) const = 0;
  // Whether user addresses this identity: its own name, an alias name, a
  // range (inclusive, compared as byte strings, not as numbers) or an alias
  // expression that covers the whole of user.
  virtual bool isResponsible(String const& user) const = 0;

  // Empty texts and undefined when neither the identity nor its bases hold
  // a value.
  virtual String getDisplayName() const = 0;
  virtual String getPhoneContext() const = 0;
  virtual LS_User::Type getUserRepresentation() const = 0;
  // Failure, and null, while the identity belongs to no location service.
  virtual XCode getLocationServiceIf(UUID const& iid, void** out) const = 0;

  // The identity's own face, else the one it inherits.
  virtual XCode getFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) const = 0;
  // A face learnt at run time. An own face of that kind, configured or not,
  // is handed out as it is.
  virtual XCode createDynamicFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) = 0;
  // Removes the own face of that kind only when it is a dynamic one.
  virtual void removeDynamicFace(LS_IdentityFace::Type face) = 0;
  // The identity became registered, or unregistered, at this gateway: its
  // inbound-registration observers are told when it has that face (own or
  // inherited). Nothing is remembered.
  virtual void isInboundRegistered() = 0;
  virtual void isInboundUnregistered() = 0;

 protected:
  ~LS_IIdentity() = default;
};

// out receives interface T of the identity's face (own or inherited), or
// null. Returns the identity's result.
template <class T>
XCode LS_getFaceIf(LS_IIdentity const* identity, LS_IdentityFace::Type face, RefPtr<T>& out) {
  return adoptInterface(
      out, [identity, face](UUID const& iid, void** raw) { return identity->getFaceIf(face, iid, raw); });
}
