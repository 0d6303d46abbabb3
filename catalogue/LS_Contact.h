// LS_Contact: one contact of an inbound registration face, configured
// statically or registered dynamically. The field names are the keys under
// which the face's dump shows them; the count and expiry of dynamic contacts
// belong to the face, not here.
#pragma once

#include "Export.h"

#include "CHostPort.h"
#include "CNameAddr.h"
#include "String.h"

struct LS_EXPORT LS_Contact {
  LS_Contact() = default;
  LS_Contact(String const& callId,
             CNameAddr const& contact,
             CHostPort const& received,
             String const& context,
             String const& provider,
             unsigned int priority,
             unsigned int expires)
      : callId(callId),
        contact(contact),
        received(received),
        context(context),
        provider(provider),
        priority(priority),
        expires(expires) {}

  // Of the registration that created the contact (dynamic contacts).
  String callId;
  CNameAddr contact;
  // Where a dynamic registration came from.
  CHostPort received;
  String context;
  String provider;
  unsigned int priority = 0;
  // Of a dynamic registration.
  unsigned int expires = 0;
};
