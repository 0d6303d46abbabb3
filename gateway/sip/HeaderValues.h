// HeaderValues: every value of one header of a message, a comma-separated
// list split into its elements, in the order received; visit returns false
// to stop. libre keeps a message's headers twice: its list holds each line
// as written, so "Contact: <a>, <b>" would come whole, and its table holds
// the elements, which is what a registrar must see one by one.
#pragma once

#include "sip/Libre.h"

template <class Visit>
void forEachHeaderValue(sip_msg const& message, sip_hdrid id, Visit visit) {
  sip_msg_hdr_apply(
      &message, true, id,
      [](sip_hdr const* header, sip_msg const*, void* argument) {
        return !(*static_cast<Visit*>(argument))(*header);
      },
      &visit);
}
