// LS_IRegistrationInbound: the SIP side's view of an inbound registration
// face: the lifetime range in effect, and the contacts the gateway knows for
// the identity, the static ones of this face first, then the dynamically
// registered ones in effect (inherited included). The SIP side records and
// drops registrations here; the registered and unregistered events of the
// identity do not come from this interface.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "CNameAddr.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "String.h"
#include "XCode.h"

class LS_EXPORT LS_IRegistrationInbound : public LS_Interface<LS_IRegistrationInboundIdentifiers> {
 public:
  // 0, 4294967295 and 3600 when no range is configured here or up the chain.
  virtual void getLifetimeRange(unsigned int& minimum,
                                unsigned int& maximum,
                                unsigned int& defaultLifetime) const = 0;

  // Static contacts of this face plus the dynamic contacts in effect.
  virtual unsigned int getNumberOfContacts() const = 0;
  // Indices below the number of static contacts address those (callId
  // empty, expires 0, received untouched); the rest address the dynamic
  // contacts in effect. Failure, outputs untouched, past the end.
  virtual XCode getContact(unsigned int index,
                           String& callId,
                           CNameAddr& contact,
                           CHostPort& received,
                           String& context,
                           String& provider,
                           unsigned int& priority,
                           unsigned int& expires) const = 0;
  // Registers contact on this face, or re-registers it (the entry is
  // overwritten). Fails, changing nothing, when the contact is configured
  // statically on this face.
  virtual XCode addContact(String const& callId,
                           CNameAddr const& contact,
                           CHostPort const& received,
                           String const& context,
                           String const& provider,
                           unsigned int priority,
                           unsigned int expires) = 0;
  // Drops the registration of contact; a non-empty callId must match too.
  // An unknown contact is ignored.
  virtual void removeContact(CNameAddr const& contact, String const& callId) = 0;
  // Drops every registration of this face's own.
  virtual void removeContacts() = 0;

 protected:
  ~LS_IRegistrationInbound() = default;
};
