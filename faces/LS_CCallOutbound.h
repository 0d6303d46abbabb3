// LS_CCallOutbound: an identity's outbound call face (the child
// "call-outbound"): the profile names for calls that the identity places, on
// top of the proxies and transport settings of the outbound face. The shared
// behaviour of the call faces lives in LS_CCallFace; this class supplies its
// texts.
#pragma once

#include "LS_CCallFace.h"
#include "LS_COutbound.h"

class LS_CCallOutbound : public LS_CCallFace<LS_CCallOutbound, LS_COutbound> {
 public:
  static constexpr LS_CallFaceLogFormats LOG_FORMATS{
      "LS_CCallOutbound(%p)::LS_CCallOutbound()\n",
      "LS_CCallOutbound(%p)::~LS_CCallOutbound()\n",
      "LS_CCallOutbound(%p)::setConfigVoipProfile(%s)\n",
      "LS_CCallOutbound(%p)::removeConfigVoipProfile()\n",
      "LS_CCallOutbound(%p)::setConfigToneSetProfile(%s)\n",
      "LS_CCallOutbound(%p)::removeConfigToneSetProfile()\n",
      "LS_CCallOutbound(%p)::setConfigSipProfile(%s)\n",
      "LS_CCallOutbound(%p)::removeConfigSipProfile()\n",
  };
  static constexpr char const INFO_HEADING[] = "Outbound Call";
};

extern template class LS_CCallFace<LS_CCallOutbound, LS_COutbound>;
