// LS_CIdentity: one addressable party of a location service (a subscriber,
// a trunk peer, or a group that others inherit from): its name and type,
// its aliases, display name, phone context and user representation, and up
// to seven faces, each kept as a named child of the identity's container.
// Given a base identity, the container mirrors the base's children, so
// every value and face the identity does not hold itself is inherited and
// followed live.
//
// Ownership: counted. The location service holds the identity and the
// identity holds its location service back; the service's master cuts that
// link, on every identity linked to the service, when it lets the service
// go, and a service let go links no identity (LS_CLocationService). The
// identity holds its base through the element model, so a base outlives the
// identities derived from it; a removed base announces its destruction and
// every derived identity drops it. The identity holds its observers as
// borrowed pointers.
//
// Notifications: a change of the own or inherited outbound-registration,
// inbound-registration or message-waiting face reaches the identity as a
// change of one child and is turned into an event to that face's observers.
// An observer may drop the last outside reference to the identity, or
// unregister itself, while it is being told: the event holds the identity.
//
// Log lines print the identity's LS_IElement address, the one its
// container's own lines (addElement, setBase, ...) print, so that all lines
// of one identity can be told by one address.
//
// Threading: no lock of its own; callers serialise. The dump's nesting
// counter is one plain process-wide integer: dumps do not run concurrently.
// How identities are named, found and removed belongs to the location
// service.
#pragma once

#include "CInherit.h"
#include "IInfo.h"
#include "LS_Alias.h"
#include "LS_CContainer.h"
#include "LS_IIdentity.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationService.h"
#include "LS_IMwiSubscriptionSubject.h"
#include "LS_IRegistrationInboundSubject.h"
#include "LS_IRegistrationOutboundSubject.h"
#include "ObserverContainer.h"

class LS_CAliasIndex;

class LS_CIdentity : public CInherit<LS_CIdentity,
                                     LS_CContainer,
                                     LS_IIdentityConfig,
                                     LS_IIdentity,
                                     LS_IRegistrationOutboundSubject,
                                     LS_IRegistrationInboundSubject,
                                     LS_IMwiSubscriptionSubject,
                                     IInfo> {
 public:
  LS_CIdentity();
  ~LS_CIdentity() override;

  // The child key of a face, and the class a face of that kind is made
  // from. Outside the seven faces: the empty key, which names no child, and
  // CID_Unknown().
  static String const& GET_ELEMENT_NAME(LS_IdentityFace::Type face);
  static UUID const& GET_ELEMENT_CID(LS_IdentityFace::Type face);

  // LS_IElement
  XCode create(RefPtr<LS_IElement>& element) override;

  // LS_CContainer hooks: a child was added, removed or changed, by any path.
  using LS_CContainer::onElementAdd;
  using LS_CContainer::onElementChange;
  using LS_CContainer::onElementRemove;
  void onElementAdd(String const& name) override;
  void onElementRemove(String const& name) override;
  void onElementChange(String const& name) override;

  // LS_IIdentityConfig
  String getConfigName() const override;
  void setConfigName(String const& name) override;
  XCode getConfigBaseIdentity(RefPtr<LS_IIdentityConfig>& base) override;
  XCode setConfigBaseIdentity(LS_IIdentityConfig* base) override;
  LS_IdentityType::Type getConfigIdentityType() const override;
  void setConfigIdentityType(LS_IdentityType::Type type) override;
  XCode getNumberOfConfigAliasNames(unsigned int& count) const override;
  XCode getConfigAliasName(unsigned int index, String& name) const override;
  XCode addConfigAliasName(String const& name) override;
  void removeConfigAliasName(String const& name) override;
  XCode getNumberOfConfigAliasRanges(unsigned int& count) const override;
  XCode getConfigAliasRange(unsigned int index, String& from, String& to) const override;
  XCode addConfigAliasRange(String const& from, String const& to) override;
  void removeConfigAliasRange(String const& from, String const& to) override;
  XCode getNumberOfConfigAliasExpressions(unsigned int& count) const override;
  XCode getConfigAliasExpression(unsigned int index, String& expression) const override;
  XCode addConfigAliasExpression(String const& expression) override;
  void removeConfigAliasExpression(String const& expression) override;
  void clearConfigAlias() override;
  void destroyConfigAlias() override;
  XCode getConfigDisplayName(String& displayName) const override;
  void setConfigDisplayName(String const& displayName) override;
  void removeConfigDisplayName() override;
  XCode getConfigPhoneContext(String& phoneContext) const override;
  void setConfigPhoneContext(String const& phoneContext) override;
  void removeConfigPhoneContext() override;
  XCode getConfigUserRepresentation(LS_User::Type& user) const override;
  void setConfigUserRepresentation(LS_User::Type user) override;
  void removeConfigUserRepresentation() override;
  XCode getConfigLocationServiceIf(UUID const& iid, void** out) override;
  XCode setConfigLocationService(LS_ILocationServiceConfig* service) override;
  XCode getConfigFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) override;
  XCode createConfigFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) override;
  void removeConfigFace(LS_IdentityFace::Type face) override;
  XCode isNoIdentityConfigLoop(LS_IIdentityConfig* identity, unsigned int depth) override;

  // LS_IIdentity
  String getName() const override;
  XCode getBaseIdentity(RefPtr<LS_IIdentity>& base) const override;
  LS_IdentityType::Type getIdentityType() const override;
  unsigned int getNumberOfAliasNames() const override;
  XCode getAliasName(unsigned int index, String& name) const override;
  unsigned int getNumberOfAliasRanges() const override;
  XCode getAliasRange(unsigned int index, String& from, String& to) const override;
  unsigned int getNumberOfAliasExpressions() const override;
  XCode getAliasExpression(unsigned int index, String& expression) const override;
  bool isResponsible(String const& user) const override;
  String getDisplayName() const override;
  String getPhoneContext() const override;
  LS_User::Type getUserRepresentation() const override;
  XCode getLocationServiceIf(UUID const& iid, void** out) const override;
  XCode getFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) const override;
  XCode createDynamicFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) override;
  void removeDynamicFace(LS_IdentityFace::Type face) override;
  void isInboundRegistered() override;
  void isInboundUnregistered() override;

  // The three subjects.
  void addRegistrationOutboundObserver(LS_IRegistrationOutboundObserver* observer,
                                       unsigned int priority) override;
  void removeRegistrationOutboundObserver(LS_IRegistrationOutboundObserver* observer) override;
  void addRegistrationInboundObserver(LS_IRegistrationInboundObserver* observer,
                                      unsigned int priority) override;
  void removeRegistrationInboundObserver(LS_IRegistrationInboundObserver* observer) override;
  void addMwiSubscriptionObserver(LS_IMwiSubscriptionObserver* observer, unsigned int priority) override;
  void removeMwiSubscriptionObserver(LS_IMwiSubscriptionObserver* observer) override;

  // Each tells the subject's observers, with the face in effect. The change
  // events go out also while the identity has no such face (null subject);
  // registered and unregistered only while it has one.
  virtual void notifyRegistrationOutboundChange();
  virtual void notifyRegistrationInboundChange();
  virtual void notifyRegistrationInboundRegistered();
  virtual void notifyRegistrationInboundUnregistered();
  virtual void notifyMwiSubscriptionChange();

  // IInfo: the heading (prefix, then the type's text) with the name, then
  // the base's name, the aliases, display name, phone context and user
  // representation in effect, then the dump of every face in effect. Faces
  // are dumped only by the outermost identity dump in progress, so a face
  // that dumps an identity again cannot recurse.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

  // The alias record in effect (own, else inherited), or null. Valid while
  // the identity and its base chain stay unchanged.
  LS_Alias const* aliasInEffect() const;

  // The alias index of the location service that lists this identity, or
  // null while none does. The index sets and clears it; the identity tells
  // it of every change of its name, its type or its aliases in effect.
  void setAliasIndex(LS_CAliasIndex* index) { m_aliasIndex = index; }

  // This identity's place among the identities linked back to one service,
  // which that service threads through them (LS_CLocationService): kept in
  // the identity, so that a link back costs no allocation of its own.
  struct ServiceLinks {
    LS_CIdentity* previous = nullptr;
    LS_CIdentity* next = nullptr;
  };
  ServiceLinks& serviceLinks() { return m_serviceLinks; }

 private:
  // The identity's own alias record, or null.
  LS_Alias const* ownAlias() const;
  // The own alias record, made empty first when the identity has none.
  XCode ownAliasCreated(LS_Alias*& alias);
  void notifyAliasChange();
  // Tells the alias index, when a service lists the identity.
  void aliasIndexChanged();
  // Takes the identity off its service's links and hands over the link.
  RefPtr<LS_ILocationService> unlinked();
  void dumpFaces(InfoContainer& info,
                 unsigned int maxLevel,
                 unsigned int level,
                 unsigned int maxDetail,
                 unsigned int detail) const;

  String m_name;
  LS_IdentityType::Type m_type = LS_IdentityType::IDENTITY;
  RefPtr<LS_ILocationService> m_locationService;  // null while unlinked
  ObserverContainer<LS_IRegistrationOutbound, LS_IRegistrationOutboundObserver>
      m_registrationOutboundObservers;
  ObserverContainer<LS_IRegistrationInbound, LS_IRegistrationInboundObserver> m_registrationInboundObservers;
  ObserverContainer<LS_IMwiSubscription, LS_IMwiSubscriptionObserver> m_mwiSubscriptionObservers;
  LS_CAliasIndex* m_aliasIndex = nullptr;  // borrowed; see setAliasIndex
  ServiceLinks m_serviceLinks;             // set while m_locationService links back
};
