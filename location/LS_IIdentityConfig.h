// LS_IIdentityConfig: the configuration side of an identity: name and type,
// the base identity it inherits from, its aliases, display name, phone
// context and user representation, its link to the owning location service
// and its configured faces.
//
// Getters here read only what the identity holds itself and fail when it
// holds nothing; the inherited view belongs to LS_IIdentity. Setters and
// removers of values cannot fail. Creating, naming and owning identities
// belongs to the location service.
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

class LS_ILocationServiceConfig;

class LS_EXPORT LS_IIdentityConfig : public LS_Interface<LS_IIdentityConfigIdentifiers> {
 public:
  virtual String getConfigName() const = 0;
  // Renames the identity only: the location service keeps listing it under
  // the name it was created with.
  virtual void setConfigName(String const& name) = 0;

  virtual XCode getConfigBaseIdentity(RefPtr<LS_IIdentityConfig>& base) = 0;
  // Null removes the base. Loops are not checked here (see
  // isNoIdentityConfigLoop); a base that is no element fails and leaves the
  // old base in place.
  virtual XCode setConfigBaseIdentity(LS_IIdentityConfig* base) = 0;
  virtual LS_IdentityType::Type getConfigIdentityType() const = 0;
  virtual void setConfigIdentityType(LS_IdentityType::Type type) = 0;

  // The identity's own alias record. Without one the counts are 0 and every
  // getter fails; indexed getters fail with empty texts past the end.
  virtual XCode getNumberOfConfigAliasNames(unsigned int& count) const = 0;
  virtual XCode getConfigAliasName(unsigned int index, String& name) const = 0;
  // Adding starts an own record when the identity has none; from then on
  // the base's aliases no longer apply to it.
  virtual XCode addConfigAliasName(String const& name) = 0;
  virtual void removeConfigAliasName(String const& name) = 0;
  virtual XCode getNumberOfConfigAliasRanges(unsigned int& count) const = 0;
  virtual XCode getConfigAliasRange(unsigned int index, String& from, String& to) const = 0;
  virtual XCode addConfigAliasRange(String const& from, String const& to) = 0;
  virtual void removeConfigAliasRange(String const& from, String const& to) = 0;
  virtual XCode getNumberOfConfigAliasExpressions(unsigned int& count) const = 0;
  virtual XCode getConfigAliasExpression(unsigned int index, String& expression) const = 0;
  // An expression that does not compile is left out, and still reported as
  // success.
  virtual XCode addConfigAliasExpression(String const& expression) = 0;
  virtual void removeConfigAliasExpression(String const& expression) = 0;
  // Leaves an own, empty record: the identity then has no aliases at all,
  // whatever its base has.
  virtual void clearConfigAlias() = 0;
  // Drops the own record: the base's aliases show again.
  virtual void destroyConfigAlias() = 0;

  virtual XCode getConfigDisplayName(String& displayName) const = 0;
  virtual void setConfigDisplayName(String const& displayName) = 0;
  virtual void removeConfigDisplayName() = 0;
  virtual XCode getConfigPhoneContext(String& phoneContext) const = 0;
  virtual void setConfigPhoneContext(String const& phoneContext) = 0;
  virtual void removeConfigPhoneContext() = 0;
  virtual XCode getConfigUserRepresentation(LS_User::Type& user) const = 0;
  virtual void setConfigUserRepresentation(LS_User::Type user) = 0;
  virtual void removeConfigUserRepresentation() = 0;

  virtual XCode getConfigLocationServiceIf(UUID const& iid, void** out) = 0;
  // The identity holds a counted reference to its location service, which
  // holds the identity: null cuts that link, and whoever drops a location
  // service cuts it first.
  virtual XCode setConfigLocationService(LS_ILocationServiceConfig* service) = 0;

  // The identity's own face, and only a configured one.
  virtual XCode getConfigFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) = 0;
  // A dynamic face of that kind gives way to a new configured one; an own
  // configured face is handed out as it is. A face the identity inherits
  // keeps serving as the new face's base.
  virtual XCode createConfigFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) = 0;
  // Removes the own face of that kind, configured or dynamic; an inherited
  // one shows through again.
  virtual void removeConfigFace(LS_IdentityFace::Type face) = 0;

  // Asked of a proposed base: success when identity may inherit from it,
  // that is when identity is not this base nor any of the next depth - 1
  // identities up its chain, and the chain ends within depth identities.
  virtual XCode isNoIdentityConfigLoop(LS_IIdentityConfig* identity, unsigned int depth) = 0;

 protected:
  ~LS_IIdentityConfig() = default;
};
