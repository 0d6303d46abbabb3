// LS_CCallInbound: an identity's inbound call face (the child
// "call-inbound"): the profile names for calls that arrive for the identity,
// on top of the filter rules of the inbound face. The shared behaviour of the
// call faces lives in LS_CCallFace; this class supplies its texts.
#pragma once

#include "LS_CCallFace.h"
#include "LS_CInbound.h"

class LS_CCallInbound : public LS_CCallFace<LS_CCallInbound, LS_CInbound> {
 public:
  static constexpr LS_CallFaceLogFormats LOG_FORMATS{
      "LS_CCallInbound(%p)::LS_CCallInbound()\n",
      "LS_CCallInbound(%p)::~LS_CCallInbound()\n",
      "LS_CCallInbound(%p)::setConfigVoipProfile(%s)\n",
      "LS_CCallInbound(%p)::removeConfigVoipProfile()\n",
      "LS_CCallInbound(%p)::setConfigToneSetProfile(%s)\n",
      "LS_CCallInbound(%p)::removeConfigToneSetProfile()\n",
      "LS_CCallInbound(%p)::setConfigSipProfile(%s)\n",
      "LS_CCallInbound(%p)::removeConfigSipProfile()\n",
  };
  static constexpr char const INFO_HEADING[] = "Inbound Call";
};

extern template class LS_CCallFace<LS_CCallInbound, LS_CInbound>;
