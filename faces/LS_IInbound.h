// LS_IInbound: the SIP side's view of an inbound face, the filter rules in
// effect for requests that arrive for the identity: the face's own list, or
// the inherited one while the face has none. How requests are matched against
// the rules belongs to the SIP side, not here.
#pragma once

#include "Export.h"

#include "IpAddress.h"
#include "LS_FilterType.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "XCode.h"

class LS_EXPORT LS_IInbound : public LS_Interface<LS_IInboundIdentifiers> {
 public:
  // 0 when there is no list here or up the chain of bases.
  virtual unsigned int getNumberOfFilterRules() const = 0;
  // Failure, outputs untouched, without a list or for an index past it.
  virtual XCode getFilterRule(unsigned int index, LS_FilterType::Type& type, IpAddress& address) const = 0;

 protected:
  ~LS_IInbound() = default;
};
