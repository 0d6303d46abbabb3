// LS_ICallConfig: the configuration layer's view of a call face: the names of
// the VoIP, tone-set and SIP profiles that calls of the identity use, as
// stored on this face. The profiles themselves live outside this component.
#pragma once

#include "Export.h"

#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "String.h"
#include "XCode.h"

class LS_EXPORT LS_ICallConfig : public LS_Interface<LS_ICallConfigIdentifiers> {
 public:
  // Each getter fails, leaving profile untouched, when this face holds no
  // name of its own; an empty name is stored like any other. A remover lets
  // the inherited name show again.
  virtual XCode getConfigVoipProfile(String& profile) const = 0;
  virtual void setConfigVoipProfile(String const& profile) = 0;
  virtual void removeConfigVoipProfile() = 0;
  virtual XCode getConfigToneSetProfile(String& profile) const = 0;
  virtual void setConfigToneSetProfile(String const& profile) = 0;
  virtual void removeConfigToneSetProfile() = 0;
  virtual XCode getConfigSipProfile(String& profile) const = 0;
  virtual void setConfigSipProfile(String const& profile) = 0;
  virtual void removeConfigSipProfile() = 0;

 protected:
  ~LS_ICallConfig() = default;
};
