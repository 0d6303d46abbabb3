#include "registrar/FaceContacts.h"

#include "LS_IRegistrationInbound.h"

std::vector<FaceContact> faceContacts(LS_IIdentity const* identity, size_t limit) {
  std::vector<FaceContact> found;
  RefPtr<LS_IRegistrationInbound> face;
  LS_getFaceIf(identity, LS_IdentityFace::REGISTRATION_INBOUND, face);
  unsigned int const count = face ? face->getNumberOfContacts() : 0;
  for (unsigned int i = 0; i < count && found.size() < limit; ++i) {
    String callId, context, provider;
    CNameAddr contact;
    CHostPort received;
    unsigned int priority = 0;
    unsigned int expires = 0;
    if (face->getContact(i, callId, contact, received, context, provider, priority, expires).isSuccess())
      found.push_back(FaceContact{contact, callId.str(), priority});
  }
  return found;
}
