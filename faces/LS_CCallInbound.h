// LS_CCallInbound: an identity's inbound call face (the child
// "call-inbound"): the profile names for calls that arrive for the identity,
// on top of the filter rules of the inbound face. The shared behaviour of the
// call faces lives in LS_CCallFace; this class supplies its texts.
#pragma once

#include "LS_CCallFace.h"
#include "LS_CInbound.h"

class LS_CCallInbound : public LS_CCallFace<LS_CCallInbound, LS_CInbound> {
 public:
  static constexpr char const CLASS_NAME[] = "LS_CCallInbound";
  static constexpr char const INFO_HEADING[] = "Inbound Call";
};

extern template class LS_CCallFace<LS_CCallInbound, LS_CInbound>;
