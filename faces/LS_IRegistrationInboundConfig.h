// LS_IRegistrationInboundConfig: the configuration layer's view of an inbound
// registration face: the lifetime range it grants and the contacts configured
// statically on this face, which stand as if registered. Only what is stored
// on this face is seen here; registered contacts and the effective range are
// read through LS_IRegistrationInbound.
#pragma once

#include "Export.h"

#include "CNameAddr.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "String.h"
#include "XCode.h"

class LS_EXPORT LS_IRegistrationInboundConfig : public LS_Interface<LS_IRegistrationInboundConfigIdentifiers> {
 public:
  // Without an own range: failure, and the outputs become 0, 4294967295 and
  // 3600.
  virtual XCode getConfigLifetimeRange(unsigned int& minimum,
                                       unsigned int& maximum,
                                       unsigned int& defaultLifetime) const = 0;
  // Stored as given, whatever the order of size of the three values.
  virtual void setConfigLifetimeRange(unsigned int minimum,
                                      unsigned int maximum,
                                      unsigned int defaultLifetime) = 0;
  virtual void removeConfigLifetimeRange() = 0;

  // 0 when the face has no static contacts of its own.
  virtual unsigned int getNumberOfConfigContacts() const = 0;
  // Failure, outputs untouched, for an index past the own static list.
  virtual XCode getConfigContact(unsigned int index,
                                 CNameAddr& contact,
                                 String& context,
                                 String& provider,
                                 unsigned int& priority) const = 0;
  // Adds contact, or overwrites the static entry of an equal contact. A
  // dynamic registration of the same contact on this face is dropped first.
  virtual XCode addConfigContact(CNameAddr const& contact,
                                 String const& context,
                                 String const& provider,
                                 unsigned int priority) = 0;
  // Drops the static entry and any dynamic registration of contact.
  virtual void removeConfigContact(CNameAddr const& contact) = 0;

 protected:
  ~LS_IRegistrationInboundConfig() = default;
};
