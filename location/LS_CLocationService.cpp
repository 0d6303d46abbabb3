#include "LS_CLocationService.h"

#include "LS_AddressText.h"
#include "LS_CIdentity.h"
#include "LS_Debug.h"
#include "LS_IContainer.h"
#include "LS_IElement.h"
#include "LS_InfoRows.h"
#include "LS_TestExpression.h"
#include "LockedPtr.h"
#include "PlatformTexts.h"

namespace {

// How many identities a base chain above a new identity may hold.
constexpr unsigned int MAX_BASE_CHAIN = 10;

String const& defaultIdentityName() {
  static String const name("DEFAULT");
  return name;
}

void appendNames(StringHashTable<RefPtr<LS_IIdentity>> const& table, Vector<String>& names) {
  for (auto const& entry : table)
    names.add(entry.key);
}

// The identities of table, so that a walk survives observers that edit it.
Vector<RefPtr<LS_IIdentity>> snapshot(StringHashTable<RefPtr<LS_IIdentity>> const& table) {
  Vector<RefPtr<LS_IIdentity>> identities;
  for (auto const& entry : table)
    identities.add(entry.value);
  return identities;
}

// Every identity in either table was made here as an LS_CIdentity.
LS_CIdentity* implementationOf(RefPtr<LS_IIdentity> const& identity) {
  return dynamic_cast<LS_CIdentity*>(identity.get());
}

XCode failWithNull(XCode const& result, void** out) {
  if (out)
    *out = nullptr;
  return result;
}

// True when list holds hostPort itself; notes in partial a host match where
// either side has no port. Hosts compare as host-port equality compares
// them, ASCII case folded.
bool matchesExactly(Vector<CHostPort> const& list, CHostPort const& hostPort, bool& partial) {
  for (CHostPort const& candidate : list) {
    if (candidate == hostPort)
      return true;
    if ((candidate.GetPort() == 0 || hostPort.GetPort() == 0) &&
        candidate.GetHost().equalsIgnoringCase(hostPort.GetHost()))
      partial = true;
  }
  return false;
}

String domainText(CHostPort const& domain) {
  CString const& host = domain.GetHost();
  if (domain.GetPort() == 0 || domain.GetPort() == CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT)
    return String(host.c_str(), host.length());
  return String().format("%s:%u", host.c_str(), static_cast<unsigned int>(domain.GetPort()));
}

String decimal(unsigned int value) {
  return String().format("%u", value);
}

// The identity's configuration interface; fails when the identity no
// longer carries the name it is kept under.
XCode configOfNamed(RefPtr<LS_IIdentity> const& identity, String const& name, RefPtr<LS_IIdentityConfig>& config) {
  XCode const result = LockedPtr<LS_IIdentity>(identity)->queryIf(config);
  if (result.isFailure())
    return result;
  return testExpression(LockedPtr<LS_IIdentityConfig>(config)->getConfigName() == name);
}

}  // namespace

LS_CLocationService::LS_CLocationService() {
  LS_DEBUG("LS_CLocationService(%p)::LS_CLocationService()\n", LS_ptr(this));
}

LS_CLocationService::~LS_CLocationService() {
  LS_DEBUG("LS_CLocationService(%p)::~LS_CLocationService()\n", LS_ptr(this));
}

// Links back.

bool LS_CLocationService::acceptLink(LS_CIdentity* identity) {
  if (m_detached)
    return false;
  LS_CIdentity::ServiceLinks& links = identity->serviceLinks();
  links.previous = nullptr;
  links.next = m_firstLinked;
  if (m_firstLinked)
    m_firstLinked->serviceLinks().previous = identity;
  m_firstLinked = identity;
  return true;
}

void LS_CLocationService::dropLink(LS_CIdentity* identity) {
  LS_CIdentity::ServiceLinks& links = identity->serviceLinks();
  if (links.previous)
    links.previous->serviceLinks().next = links.next;
  else
    m_firstLinked = links.next;
  if (links.next)
    links.next->serviceLinks().previous = links.previous;
  links = LS_CIdentity::ServiceLinks();
}

// The caller holds the service, so no cut link is its last reference; each
// cut takes the identity off the list.
void LS_CLocationService::detachIdentities() {
  m_detached = true;
  while (m_firstLinked)
    LockedPtr<LS_IIdentityConfig>(m_firstLinked)->setConfigLocationService(nullptr);
}

// Name, imperative, default domain.

String LS_CLocationService::getConfigName() const {
  return m_name;
}

void LS_CLocationService::setConfigName(String const& name) {
  m_name = name;
}

LS_Imperative::Type LS_CLocationService::getConfigImperative() const {
  return m_imperative;
}

void LS_CLocationService::setConfigImperative(LS_Imperative::Type imperative) {
  m_imperative = imperative;
  notifyChanges();
}

bool LS_CLocationService::getConfigDefaultDomain() const {
  return m_defaultDomain;
}

void LS_CLocationService::setConfigDefaultDomain(bool defaultDomain) {
  m_defaultDomain = defaultDomain;
}

String LS_CLocationService::getName() const {
  return m_name;
}

LS_Imperative::Type LS_CLocationService::getImperative() const {
  return m_imperative;
}

bool LS_CLocationService::getDefaultDomain() const {
  return m_defaultDomain;
}

// Domains.

unsigned int LS_CLocationService::getNumberOfConfigDomains() const {
  return static_cast<unsigned int>(m_domains.size());
}

CHostPort LS_CLocationService::getConfigDomain(unsigned int index) const {
  return index < m_domains.size() ? m_domains[index] : LS_emptyHostPort();
}

unsigned int LS_CLocationService::getNumberOfDomains() const {
  return getNumberOfConfigDomains();
}

CHostPort LS_CLocationService::getDomain(unsigned int index) const {
  return getConfigDomain(index);
}

size_t LS_CLocationService::positionOf(CHostPort const& domain) const {
  size_t position = 0;
  while (position < m_domains.size() && m_domains[position] != domain)
    ++position;
  return position;
}

void LS_CLocationService::takeOutEqualDomain(CHostPort const& domain, unsigned int& index) {
  size_t const position = positionOf(domain);
  if (position == m_domains.size())
    return;
  m_domains.remove(position);
  if (position < index)
    --index;
}

void LS_CLocationService::insertConfigDomain(unsigned int index, CHostPort const& domain) {
  takeOutEqualDomain(domain, index);
  if (index >= m_domains.size())
    m_domains.add(domain);
  else
    m_domains.insert(index, domain);
  notifyChanges();
}

void LS_CLocationService::modifyConfigDomain(unsigned int index, CHostPort const& domain) {
  takeOutEqualDomain(domain, index);
  if (index >= m_domains.size())
    m_domains.add(domain);
  else
    m_domains[index] = domain;
  notifyChanges();
}

void LS_CLocationService::removeConfigDomain(CHostPort const& domain) {
  for (size_t position = m_domains.size(); position-- > 0;) {
    if (m_domains[position] == domain)
      m_domains.remove(position);
  }
  notifyChanges();
}

// The notices run whether or not anything moved, as for every domain edit.
void LS_CLocationService::moveConfigDomain(unsigned int index, int delta) {
  if (index < m_domains.size()) {
    long long const last = static_cast<long long>(m_domains.size()) - 1;
    long long target = static_cast<long long>(index) + delta;
    if (target < 0)
      target = 0;
    if (target > last)
      target = last;
    CHostPort const moved = m_domains[index];
    m_domains.remove(index);
    m_domains.insert(static_cast<size_t>(target), moved);
  }
  notifyChanges();
}

bool LS_CLocationService::isResponsible(CHostPort const& hostPort,
                                        Vector<CHostPort> const& localHostPorts,
                                        LS_Imperative::Type imperative,
                                        bool& exact) const {
  exact = false;
  if (static_cast<int>(m_imperative) > static_cast<int>(imperative))
    return false;
  bool partial = false;
  if (matchesExactly(m_domains, hostPort, partial) || matchesExactly(localHostPorts, hostPort, partial)) {
    exact = true;
    return true;
  }
  return partial;
}

// Change notices.

void LS_CLocationService::notifyChanges() {
  // An identity's observer may drop this service from its master.
  RefPtr<LS_CLocationService> const self(this);
  LS_DEBUG("LS_CLocationService(%p)::notifyRegistrationOutboundChange()\n", LS_ptr(this));
  notifyConfiguredIdentities(LS_CIdentity::GET_ELEMENT_NAME(LS_IdentityFace::REGISTRATION_OUTBOUND));
  LS_DEBUG("LS_CLocationService(%p)::notifyRegistrationInboundChange()\n", LS_ptr(this));
  notifyConfiguredIdentities(LS_CIdentity::GET_ELEMENT_NAME(LS_IdentityFace::REGISTRATION_INBOUND));
  LS_DEBUG("LS_CLocationService(%p)::notifyMwiSubscriptionChange()\n", LS_ptr(this));
  notifyConfiguredIdentities(LS_CIdentity::GET_ELEMENT_NAME(LS_IdentityFace::MESSAGE_SUBSCRIPTION));
}

void LS_CLocationService::notifyConfiguredIdentities(String const& key) {
  for (RefPtr<LS_IIdentity> const& identity : snapshot(m_configuredIdentities)) {
    RefPtr<LS_IContainer> container;
    if (LockedPtr<LS_IIdentity>(identity)->queryIf(container).isSuccess())
      LockedPtr<LS_IContainer>(container)->changeElement(key);
  }
}

// Identities.

XCode LS_CLocationService::getConfigIdentityIf(String const& name, UUID const& iid, void** out) {
  RefPtr<LS_IIdentity> const* const found = m_configuredIdentities.get(name);
  if (!found)
    return failWithNull(XCode::failure(), out);
  return LockedPtr<LS_IIdentity>(*found)->queryInterface(iid, out);
}

XCode LS_CLocationService::getIdentityIf(String const& name, UUID const& iid, void** out) {
  RefPtr<LS_IIdentity> const* found = m_configuredIdentities.get(name);
  if (!found)
    found = m_dynamicIdentities.get(name);
  if (!found)
    return failWithNull(XCode::failure(), out);
  return LockedPtr<LS_IIdentity>(*found)->queryInterface(iid, out);
}

void LS_CLocationService::getConfigIdentities(Vector<String>& names) const {
  names.clear();
  appendNames(m_configuredIdentities, names);
}

void LS_CLocationService::getIdentities(Vector<String>& names) const {
  getConfigIdentities(names);
  appendNames(m_dynamicIdentities, names);
}

XCode LS_CLocationService::createConfigIdentityIf(String const& name,
                                                  String const& baseName,
                                                  LS_IdentityType::Type type,
                                                  UUID const& iid,
                                                  void** out) {
  LS_DEBUG("LS_CLocationService(%p)::createConfigIdentity(%s, %s)\n", LS_ptr(this), name.c_str(),
           baseName.c_str());
  RefPtr<LS_IIdentity> identity;
  XCode result;
  if (m_dynamicIdentities.contains(name))
    result = takeOverDynamicIdentity(name, baseName, type, identity);
  else if (m_configuredIdentities.contains(name))
    result = checkConfiguredIdentity(name, baseName, type, identity);
  else
    result = createConfiguredIdentity(name, baseName, type, identity);
  if (result.isFailure())
    return failWithNull(result, out);
  return LockedPtr<LS_IIdentity>(identity)->queryInterface(iid, out);
}

// The identity moves tables first and stays configured whatever fails
// afterwards. It was announced when it was created, so nobody is told.
XCode LS_CLocationService::takeOverDynamicIdentity(String const& name,
                                                   String const& baseName,
                                                   LS_IdentityType::Type type,
                                                   RefPtr<LS_IIdentity>& identity) {
  identity = *m_dynamicIdentities.get(name);
  m_dynamicIdentities.remove(name);
  m_configuredIdentities.add(name, identity);
  m_aliasIndex.moveToConfigured(implementationOf(identity));
  RefPtr<LS_IIdentityConfig> config;
  XCode const result = configOfNamed(identity, name, config);
  if (result.isFailure())
    return result;
  LockedPtr<LS_IIdentityConfig>(config)->setConfigIdentityType(type);
  return inheritFrom(config.get(), baseName);
}

// The type of an existing identity is never changed here: asking for
// another one fails.
XCode LS_CLocationService::checkConfiguredIdentity(String const& name,
                                                   String const& baseName,
                                                   LS_IdentityType::Type type,
                                                   RefPtr<LS_IIdentity>& identity) {
  identity = *m_configuredIdentities.get(name);
  RefPtr<LS_IIdentityConfig> config;
  XCode const result = configOfNamed(identity, name, config);
  if (result.isFailure())
    return result;
  if (LockedPtr<LS_IIdentityConfig>(config)->getConfigIdentityType() != type)
    return XCode::failure();
  return inheritFrom(config.get(), baseName);
}

// Nothing is kept unless every step succeeds.
XCode LS_CLocationService::createConfiguredIdentity(String const& name,
                                                    String const& baseName,
                                                    LS_IdentityType::Type type,
                                                    RefPtr<LS_IIdentity>& identity) {
  RefPtr<LS_CIdentity> const created = adoptRef(new LS_CIdentity);
  LS_IIdentityConfig* const config = created.get();
  LockedPtr<LS_IIdentityConfig>(config)->setConfigName(name);
  LockedPtr<LS_IIdentityConfig>(config)->setConfigIdentityType(type);
  XCode result = LockedPtr<LS_IIdentityConfig>(config)->setConfigLocationService(this);
  if (result.isFailure())
    return result;
  result = inheritFrom(config, baseName);
  if (result.isFailure())
    return result;
  identity = created;
  m_configuredIdentities.add(name, identity);
  m_aliasIndex.addConfigured(created.get());
  notifyIdentityAdded(identity.get());
  return XCode::success();
}

XCode LS_CLocationService::inheritFrom(LS_IIdentityConfig* identity, String const& baseName) {
  if (baseName.isEmpty())
    return XCode::success();
  RefPtr<LS_IIdentityConfig> base;
  XCode result = LS_getConfigIdentityIf(static_cast<LS_ILocationServiceConfig*>(this), baseName, base);
  if (result.isFailure())
    return result;
  result = LockedPtr<LS_IIdentityConfig>(base)->isNoIdentityConfigLoop(identity, MAX_BASE_CHAIN);
  if (result.isFailure())
    return result;
  return LockedPtr<LS_IIdentityConfig>(identity)->setConfigBaseIdentity(base.get());
}

XCode LS_CLocationService::createDynamicIdentityIf(String const& name, UUID const& iid, void** out) {
  LS_DEBUG("LS_CLocationService(%p)::createDynamicIdentity(%s)\n", LS_ptr(this), name.c_str());
  RefPtr<LS_IIdentity> identity;
  XCode const result = dynamicIdentity(name, identity);
  if (result.isFailure())
    return failWithNull(result, out);
  return LockedPtr<LS_IIdentity>(identity)->queryInterface(iid, out);
}

XCode LS_CLocationService::dynamicIdentity(String const& name, RefPtr<LS_IIdentity>& identity) {
  RefPtr<LS_IIdentity> const* found = m_configuredIdentities.get(name);
  if (!found)
    found = m_dynamicIdentities.get(name);
  if (found) {
    identity = *found;
    RefPtr<LS_IIdentityConfig> config;
    XCode const result = LockedPtr<LS_IIdentity>(identity)->queryIf(config);
    if (result.isFailure())
      return result;
    if (LockedPtr<LS_IIdentityConfig>(config)->getConfigName() != name)
      return XCode::failure();
    return testExpression(LockedPtr<LS_IIdentityConfig>(config)->getConfigIdentityType() ==
                          LS_IdentityType::IDENTITY);
  }

  RefPtr<LS_CIdentity> const created = adoptRef(new LS_CIdentity);
  LS_IIdentityConfig* const config = created.get();
  LockedPtr<LS_IIdentityConfig>(config)->setConfigName(name);
  LockedPtr<LS_IIdentityConfig>(config)->setConfigIdentityType(LS_IdentityType::IDENTITY);
  XCode result = LockedPtr<LS_IIdentityConfig>(config)->setConfigLocationService(this);
  if (result.isFailure())
    return result;
  RefPtr<LS_IIdentityConfig> group;
  if (LS_getConfigIdentityIf(static_cast<LS_ILocationServiceConfig*>(this), defaultIdentityName(), group)
          .isSuccess()) {
    result = LockedPtr<LS_IIdentityConfig>(config)->setConfigBaseIdentity(group.get());
    if (result.isFailure())
      return result;
  }
  identity = created;
  m_dynamicIdentities.add(name, identity);
  m_aliasIndex.addDynamic(created.get());
  notifyIdentityAdded(identity.get());
  return XCode::success();
}

RefPtr<LS_IIdentity> LS_CLocationService::getFirstResponsibleIdentity(String const& user) {
  return RefPtr<LS_IIdentity>(m_aliasIndex.firstResponsible(user));
}

void LS_CLocationService::removeConfigIdentity(String const& name) {
  LS_DEBUG("LS_CLocationService(%p)::removeConfigIdentity(%s)\n", LS_ptr(this), name.c_str());
  removeIdentity(m_configuredIdentities, name);
  removeIdentity(m_dynamicIdentities, name);
}

void LS_CLocationService::removeDynamicIdentity(String const& name) {
  LS_DEBUG("LS_CLocationService(%p)::removeDynamicIdentity(%s)\n", LS_ptr(this), name.c_str());
  removeIdentity(m_dynamicIdentities, name);
}

void LS_CLocationService::removeIdentity(IdentityTable& table, String const& name) {
  RefPtr<LS_IIdentity> const* const found = table.get(name);
  if (!found)
    return;
  RefPtr<LS_IIdentity> const identity = *found;
  table.remove(name);
  m_aliasIndex.remove(implementationOf(identity));
  RefPtr<LS_IIdentityConfig> config;
  if (LockedPtr<LS_IIdentity>(identity)->queryIf(config).isSuccess())
    LockedPtr<LS_IIdentityConfig>(config)->setConfigBaseIdentity(nullptr);
  notifyIdentityRemoved(identity.get());
}

void LS_CLocationService::notifyIdentityAdded(LS_IIdentity* identity) {
  LS_DEBUG("LS_CLocationService(%p)::notifyIdentityAdded(%p)\n", LS_ptr(this), LS_ptr(identity));
  RefPtr<LS_CLocationService> const self(this);
  m_observers.broadcastEvent(EvIdentity(this, identity), &LS_ILocationServiceObserver::onIdentityAdded);
}

// Observers hear of the removal before the identities based on this one
// let go of it.
void LS_CLocationService::notifyIdentityRemoved(LS_IIdentity* identity) {
  LS_DEBUG("LS_CLocationService(%p)::notifyIdentityRemoved(%p)\n", LS_ptr(this), LS_ptr(identity));
  RefPtr<LS_CLocationService> const self(this);
  RefPtr<LS_IIdentity> const removed(identity);
  m_observers.broadcastEvent(EvIdentity(this, identity), &LS_ILocationServiceObserver::onIdentityRemoved);
  RefPtr<LS_IElement> element;
  if (LockedPtr<LS_IIdentity>(removed)->queryIf(element).isSuccess())
    LockedPtr<LS_IElement>(element)->notifyDestroying();
}

void LS_CLocationService::addLocationServiceObserver(LS_ILocationServiceObserver* observer,
                                                     unsigned int priority) {
  m_observers.addObserver(observer, priority);
}

void LS_CLocationService::removeLocationServiceObserver(LS_ILocationServiceObserver* observer) {
  m_observers.removeObserver(observer);
}

// Dump.

InfoContainer& LS_CLocationService::getInfo(InfoContainer& info,
                                            unsigned int maxLevel,
                                            unsigned int level,
                                            unsigned int maxDetail,
                                            unsigned int detail,
                                            String const& prefix) const {
  LS_InfoRows const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Location-Service"), m_name);

  unsigned int const row = level + 1;
  if (!rows.accepts(row))
    return info;
  rows.add(row, "Imperative", LS_Imperative::NAME(m_imperative));
  rows.add(row, "Match any domain", YES_NO(m_defaultDomain));
  if (m_domains.isEmpty()) {
    rows.add(row, "Domains", "(none)");
  } else {
    rows.add(row, "Domains", String::s_empty);
    for (size_t index = 0; index < m_domains.size(); ++index)
      rows.add(row + 1, domainText(m_domains[index]), index == 0 ? "(master)" : "");
  }

  // One pass over the configured identities proper: each counts as
  // inherited or not, and the inherited ones are tallied under their
  // direct base's name.
  StringHashTable<unsigned int> basedOn(32);
  unsigned int inherited = 0;
  unsigned int notInherited = 0;
  for (auto const& entry : m_configuredIdentities) {
    LockedPtr<LS_IIdentity> const identity(entry.value);
    if (identity->getIdentityType() != LS_IdentityType::IDENTITY)
      continue;
    RefPtr<LS_IIdentity> base;
    if (identity->getBaseIdentity(base).isFailure()) {
      ++notInherited;
      continue;
    }
    ++inherited;
    String const baseName = LockedPtr<LS_IIdentity>(base)->getName();
    if (unsigned int* const count = basedOn.get(baseName))
      ++*count;
    else
      basedOn.add(baseName, 1);
  }

  if (!m_configuredIdentities.isEmpty()) {
    rows.add(row, "Identity-Groups", String::s_empty);
    for (auto const& entry : m_configuredIdentities) {
      LockedPtr<LS_IIdentity> const identity(entry.value);
      if (identity->getIdentityType() != LS_IdentityType::IDENTITY_GROUP)
        continue;
      String const groupName = identity->getName();
      unsigned int const* const count = basedOn.get(groupName);
      rows.add(row + 1, "Identity-Group", groupName);
      rows.add(row + 2, "Number of identities", decimal(count ? *count : 0));
    }
  }
  rows.add(row, "Identities", String::s_empty);
  rows.add(row + 1, "Number of inherited identities", decimal(inherited));
  rows.add(row + 1, "Number of no-inherited identities", decimal(notInherited));
  return info;
}
