// LS_ICall: the call handling's view of a call face: the profile names in
// effect, this face's own or else the inherited ones. What a profile is and
// how calls use it belongs outside this component.
#pragma once

#include "Export.h"

#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "String.h"

class LS_EXPORT LS_ICall : public LS_Interface<LS_ICallIdentifiers> {
 public:
  // The empty text when no name is set here or up the chain of bases.
  virtual String getVoipProfile() const = 0;
  virtual String getToneSetProfile() const = 0;
  virtual String getSipProfile() const = 0;

 protected:
  ~LS_ICall() = default;
};
