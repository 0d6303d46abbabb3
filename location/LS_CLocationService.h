// LS_CLocationService: a location service: the SIP domains it answers for,
// how authoritative it is for them, and its identities: the configured
// ones, created by the configuration layer, and the dynamic ones, created
// at run time by the SIP side. A name is in at most one of the two tables;
// a configured identity takes over a dynamic one of the same name.
//
// Ownership: counted. The master holds the service; the service holds one
// reference to each identity, and each identity holds the service back. The
// master cuts those links when it lets the service go, which is what breaks
// that cycle. Removing an identity announces its destruction to the
// elements based on it, so derived identities drop it as their base and
// nothing dangles.
//
// Decision: a removed identity still answers the service it was removed
// from, as long as the master holds that service; when the master lets the
// service go, it cuts the link of every identity that points back here,
// removed ones included, and the service links no identity from then on
// (one made in it afterwards has no location service, like every other
// identity it holds by then). A removed identity may since have become the
// base of one the service still holds, and one made later is held by the
// service: either link back would close a cycle that nothing cuts any more.
// So the service knows every identity linked to it, on a list threaded
// through the identities themselves (borrowed pointers), from which an
// identity takes itself before it lets the link go.
//
// Re-entrancy: observers of the service or of its identities may remove
// identities, or drop the service, while they are told: every walk over an
// identity table works on a copy, and the service holds itself across its
// broadcasts.
//
// The alias index lists the identities of both tables, in the order
// getIdentities gives, and answers which one is responsible for a user
// without asking each; the service tells it of every table change, and each
// listed identity of every change of its name, type or aliases in effect.
//
// Log lines print this service's address and, for identities, the
// LS_IIdentity pointer the table holds.
//
// Threading: no lock of its own (the lock pointer is null); callers
// serialise every operation and the lookups that read the service.
// Finding the service responsible for a host belongs to the lookups.
#pragma once

#include "CHostPort.h"
#include "CInherit.h"
#include "IInfo.h"
#include "LS_CAliasIndex.h"
#include "LS_IIdentity.h"
#include "LS_IIdentityConfig.h"
#include "LS_ILocationService.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_ILocationServiceSubject.h"
#include "ObserverContainer.h"
#include "StringHashTable.h"
#include "Vector.h"

class LS_CLocationService : public CInherit<LS_CLocationService,
                                            CObject,
                                            LS_ILocationServiceConfig,
                                            LS_ILocationService,
                                            LS_ILocationServiceSubject,
                                            IInfo> {
 public:
  LS_CLocationService();
  ~LS_CLocationService() override;

  // LS_ILocationServiceConfig
  String getConfigName() const override;
  void setConfigName(String const& name) override;
  LS_Imperative::Type getConfigImperative() const override;
  void setConfigImperative(LS_Imperative::Type imperative) override;
  unsigned int getNumberOfConfigDomains() const override;
  CHostPort getConfigDomain(unsigned int index) const override;
  void moveConfigDomain(unsigned int index, int delta) override;
  void modifyConfigDomain(unsigned int index, CHostPort const& domain) override;
  void insertConfigDomain(unsigned int index, CHostPort const& domain) override;
  void removeConfigDomain(CHostPort const& domain) override;
  bool getConfigDefaultDomain() const override;
  void setConfigDefaultDomain(bool defaultDomain) override;
  XCode getConfigIdentityIf(String const& name, UUID const& iid, void** out) override;
  XCode createConfigIdentityIf(String const& name,
                               String const& baseName,
                               LS_IdentityType::Type type,
                               UUID const& iid,
                               void** out) override;
  void removeConfigIdentity(String const& name) override;
  void getConfigIdentities(Vector<String>& names) const override;

  // LS_ILocationService
  String getName() const override;
  LS_Imperative::Type getImperative() const override;
  bool isResponsible(CHostPort const& hostPort,
                     Vector<CHostPort> const& localHostPorts,
                     LS_Imperative::Type imperative,
                     bool& exact) const override;
  unsigned int getNumberOfDomains() const override;
  CHostPort getDomain(unsigned int index) const override;
  bool getDefaultDomain() const override;
  XCode getIdentityIf(String const& name, UUID const& iid, void** out) override;
  XCode createDynamicIdentityIf(String const& name, UUID const& iid, void** out) override;
  void removeDynamicIdentity(String const& name) override;
  void getIdentities(Vector<String>& names) const override;

  // The first identity, in the order of getIdentities, of type Identity
  // whose isResponsible(user) is true; null when none is. Answered from the
  // alias index, without asking each identity.
  RefPtr<LS_IIdentity> getFirstResponsibleIdentity(String const& user);

  // Links back (see Ownership). False once the master has let the service
  // go: the identity then holds no link.
  bool acceptLink(LS_CIdentity* identity);
  void dropLink(LS_CIdentity* identity);
  // The master lets the service go: every identity linked here lets go of
  // it, and none is linked from then on.
  void detachIdentities();

  // LS_ILocationServiceSubject
  void addLocationServiceObserver(LS_ILocationServiceObserver* observer, unsigned int priority) override;
  void removeLocationServiceObserver(LS_ILocationServiceObserver* observer) override;

  // IInfo: the heading (prefix, then "Location-Service") with the name,
  // then imperative, default-domain flag, domains, the configured groups
  // with the number of configured identities directly based on each, and
  // the numbers of configured identities with and without a base.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 private:
  using IdentityTable = StringHashTable<RefPtr<LS_IIdentity>>;

  // The configured identity name made or taken over; the three cases of
  // createConfigIdentityIf before the final query.
  XCode takeOverDynamicIdentity(String const& name,
                                String const& baseName,
                                LS_IdentityType::Type type,
                                RefPtr<LS_IIdentity>& identity);
  XCode checkConfiguredIdentity(String const& name,
                                String const& baseName,
                                LS_IdentityType::Type type,
                                RefPtr<LS_IIdentity>& identity);
  XCode createConfiguredIdentity(String const& name,
                                 String const& baseName,
                                 LS_IdentityType::Type type,
                                 RefPtr<LS_IIdentity>& identity);
  // A new dynamic identity, or the identity name when it is no group.
  XCode dynamicIdentity(String const& name, RefPtr<LS_IIdentity>& identity);
  // Makes the configured identity baseName the base of identity; an empty
  // baseName keeps the current base.
  XCode inheritFrom(LS_IIdentityConfig* identity, String const& baseName);
  // Takes name out of table, clears its base and announces its removal.
  void removeIdentity(IdentityTable& table, String const& name);

  // Each configured identity re-announces the face of key to its own
  // observers, where it holds that face itself.
  void notifyChanges();
  void notifyConfiguredIdentities(String const& key);
  void notifyIdentityAdded(LS_IIdentity* identity);
  void notifyIdentityRemoved(LS_IIdentity* identity);

  // Position of the domain equal to domain; the list's size when none is.
  size_t positionOf(CHostPort const& domain) const;
  // The domain list without an entry equal to domain; index shifted down
  // when that entry lay before it.
  void takeOutEqualDomain(CHostPort const& domain, unsigned int& index);

  String m_name;
  bool m_defaultDomain = false;
  LS_Imperative::Type m_imperative = LS_Imperative::AUTHORITATIVE;
  Vector<CHostPort> m_domains;  // index 0 is the master domain; no two equal
  IdentityTable m_configuredIdentities{32};
  IdentityTable m_dynamicIdentities{32};
  // Lists the identities of both tables; declared after them, so that it
  // lets them go while they are still held.
  LS_CAliasIndex m_aliasIndex;
  ObserverContainer<LS_ILocationService, LS_ILocationServiceObserver> m_observers;
  LS_CIdentity* m_firstLinked = nullptr;  // borrowed; see Ownership
  bool m_detached = false;                // the master has let the service go
};
