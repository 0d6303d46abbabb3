#include "registrar/ContactHeader.h"

#include <algorithm>

namespace {

// qvalue = ( "0" [ "." 0*3DIGIT ] ) / ( "1" [ "." 0*3("0") ] ), in
// thousandths.
bool parseQ(pl const& value, unsigned int& thousandths) {
  if (value.l == 0 || value.l > 5 || (value.p[0] != '0' && value.p[0] != '1'))
    return false;
  if (value.l > 1 && value.p[1] != '.')
    return false;
  unsigned int fraction = 0;
  unsigned int scale = 100;
  for (size_t i = 2; i < value.l; ++i, scale /= 10) {
    char const c = value.p[i];
    if (c < '0' || c > '9')
      return false;
    fraction += static_cast<unsigned int>(c - '0') * scale;
  }
  if (value.p[0] == '1' && fraction != 0)
    return false;
  thousandths = value.p[0] == '1' ? 1000 : fraction;
  return true;
}

struct Reading {
  ContactHeader* contact;
  bool malformed;
};

// Parameter names compare case-insensitively (RFC 3261 section 7.3.1).
int readParameter(pl const* name, pl const* value, void* argument) {
  Reading& reading = *static_cast<Reading*>(argument);
  ContactHeader& contact = *reading.contact;
  if (pl_strcasecmp(name, "expires") == 0) {
    reading.malformed = reading.malformed || !ContactHeader::parseSeconds(*value, contact.expires);
    contact.hasExpires = true;
    return 0;
  }
  if (pl_strcasecmp(name, "q") == 0) {
    reading.malformed = reading.malformed || !parseQ(*value, contact.q);
  } else if (pl_strcasecmp(name, "+sip.instance") == 0) {
    contact.instance = textOf(*value);
    if (contact.instance.size() >= 2 && contact.instance.front() == '"' && contact.instance.back() == '"')
      contact.instance = contact.instance.substr(1, contact.instance.size() - 2);
  } else if (pl_strcasecmp(name, "reg-id") == 0) {
    contact.regId = textOf(*value);
  }
  // The parameter as written runs from its ";" to the end of its value.
  char const* const end = value->l != 0 ? value->p + value->l : name->p + name->l;
  contact.parameters.append(name->p - 1, end);
  return 0;
}

}  // namespace

bool ContactHeader::parse(pl const& value, ContactHeader& contact) {
  sip_addr address;
  if (sip_addr_decode(&address, &value) != 0 || !contact.contact.Parse(address.auri.p, address.auri.l))
    return false;
  contact.uri = textOf(address.auri);
  Reading reading{&contact, false};
  if (pl_isset(&address.params) && uri_params_apply(&address.params, readParameter, &reading) != 0)
    return false;
  return !reading.malformed;
}

bool ContactHeader::parseSeconds(pl const& value, uint32_t& seconds) {
  if (value.l == 0)
    return false;
  uint64_t total = 0;
  for (size_t i = 0; i < value.l; ++i) {
    char const c = value.p[i];
    if (c < '0' || c > '9')
      return false;
    total = std::min<uint64_t>(total * 10 + static_cast<uint64_t>(c - '0'), UINT32_MAX);
  }
  seconds = static_cast<uint32_t>(total);
  return true;
}
