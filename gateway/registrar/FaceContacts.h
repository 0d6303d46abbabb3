// FaceContacts: the contacts in effect on an identity's inbound-registration
// face (its own and inherited, static and registered), in the face's order,
// as the redirect server and the calls read them. A static contact carries
// no Call-ID; a registered one has the priority the registrar filed its q
// as, in thousandths.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "CNameAddr.h"
#include "LS_IIdentity.h"

struct FaceContact {
  CNameAddr contact;
  std::string callId;  // empty for a static contact
  unsigned int priority;
};

// At most limit of them.
std::vector<FaceContact> faceContacts(LS_IIdentity const* identity, size_t limit);
