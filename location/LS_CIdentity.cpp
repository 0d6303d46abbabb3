#include "LS_CIdentity.h"

#include <utility>

#include "LS_CAliasIndex.h"
#include "LS_CLocationService.h"
#include "LS_ClassIdentifiers.h"
#include "LS_Debug.h"
#include "LS_ElementClassTable.h"
#include "LS_ILocationServiceConfig.h"
#include "LS_InfoRows.h"
#include "LS_TestExpression.h"
#include "LockedPtr.h"
#include "RegEx.h"

namespace {

LS_ElementClassRegistration const registration(CID_LS_Identity(), &LS_makeElement<LS_CIdentity>);

// The identity's value keys, made once: every read looks one up.
struct IdentityKeys {
  String const alias{"alias"};
  String const displayName{"display-name"};
  String const phoneContext{"phone-context"};
  String const userRepresentation{"user-representation"};
};

IdentityKeys const& keys() {
  static IdentityKeys const identityKeys;
  return identityKeys;
}

// How many LS_CIdentity::getInfo calls are running in the process.
unsigned int s_infoNesting = 0;

class InfoNesting {
 public:
  InfoNesting() { ++s_infoNesting; }
  ~InfoNesting() { --s_infoNesting; }
  InfoNesting(InfoNesting const&) = delete;
  InfoNesting& operator=(InfoNesting const&) = delete;

  bool isOutermost() const { return s_infoNesting == 1; }
};

template <class T>
bool contains(Vector<T> const& list, T const& item) {
  for (T const& entry : list) {
    if (entry == item)
      return true;
  }
  return false;
}

template <class T>
unsigned int sizeOf(LS_Alias const* alias, Vector<T> LS_Alias::*list) {
  return alias ? static_cast<unsigned int>((alias->*list).size()) : 0;
}

// Empty text, and failure, past the end or without a record.
XCode textAt(LS_Alias const* alias, Vector<String> LS_Alias::*list, unsigned int index, String& text) {
  text = String();
  if (!alias || index >= (alias->*list).size())
    return XCode::failure();
  text = (alias->*list)[index];
  return XCode::success();
}

XCode rangeAt(LS_Alias const* alias, unsigned int index, String& from, String& to) {
  from = String();
  to = String();
  if (!alias || index >= alias->ranges.size())
    return XCode::failure();
  from = alias->ranges[index].from;
  to = alias->ranges[index].to;
  return XCode::success();
}

// The own-record count of a configuration getter: failure without a record.
template <class T>
XCode configCount(LS_Alias const* alias, Vector<T> LS_Alias::*list, unsigned int& count) {
  count = sizeOf(alias, list);
  return testExpression(alias);
}

// Inclusive, as byte strings: "1000" lies between "100" and "199".
bool inRange(String const& user, LS_AliasRange const& range) {
  return !(user < range.from) && !(user > range.to);
}

bool matchesAnyPattern(LS_Alias const& alias, String const& user) {
  for (RefPtr<RegEx::Pattern> const& pattern : alias.patterns) {
    if (pattern && pattern->match(user, 0).isSuccess())
      return true;
  }
  return false;
}

// The authentication faces share one dump heading, told apart by prefix.
char const* facePrefix(LS_IdentityFace::Type face) {
  switch (face) {
    case LS_IdentityFace::AUTHENTICATION_OUTBOUND:
      return "Outbound ";
    case LS_IdentityFace::AUTHENTICATION_INBOUND:
      return "Inbound ";
    default:
      return "";
  }
}

constexpr LS_IdentityFace::Type ALL_FACES[] = {
    LS_IdentityFace::AUTHENTICATION_OUTBOUND,
    LS_IdentityFace::AUTHENTICATION_INBOUND,
    LS_IdentityFace::REGISTRATION_OUTBOUND,
    LS_IdentityFace::REGISTRATION_INBOUND,
    LS_IdentityFace::MESSAGE_SUBSCRIPTION,
    LS_IdentityFace::CALL_OUTBOUND,
    LS_IdentityFace::CALL_INBOUND,
};

// Tells observers of one face kind, with the face in effect. The event
// counts the identity, which therefore outlives the broadcast even when an
// observer drops every other reference to it.
template <class Event, class Face, class Observer>
void broadcastFaceEvent(LS_CIdentity* identity,
                        LS_IdentityFace::Type kind,
                        ObserverContainer<Face, Observer>& observers,
                        void (Observer::*handler)(ObserverEvent<Face>&),
                        bool onlyWithFace) {
  if (observers.isEmpty())
    return;
  RefPtr<Face> face;
  LS_getFaceIf(identity, kind, face);
  if (onlyWithFace && !face)
    return;
  Event const event(face.get(), identity);
  observers.broadcastEvent(event, handler);
}

}  // namespace

LS_CIdentity::LS_CIdentity() {
  LS_DEBUG("LS_CIdentity(%p)::LS_Identity()\n", logAddress());
}

LS_CIdentity::~LS_CIdentity() {
  LS_DEBUG("LS_CIdentity(%p)::~LS_Identity()\n", logAddress());
  unlinked();
}

String const& LS_CIdentity::GET_ELEMENT_NAME(LS_IdentityFace::Type face) {
  static String const names[] = {
      "authentication-outbound", "authentication-inbound", "registration-outbound", "registration-inbound",
      "message-subscription",    "call-outbound",          "call-inbound",
  };
  static String const none;
  return face <= LS_IdentityFace::CALL_INBOUND ? names[face] : none;
}

UUID const& LS_CIdentity::GET_ELEMENT_CID(LS_IdentityFace::Type face) {
  switch (face) {
    case LS_IdentityFace::AUTHENTICATION_OUTBOUND:
    case LS_IdentityFace::AUTHENTICATION_INBOUND:
      return CID_LS_Authentication();
    case LS_IdentityFace::REGISTRATION_OUTBOUND:
      return CID_LS_RegistrationOutbound();
    case LS_IdentityFace::REGISTRATION_INBOUND:
      return CID_LS_RegistrationInbound();
    case LS_IdentityFace::MESSAGE_SUBSCRIPTION:
      return CID_LS_MessageSubscription();
    case LS_IdentityFace::CALL_OUTBOUND:
      return CID_LS_CallOutbound();
    case LS_IdentityFace::CALL_INBOUND:
      return CID_LS_CallInbound();
  }
  return CID_Unknown();
}

XCode LS_CIdentity::create(RefPtr<LS_IElement>& element) {
  return LS_makeElement<LS_CIdentity>(element);
}

void LS_CIdentity::onElementAdd(String const& name) {
  onElementChange(name);
}

void LS_CIdentity::onElementRemove(String const& name) {
  onElementChange(name);
}

// Every change of the aliases in effect, own or anywhere up the base chain,
// arrives here as an addition, removal or change of the "alias" child.
void LS_CIdentity::onElementChange(String const& name) {
  if (name == keys().alias) {
    aliasIndexChanged();
    return;
  }
  if (name == GET_ELEMENT_NAME(LS_IdentityFace::REGISTRATION_OUTBOUND)) {
    notifyRegistrationOutboundChange();
    return;
  }
  if (name == GET_ELEMENT_NAME(LS_IdentityFace::REGISTRATION_INBOUND)) {
    notifyRegistrationInboundChange();
    return;
  }
  if (name == GET_ELEMENT_NAME(LS_IdentityFace::MESSAGE_SUBSCRIPTION))
    notifyMwiSubscriptionChange();
}

// Name, type, base and location service.

String LS_CIdentity::getConfigName() const {
  return m_name;
}

void LS_CIdentity::setConfigName(String const& name) {
  m_name = name;
  aliasIndexChanged();
}

XCode LS_CIdentity::getConfigBaseIdentity(RefPtr<LS_IIdentityConfig>& base) {
  return LS_getBaseIf(static_cast<LS_IElement const*>(this), base);
}

XCode LS_CIdentity::setConfigBaseIdentity(LS_IIdentityConfig* base) {
  LS_DEBUG("LS_CIdentity(%p)::setConfigBaseIdentity(%p)\n", logAddress(), LS_ptr(base));
  return setBaseIf(base);
}

LS_IdentityType::Type LS_CIdentity::getConfigIdentityType() const {
  return m_type;
}

void LS_CIdentity::setConfigIdentityType(LS_IdentityType::Type type) {
  m_type = type;
  aliasIndexChanged();
}

XCode LS_CIdentity::getConfigLocationServiceIf(UUID const& iid, void** out) {
  return getLocationServiceIf(iid, out);
}

XCode LS_CIdentity::setConfigLocationService(LS_ILocationServiceConfig* service) {
  // The old link is dropped last: it may hold the service that holds this
  // identity.
  RefPtr<LS_ILocationService> const previous = unlinked();
  if (!service)
    return XCode::success();
  RefPtr<LS_ILocationService> linked;
  XCode const result = LockedPtr<LS_ILocationServiceConfig>(service)->queryIf(linked);
  if (result.isFailure())
    return result;
  auto* const owner = dynamic_cast<LS_CLocationService*>(linked.get());
  if (owner && !owner->acceptLink(this))
    return result;
  m_locationService = std::move(linked);
  return result;
}

RefPtr<LS_ILocationService> LS_CIdentity::unlinked() {
  if (auto* const owner = dynamic_cast<LS_CLocationService*>(m_locationService.get()))
    owner->dropLink(this);
  return std::move(m_locationService);
}

XCode LS_CIdentity::isNoIdentityConfigLoop(LS_IIdentityConfig* identity, unsigned int depth) {
  if (identity == static_cast<LS_IIdentityConfig*>(this))
    return XCode::failure();
  if (depth == 0)
    return XCode::failure();
  RefPtr<LS_IIdentityConfig> base;
  if (getConfigBaseIdentity(base).isFailure())
    return XCode::success();
  return LockedPtr<LS_IIdentityConfig>(base)->isNoIdentityConfigLoop(identity, depth - 1);
}

String LS_CIdentity::getName() const {
  return m_name;
}

XCode LS_CIdentity::getBaseIdentity(RefPtr<LS_IIdentity>& base) const {
  return LS_getBaseIf(static_cast<LS_IElement const*>(this), base);
}

LS_IdentityType::Type LS_CIdentity::getIdentityType() const {
  return m_type;
}

XCode LS_CIdentity::getLocationServiceIf(UUID const& iid, void** out) const {
  if (!m_locationService) {
    if (out)
      *out = nullptr;
    return XCode::failure();
  }
  return LockedPtr<LS_ILocationService>(m_locationService)->queryInterface(iid, out);
}

// Aliases.

LS_Alias const* LS_CIdentity::aliasInEffect() const {
  return valueIn<LS_Alias>(keys().alias, LS_Strategy::LOCAL_OR_BASE);
}

LS_Alias const* LS_CIdentity::ownAlias() const {
  return valueIn<LS_Alias>(keys().alias, LS_Strategy::LOCAL_ONLY);
}

XCode LS_CIdentity::ownAliasCreated(LS_Alias*& alias) {
  return LS_createDataElementPointer(this, keys().alias, alias);
}

void LS_CIdentity::notifyAliasChange() {
  changeElement(keys().alias);
}

void LS_CIdentity::aliasIndexChanged() {
  if (m_aliasIndex)
    m_aliasIndex->identityChanged(this);
}

XCode LS_CIdentity::getNumberOfConfigAliasNames(unsigned int& count) const {
  return configCount(ownAlias(), &LS_Alias::names, count);
}

XCode LS_CIdentity::getConfigAliasName(unsigned int index, String& name) const {
  return textAt(ownAlias(), &LS_Alias::names, index, name);
}

XCode LS_CIdentity::addConfigAliasName(String const& name) {
  LS_DEBUG("LS_COutbound(%p)::addConfigAliasName(%s)\n", logAddress(), name.c_str());
  LS_Alias* alias = nullptr;
  XCode const result = ownAliasCreated(alias);
  if (result.isFailure())
    return result;
  if (contains(alias->names, name))
    return XCode::success();
  alias->names.add(name);
  notifyAliasChange();
  return XCode::success();
}

void LS_CIdentity::removeConfigAliasName(String const& name) {
  LS_DEBUG("LS_CIdentity(%p)::removeConfigAliasName(%s)\n", logAddress(), name.c_str());
  LS_Alias* const alias = ownValue<LS_Alias>(keys().alias);
  if (!alias)
    return;
  for (size_t index = alias->names.size(); index-- > 0;) {
    if (alias->names[index] == name)
      alias->names.remove(index);
  }
  notifyAliasChange();
}

XCode LS_CIdentity::getNumberOfConfigAliasRanges(unsigned int& count) const {
  return configCount(ownAlias(), &LS_Alias::ranges, count);
}

XCode LS_CIdentity::getConfigAliasRange(unsigned int index, String& from, String& to) const {
  return rangeAt(ownAlias(), index, from, to);
}

XCode LS_CIdentity::addConfigAliasRange(String const& from, String const& to) {
  LS_DEBUG("LS_COutbound(%p)::addConfigAliasRange(%s, %s)\n", logAddress(), from.c_str(), to.c_str());
  LS_Alias* alias = nullptr;
  XCode const result = ownAliasCreated(alias);
  if (result.isFailure())
    return result;
  LS_AliasRange const range{from, to};
  if (contains(alias->ranges, range))
    return XCode::success();
  alias->ranges.add(range);
  notifyAliasChange();
  return XCode::success();
}

void LS_CIdentity::removeConfigAliasRange(String const& from, String const& to) {
  LS_DEBUG("LS_COutbound(%p)::removeConfigAliasRange(%s, %s)\n", logAddress(), from.c_str(), to.c_str());
  LS_Alias* alias = nullptr;
  if (ownAliasCreated(alias).isFailure())
    return;
  // Every equal range goes; adding never stores one twice, so this is the
  // first and only one.
  LS_AliasRange const range{from, to};
  for (size_t index = alias->ranges.size(); index-- > 0;) {
    if (alias->ranges[index] == range)
      alias->ranges.remove(index);
  }
  notifyAliasChange();
}

XCode LS_CIdentity::getNumberOfConfigAliasExpressions(unsigned int& count) const {
  return configCount(ownAlias(), &LS_Alias::expressions, count);
}

XCode LS_CIdentity::getConfigAliasExpression(unsigned int index, String& expression) const {
  return textAt(ownAlias(), &LS_Alias::expressions, index, expression);
}

XCode LS_CIdentity::addConfigAliasExpression(String const& expression) {
  LS_DEBUG("LS_COutbound(%p)::addConfigAliasExpression(%s)\n", logAddress(), expression.c_str());
  LS_Alias* alias = nullptr;
  XCode const result = ownAliasCreated(alias);
  if (result.isFailure())
    return result;
  if (contains(alias->expressions, expression))
    return XCode::success();
  // Texts and patterns stay index for index: a text that does not compile
  // is not kept.
  if (RefPtr<RegEx::Pattern> const pattern = RegEx::COMPILE_EXPRESSION(expression)) {
    alias->expressions.add(expression);
    alias->patterns.add(pattern);
  }
  notifyAliasChange();
  return XCode::success();
}

void LS_CIdentity::removeConfigAliasExpression(String const& expression) {
  LS_DEBUG("LS_CIdentity(%p)::removeConfigAliasExpression(%s)\n", logAddress(), expression.c_str());
  LS_Alias* const alias = ownValue<LS_Alias>(keys().alias);
  if (!alias)
    return;
  for (size_t index = 0; index < alias->expressions.size(); ++index) {
    if (alias->expressions[index] != expression)
      continue;
    alias->expressions.remove(index);
    alias->patterns.remove(index);
    break;
  }
  notifyAliasChange();
}

void LS_CIdentity::clearConfigAlias() {
  LS_Alias* alias = nullptr;
  if (ownAliasCreated(alias).isFailure())
    return;
  *alias = LS_Alias();
  notifyAliasChange();
}

void LS_CIdentity::destroyConfigAlias() {
  LS_DEBUG("LS_CIdentity(%p)::destroyConfigAlias()\n", logAddress());
  removeElement(keys().alias);
}

unsigned int LS_CIdentity::getNumberOfAliasNames() const {
  return sizeOf(aliasInEffect(), &LS_Alias::names);
}

XCode LS_CIdentity::getAliasName(unsigned int index, String& name) const {
  return textAt(aliasInEffect(), &LS_Alias::names, index, name);
}

unsigned int LS_CIdentity::getNumberOfAliasRanges() const {
  return sizeOf(aliasInEffect(), &LS_Alias::ranges);
}

XCode LS_CIdentity::getAliasRange(unsigned int index, String& from, String& to) const {
  return rangeAt(aliasInEffect(), index, from, to);
}

unsigned int LS_CIdentity::getNumberOfAliasExpressions() const {
  return sizeOf(aliasInEffect(), &LS_Alias::expressions);
}

XCode LS_CIdentity::getAliasExpression(unsigned int index, String& expression) const {
  return textAt(aliasInEffect(), &LS_Alias::expressions, index, expression);
}

bool LS_CIdentity::isResponsible(String const& user) const {
  if (user == m_name)
    return true;
  LS_Alias const* const alias = aliasInEffect();
  if (!alias)
    return false;
  if (contains(alias->names, user))
    return true;
  for (LS_AliasRange const& range : alias->ranges) {
    if (inRange(user, range))
      return true;
  }
  return matchesAnyPattern(*alias, user);
}

// Display name, phone context, user representation.

XCode LS_CIdentity::getConfigDisplayName(String& displayName) const {
  return readValue(keys().displayName, LS_Strategy::LOCAL_ONLY, displayName);
}

void LS_CIdentity::setConfigDisplayName(String const& displayName) {
  LS_DEBUG("LS_CIdentity(%p)::setConfigDisplayName(%s)\n", logAddress(), displayName.c_str());
  setValue(keys().displayName, displayName);
}

void LS_CIdentity::removeConfigDisplayName() {
  LS_DEBUG("LS_CIdentity(%p)::setConfigDisplayName()\n", logAddress());
  removeValue(keys().displayName);
}

XCode LS_CIdentity::getConfigPhoneContext(String& phoneContext) const {
  return readValue(keys().phoneContext, LS_Strategy::LOCAL_ONLY, phoneContext);
}

void LS_CIdentity::setConfigPhoneContext(String const& phoneContext) {
  LS_DEBUG("LS_CIdentity(%p)::setConfigPhoneContext(%s)\n", logAddress(), phoneContext.c_str());
  setValue(keys().phoneContext, phoneContext);
}

void LS_CIdentity::removeConfigPhoneContext() {
  LS_DEBUG("LS_CIdentity(%p)::setConfigPhoneContext()\n", logAddress());
  removeValue(keys().phoneContext);
}

XCode LS_CIdentity::getConfigUserRepresentation(LS_User::Type& user) const {
  return readValue(keys().userRepresentation, LS_Strategy::LOCAL_ONLY, user);
}

void LS_CIdentity::setConfigUserRepresentation(LS_User::Type user) {
  LS_DEBUG("LS_CIdentity(%p)::setConfigUserRepresentation(%s)\n", logAddress(), LS_User::NAME(user));
  setValue(keys().userRepresentation, user);
}

void LS_CIdentity::removeConfigUserRepresentation() {
  LS_DEBUG("LS_CIdentity(%p)::setConfigUserRepresentation()\n", logAddress());
  removeValue(keys().userRepresentation);
}

String LS_CIdentity::getDisplayName() const {
  return readValueOr(keys().displayName, String());
}

String LS_CIdentity::getPhoneContext() const {
  return readValueOr(keys().phoneContext, String());
}

LS_User::Type LS_CIdentity::getUserRepresentation() const {
  return readValueOr(keys().userRepresentation, LS_User::UNDEFINED);
}

// Faces.

XCode LS_CIdentity::getFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) const {
  return getElementIf(GET_ELEMENT_NAME(face), LS_Strategy::LOCAL_OR_BASE, iid, out);
}

XCode LS_CIdentity::getConfigFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) {
  if (!out)
    return XCode::failure();
  *out = nullptr;
  RefPtr<LS_IElement> element;
  if (getElement(GET_ELEMENT_NAME(face), LS_Strategy::LOCAL_ONLY, element).isFailure())
    return XCode::failure();
  if (LockedPtr<LS_IElement>(element)->isDynamic())
    return XCode::failure();
  return LockedPtr<LS_IElement>(element)->queryInterface(iid, out);
}

XCode LS_CIdentity::createConfigFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) {
  removeDynamicFace(face);
  LS_DEBUG("LS_CIdentity(%p)::createConfigFaceIf(%s)\n", logAddress(), LS_IdentityFace::NAME(face));
  return createElementIf(GET_ELEMENT_NAME(face), GET_ELEMENT_CID(face), iid, out);
}

void LS_CIdentity::removeConfigFace(LS_IdentityFace::Type face) {
  removeElement(GET_ELEMENT_NAME(face));
}

XCode LS_CIdentity::createDynamicFaceIf(LS_IdentityFace::Type face, UUID const& iid, void** out) {
  LS_DEBUG("LS_CIdentity(%p)::createConfigFaceIf(%s)\n", logAddress(), LS_IdentityFace::NAME(face));
  String const& key = GET_ELEMENT_NAME(face);
  // An own face is handed out as it is, even when it lacks iid: making
  // another one would add a second child under a name already taken.
  if (containsElement(key, LS_Strategy::LOCAL_ONLY))
    return getElementIf(key, LS_Strategy::LOCAL_ONLY, iid, out);
  if (!out)
    return XCode::failure();
  XCode const result = createElementIf(key, GET_ELEMENT_CID(face), iid, out);
  if (result.isFailure())
    return result;
  // The new face is under key unless an observer told of its arrival has
  // removed it again; the caller then holds a face that is already gone.
  RefPtr<LS_IElement> created;
  if (getElement(key, LS_Strategy::LOCAL_ONLY, created).isSuccess())
    LockedPtr<LS_IElement>(created)->setDynamic(true);
  return XCode::success();
}

void LS_CIdentity::removeDynamicFace(LS_IdentityFace::Type face) {
  String const& key = GET_ELEMENT_NAME(face);
  RefPtr<LS_IElement> element;
  if (getElement(key, LS_Strategy::LOCAL_ONLY, element).isFailure())
    return;
  if (LockedPtr<LS_IElement>(element)->isDynamic())
    removeElement(key);
}

void LS_CIdentity::isInboundRegistered() {
  notifyRegistrationInboundRegistered();
}

void LS_CIdentity::isInboundUnregistered() {
  notifyRegistrationInboundUnregistered();
}

// Subjects and notifications.

void LS_CIdentity::addRegistrationOutboundObserver(LS_IRegistrationOutboundObserver* observer,
                                                   unsigned int priority) {
  m_registrationOutboundObservers.addObserver(observer, priority);
}

void LS_CIdentity::removeRegistrationOutboundObserver(LS_IRegistrationOutboundObserver* observer) {
  m_registrationOutboundObservers.removeObserver(observer);
}

void LS_CIdentity::addRegistrationInboundObserver(LS_IRegistrationInboundObserver* observer,
                                                  unsigned int priority) {
  m_registrationInboundObservers.addObserver(observer, priority);
}

void LS_CIdentity::removeRegistrationInboundObserver(LS_IRegistrationInboundObserver* observer) {
  m_registrationInboundObservers.removeObserver(observer);
}

void LS_CIdentity::addMwiSubscriptionObserver(LS_IMwiSubscriptionObserver* observer, unsigned int priority) {
  m_mwiSubscriptionObservers.addObserver(observer, priority);
}

void LS_CIdentity::removeMwiSubscriptionObserver(LS_IMwiSubscriptionObserver* observer) {
  m_mwiSubscriptionObservers.removeObserver(observer);
}

void LS_CIdentity::notifyRegistrationOutboundChange() {
  LS_DEBUG("LS_CIdentity(%p)::notifyRegistrationOutboundChange()\n", logAddress());
  broadcastFaceEvent<LS_IRegistrationOutboundSubject::EvIdentity>(
      this, LS_IdentityFace::REGISTRATION_OUTBOUND, m_registrationOutboundObservers,
      &LS_IRegistrationOutboundObserver::onRegistrationOutboundChange, false);
}

void LS_CIdentity::notifyRegistrationInboundChange() {
  LS_DEBUG("LS_CIdentity(%p)::notifyRegistrationInboundChange()\n", logAddress());
  broadcastFaceEvent<LS_IRegistrationInboundSubject::EvIdentity>(
      this, LS_IdentityFace::REGISTRATION_INBOUND, m_registrationInboundObservers,
      &LS_IRegistrationInboundObserver::onRegistrationInboundChange, false);
}

void LS_CIdentity::notifyRegistrationInboundRegistered() {
  LS_DEBUG("LS_CIdentity(%p)::notifyRegistrationInboundRegistered()\n", logAddress());
  broadcastFaceEvent<LS_IRegistrationInboundSubject::EvIdentity>(
      this, LS_IdentityFace::REGISTRATION_INBOUND, m_registrationInboundObservers,
      &LS_IRegistrationInboundObserver::onRegistrationInboundRegistered, true);
}

void LS_CIdentity::notifyRegistrationInboundUnregistered() {
  LS_DEBUG("LS_CIdentity(%p)::notifyRegistrationUnregistered()\n", logAddress());
  broadcastFaceEvent<LS_IRegistrationInboundSubject::EvIdentity>(
      this, LS_IdentityFace::REGISTRATION_INBOUND, m_registrationInboundObservers,
      &LS_IRegistrationInboundObserver::onRegistrationInboundUnregistered, true);
}

void LS_CIdentity::notifyMwiSubscriptionChange() {
  LS_DEBUG("LS_CIdentity(%p)::notifyMwiSubscriptionChange()\n", logAddress());
  broadcastFaceEvent<LS_IMwiSubscriptionSubject::EvIdentity>(
      this, LS_IdentityFace::MESSAGE_SUBSCRIPTION, m_mwiSubscriptionObservers,
      &LS_IMwiSubscriptionObserver::onMwiSubscriptionChange, false);
}

// Dump.

InfoContainer& LS_CIdentity::getInfo(InfoContainer& info,
                                     unsigned int maxLevel,
                                     unsigned int level,
                                     unsigned int maxDetail,
                                     unsigned int detail,
                                     String const& prefix) const {
  InfoNesting const nesting;
  LS_InfoRows const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append(LS_IdentityType::NAME(m_type)), m_name);

  unsigned int const row = level + 1;
  RefPtr<LS_IIdentity> base;
  if (getBaseIdentity(base).isSuccess())
    rows.add(row, "Inherits", LockedPtr<LS_IIdentity>(base)->getName());
  LS_Alias const* const alias = aliasInEffect();
  if (alias && (!alias->names.isEmpty() || !alias->ranges.isEmpty() || !alias->expressions.isEmpty())) {
    rows.add(row, "Alias", String::s_empty);
    for (String const& name : alias->names)
      rows.add(row + 1, name, String::s_empty);
    for (LS_AliasRange const& range : alias->ranges)
      rows.add(row + 1, String().format("%s..%s", range.from.c_str(), range.to.c_str()), String::s_empty);
    for (String const& expression : alias->expressions)
      rows.add(row + 1, String().format("/%s/", expression.c_str()), String::s_empty);
  }
  String const displayName = getDisplayName();
  if (!displayName.isEmpty())
    rows.add(row, "Display Name", displayName);
  String const phoneContext = getPhoneContext();
  if (!phoneContext.isEmpty())
    rows.add(row, "Phone Context", phoneContext);
  LS_User::Type const user = getUserRepresentation();
  if (user != LS_User::UNDEFINED)
    rows.add(row, "User Representation", LS_User::NAME(user));

  if (nesting.isOutermost() && rows.accepts(row))
    dumpFaces(info, maxLevel, row, maxDetail, detail);
  return info;
}

void LS_CIdentity::dumpFaces(InfoContainer& info,
                             unsigned int maxLevel,
                             unsigned int level,
                             unsigned int maxDetail,
                             unsigned int detail) const {
  for (LS_IdentityFace::Type const face : ALL_FACES) {
    RefPtr<IInfo> faceInfo;
    if (LS_getFaceIf(this, face, faceInfo).isSuccess())
      LockedPtr<IInfo>(faceInfo)->getInfo(info, maxLevel, level, maxDetail, detail, facePrefix(face));
  }
}
