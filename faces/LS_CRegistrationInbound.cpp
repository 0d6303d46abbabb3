#include "LS_CRegistrationInbound.h"

#include "LS_AddressText.h"
#include "LS_ClassIdentifiers.h"
#include "LS_Debug.h"
#include "LS_ElementClassTable.h"
#include "LS_FaceInfo.h"
#include "LS_LifetimeRange.h"
#include "SipStatistics.h"

namespace {

LS_ElementClassRegistration const registration(CID_LS_RegistrationInbound(),
                                               &LS_makeElement<LS_CRegistrationInbound>);

// The face's element keys, made once: every read looks one up.
struct RegistrationKeys {
  String const lifetimeRange{"lifetime-range"};
  String const contact{"contact"};
  String const dynamicContact{"dynamic-contact"};
};

RegistrationKeys const& keys() {
  static RegistrationKeys const registrationKeys;
  return registrationKeys;
}

// Handed out when no range is configured here or up the chain.
constexpr LS_LifetimeRange DEFAULT_LIFETIME_RANGE{0, 4294967295u, 3600};

void copyOut(LS_LifetimeRange const& range,
             unsigned int& minimum,
             unsigned int& maximum,
             unsigned int& defaultLifetime) {
  minimum = range.minimum;
  maximum = range.maximum;
  defaultLifetime = range.defaultLifetime;
}

// Position of the entry for contact; the list's size when there is none.
size_t positionOf(Vector<LS_Contact> const& list, CNameAddr const& contact) {
  size_t position = 0;
  while (position < list.size() && list[position].contact != contact)
    ++position;
  return position;
}

// The first entry for contact registered under callId; an empty callId
// matches any. The list's size when there is none.
size_t positionOf(Vector<LS_Contact> const& list, CNameAddr const& contact, String const& callId) {
  size_t position = 0;
  while (position < list.size() &&
         (list[position].contact != contact || (!callId.isEmpty() && list[position].callId != callId)))
    ++position;
  return position;
}

bool holds(Vector<LS_Contact> const* list, CNameAddr const& contact) {
  return list && positionOf(*list, contact) < list->size();
}

unsigned int lengthOf(Vector<LS_Contact> const* list) {
  return list ? static_cast<unsigned int>(list->size()) : 0;
}

// Overwrites the entry for entry.contact, or appends entry. True when it
// appended.
bool store(Vector<LS_Contact>& list, LS_Contact const& entry) {
  size_t const position = positionOf(list, entry.contact);
  if (position < list.size()) {
    list[position] = entry;
    return false;
  }
  list.add(entry);
  return true;
}

String decimal(unsigned int value) {
  return String().format("%u", value);
}

}  // namespace

std::atomic<int> LS_CRegistrationInbound::s_globalContacts{0};

LS_CRegistrationInbound::LS_CRegistrationInbound() {
  LS_DEBUG("LS_CRegistrationInbound(%p)::LS_CRegistrationInbound()\n", logAddress());
}

LS_CRegistrationInbound::~LS_CRegistrationInbound() {
  LS_DEBUG("LS_CRegistrationInbound(%p)::~LS_CRegistrationInbound()\n", logAddress());
  giveBackDynamicContacts();
}

XCode LS_CRegistrationInbound::create(RefPtr<LS_IElement>& element) {
  return LS_makeElement<LS_CRegistrationInbound>(element);
}

void LS_CRegistrationInbound::removeElement(String const& name) {
  if (name == keys().dynamicContact)
    giveBackDynamicContacts();
  LS_CInbound::removeElement(name);
}

void LS_CRegistrationInbound::incrementGlobalContacts() {
  ++s_globalContacts;
  s_sipStatistics.onInboundRegAdded();
}

void LS_CRegistrationInbound::decrementGlobalContacts() {
  s_sipStatistics.onInboundRegRemoved();
  --s_globalContacts;
}

int LS_CRegistrationInbound::getGlobalContacts() {
  return s_globalContacts.load();
}

Vector<LS_Contact> const* LS_CRegistrationInbound::contacts(String const& key,
                                                            LS_Strategy::Type strategy) const {
  return valueIn<ContactList>(key, strategy);
}

Vector<LS_Contact>* LS_CRegistrationInbound::ownContacts(String const& key) {
  return ownValue<ContactList>(key);
}

void LS_CRegistrationInbound::giveBackDynamicContacts() {
  unsigned int const count = lengthOf(ownContacts(keys().dynamicContact));
  for (unsigned int entry = 0; entry < count; ++entry)
    decrementGlobalContacts();
}

XCode LS_CRegistrationInbound::getConfigLifetimeRange(unsigned int& minimum,
                                                      unsigned int& maximum,
                                                      unsigned int& defaultLifetime) const {
  LS_LifetimeRange range = DEFAULT_LIFETIME_RANGE;
  XCode const result = readValue(keys().lifetimeRange, LS_Strategy::LOCAL_ONLY, range);
  copyOut(result.isSuccess() ? range : DEFAULT_LIFETIME_RANGE, minimum, maximum, defaultLifetime);
  return result;
}

void LS_CRegistrationInbound::setConfigLifetimeRange(unsigned int minimum,
                                                     unsigned int maximum,
                                                     unsigned int defaultLifetime) {
  LS_DEBUG("LS_CRegistrationInbound(%p)::setConfigLifetimeRange(%u,%u,%u)\n", logAddress(), minimum, maximum,
           defaultLifetime);
  setValue(keys().lifetimeRange, LS_LifetimeRange{minimum, maximum, defaultLifetime});
}

void LS_CRegistrationInbound::removeConfigLifetimeRange() {
  LS_DEBUG("LS_CRegistrationInbound(%p)::removeConfigLifetimeRange()\n", logAddress());
  removeValue(keys().lifetimeRange);
}

void LS_CRegistrationInbound::getLifetimeRange(unsigned int& minimum,
                                               unsigned int& maximum,
                                               unsigned int& defaultLifetime) const {
  copyOut(readValueOr(keys().lifetimeRange, DEFAULT_LIFETIME_RANGE), minimum, maximum, defaultLifetime);
}

unsigned int LS_CRegistrationInbound::getNumberOfConfigContacts() const {
  return lengthOf(contacts(keys().contact, LS_Strategy::LOCAL_ONLY));
}

XCode LS_CRegistrationInbound::getConfigContact(unsigned int index,
                                                CNameAddr& contact,
                                                String& context,
                                                String& provider,
                                                unsigned int& priority) const {
  ContactList const* const list = contacts(keys().contact, LS_Strategy::LOCAL_ONLY);
  if (!list || index >= list->size())
    return XCode::failure();
  LS_Contact const& entry = (*list)[index];
  contact = entry.contact;
  context = entry.context;
  provider = entry.provider;
  priority = entry.priority;
  return XCode::success();
}

XCode LS_CRegistrationInbound::addConfigContact(CNameAddr const& contact,
                                                String const& context,
                                                String const& provider,
                                                unsigned int priority) {
  // A configured contact takes the place of a dynamic registration of it.
  removeContact(contact, String());
  ContactList* const list = ownValueCreated<ContactList>(keys().contact);
  if (!list)
    return XCode::failure();
  store(*list, LS_Contact(String(), contact, CHostPort(), context, provider, priority, 0));
  changeElement(keys().contact);
  return XCode::success();
}

void LS_CRegistrationInbound::removeConfigContact(CNameAddr const& contact) {
  removeContact(contact, String());
  ContactList* const list = ownContacts(keys().contact);
  if (!list)
    return;
  size_t const position = positionOf(*list, contact);
  if (position == list->size())
    return;
  list->remove(position);
  if (list->isEmpty()) {
    removeValue(keys().contact);
    return;
  }
  changeElement(keys().contact);
}

unsigned int LS_CRegistrationInbound::getNumberOfContacts() const {
  return getNumberOfConfigContacts() + lengthOf(contacts(keys().dynamicContact, LS_Strategy::LOCAL_OR_BASE));
}

XCode LS_CRegistrationInbound::getContact(unsigned int index,
                                          String& callId,
                                          CNameAddr& contact,
                                          CHostPort& received,
                                          String& context,
                                          String& provider,
                                          unsigned int& priority,
                                          unsigned int& expires) const {
  unsigned int const configured = getNumberOfConfigContacts();
  if (index < configured) {
    XCode const result = getConfigContact(index, contact, context, provider, priority);
    if (result.isSuccess()) {
      callId = String();
      expires = 0;
    }
    return result;
  }
  ContactList const* const list = contacts(keys().dynamicContact, LS_Strategy::LOCAL_OR_BASE);
  size_t const position = index - configured;
  if (!list || position >= list->size())
    return XCode::failure();
  LS_Contact const& entry = (*list)[position];
  callId = entry.callId;
  contact = entry.contact;
  received = entry.received;
  context = entry.context;
  provider = entry.provider;
  priority = entry.priority;
  expires = entry.expires;
  return XCode::success();
}

XCode LS_CRegistrationInbound::addContact(String const& callId,
                                          CNameAddr const& contact,
                                          CHostPort const& received,
                                          String const& context,
                                          String const& provider,
                                          unsigned int priority,
                                          unsigned int expires) {
  if (holds(contacts(keys().contact, LS_Strategy::LOCAL_ONLY), contact))
    return XCode::failure();
  ContactList* const list = ownValueCreated<ContactList>(keys().dynamicContact);
  if (!list)
    return XCode::failure();
  bool const added =
      store(*list, LS_Contact(callId, contact, received, context, provider, priority, expires));
  changeElement(keys().dynamicContact);
  if (added)
    incrementGlobalContacts();
  return XCode::success();
}

void LS_CRegistrationInbound::removeContact(CNameAddr const& contact, String const& callId) {
  ContactList* const list = ownContacts(keys().dynamicContact);
  if (!list)
    return;
  size_t const position = positionOf(*list, contact, callId);
  if (position == list->size())
    return;
  list->remove(position);
  decrementGlobalContacts();
  if (list->isEmpty()) {
    removeValue(keys().dynamicContact);
    return;
  }
  changeElement(keys().dynamicContact);
}

void LS_CRegistrationInbound::removeContacts() {
  removeValue(keys().dynamicContact);
}

InfoContainer& LS_CRegistrationInbound::getInfo(InfoContainer& info,
                                                unsigned int maxLevel,
                                                unsigned int level,
                                                unsigned int maxDetail,
                                                unsigned int detail,
                                                String const& prefix) const {
  LS_FaceInfo const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append("Inbound Registration"), String());
  LS_CInbound::getInfo(info, maxLevel, level, maxDetail, detail, String());
  if (!rows.accepts(level + 1))
    return info;

  unsigned int minimum = 0;
  unsigned int maximum = 0;
  unsigned int defaultLifetime = 0;
  getLifetimeRange(minimum, maximum, defaultLifetime);
  rows.add(level + 1, "Lifetime Range",
           String().format("[%us..%us] (Default: %us)", minimum, maximum, defaultLifetime));

  unsigned int const configured = getNumberOfConfigContacts();
  if (configured != 0)
    rows.add(level + 1, "Static Configured Contacts", String());
  for (unsigned int index = 0; index < configured; ++index) {
    CNameAddr contact;
    String context;
    String provider;
    unsigned int priority = 0;
    if (getConfigContact(index, contact, context, provider, priority).isFailure())
      continue;
    rows.add(level + 2, "contact", LS_nameAddrToString(contact));
    rows.add(level + 3, "context", context);
    rows.add(level + 3, "provider", provider);
    rows.add(level + 3, "priority", decimal(priority));
  }

  unsigned int const all = getNumberOfContacts();
  if (all > configured)
    rows.add(level + 1, "Dynamic Registered Contacts", String());
  for (unsigned int index = configured; index < all; ++index) {
    String callId;
    CNameAddr contact;
    CHostPort received;
    String context;
    String provider;
    unsigned int priority = 0;
    unsigned int expires = 0;
    if (getContact(index, callId, contact, received, context, provider, priority, expires).isFailure())
      continue;
    rows.add(level + 2, "contact", LS_nameAddrToString(contact));
    rows.add(level + 3, "received", LS_hostPortToString(received));
    rows.add(level + 3, "context", context);
    rows.add(level + 3, "provider", provider);
    rows.add(level + 3, "priority", decimal(priority));
    rows.add(level + 3, "expires", decimal(expires));
    rows.add(level + 3, "callId", callId);
  }
  return info;
}
