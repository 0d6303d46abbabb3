// LS_CRegistrationInbound: an identity's inbound registration face (the
// child "registration-inbound"): what the gateway, as registrar for the
// identity, accepts and remembers. Besides the filter rules of the inbound
// face it holds the lifetime range that registrations may ask for
// ("lifetime-range"), the contacts configured statically ("contact") and the
// contacts that the SIP side registers dynamically ("dynamic-contact"). Both
// contact lists keep insertion order and hold each contact (by CNameAddr
// equality) at most once; a contact is either static or dynamic on one face.
//
// The process-wide count of dynamically registered contacts lives here too:
// it always equals the number of dynamic contacts in the own lists of all
// living faces (inherited ones are not counted again), and each step of it
// is mirrored into s_sipStatistics. Every way out of an own dynamic list
// gives its entries back: removeContact, removeContacts, addConfigContact
// taking a contact over, and the destruction of the face.
//
// Decision: removeElement("dynamic-contact") gives the entries back too,
// whoever calls it. The container's reset() removes every own child this
// way when the identity turns its face back into a shadow of the base's
// face; without this the count would keep those contacts for ever.
//
// Ownership: counted; the identity holds the face as its child. The face
// raises no event of its own: its changes reach the identity as changes of
// one child. Threading: no lock of its own; callers hold the face's lock. The
// count is shared by faces that live on different threads, see below.
// The identity's registered and unregistered events do not belong here.
#pragma once

#include <atomic>

#include "LS_CInbound.h"
#include "LS_Contact.h"
#include "LS_IRegistrationInbound.h"
#include "LS_IRegistrationInboundConfig.h"

class LS_CRegistrationInbound : public CInherit<LS_CRegistrationInbound,
                                                LS_CInbound,
                                                LS_IRegistrationInboundConfig,
                                                LS_IRegistrationInbound> {
 public:
  LS_CRegistrationInbound();
  // Gives back the face's own dynamic contacts to the global count.
  ~LS_CRegistrationInbound() override;

  // LS_IElement
  XCode create(RefPtr<LS_IElement>& element) override;

  // LS_IContainer: removing "dynamic-contact" by any path first gives its
  // entries back to the global count.
  void removeElement(String const& name) override;

  // LS_IRegistrationInboundConfig
  XCode getConfigLifetimeRange(unsigned int& minimum,
                               unsigned int& maximum,
                               unsigned int& defaultLifetime) const override;
  void setConfigLifetimeRange(unsigned int minimum,
                              unsigned int maximum,
                              unsigned int defaultLifetime) override;
  void removeConfigLifetimeRange() override;
  unsigned int getNumberOfConfigContacts() const override;
  XCode getConfigContact(unsigned int index,
                         CNameAddr& contact,
                         String& context,
                         String& provider,
                         unsigned int& priority) const override;
  XCode addConfigContact(CNameAddr const& contact,
                         String const& context,
                         String const& provider,
                         unsigned int priority) override;
  void removeConfigContact(CNameAddr const& contact) override;

  // LS_IRegistrationInbound
  void getLifetimeRange(unsigned int& minimum,
                        unsigned int& maximum,
                        unsigned int& defaultLifetime) const override;
  unsigned int getNumberOfContacts() const override;
  XCode getContact(unsigned int index,
                   String& callId,
                   CNameAddr& contact,
                   CHostPort& received,
                   String& context,
                   String& provider,
                   unsigned int& priority,
                   unsigned int& expires) const override;
  XCode addContact(String const& callId,
                   CNameAddr const& contact,
                   CHostPort const& received,
                   String const& context,
                   String const& provider,
                   unsigned int priority,
                   unsigned int expires) override;
  void removeContact(CNameAddr const& contact, String const& callId) override;
  void removeContacts() override;

  // IInfo: the "Inbound Registration" heading (after prefix) at level, the
  // filter rows, the effective lifetime range, this face's own static
  // contacts and the dynamic contacts in effect (inherited included).
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

  // The global count. Increment counts first, then tells the statistics;
  // decrement tells the statistics first, then counts.
  static void incrementGlobalContacts();
  static void decrementGlobalContacts();
  static int getGlobalContacts();

 private:
  using ContactList = Vector<LS_Contact>;

  // The list that strategy sees under key; null when there is none.
  ContactList const* contacts(String const& key, LS_Strategy::Type strategy) const;
  // This face's own list under key for editing in place; null when it has
  // none.
  ContactList* ownContacts(String const& key);
  void giveBackDynamicContacts();

  // Faces on different threads register and unregister contacts at the same
  // time, and no face lock covers this one integer: atomic increments keep
  // every step, where a plain int would lose concurrent ones.
  static std::atomic<int> s_globalContacts;
};
