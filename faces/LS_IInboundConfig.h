// LS_IInboundConfig: the configuration layer's view of an inbound face, the
// face's own ordered list of filter rules. Only rules stored on this face are
// seen and changed here; the rules in effect (inherited ones included) are
// read through LS_IInbound.
#pragma once

#include "Export.h"

#include "IpAddress.h"
#include "LS_FilterType.h"
#include "LS_Interface.h"
#include "LS_InterfaceIdentifiers.h"
#include "XCode.h"

class LS_EXPORT LS_IInboundConfig : public LS_Interface<LS_IInboundConfigIdentifiers> {
 public:
  // 0 when the face has no list of its own.
  virtual unsigned int getNumberOfConfigFilterRules() const = 0;
  // Failure, outputs untouched, without an own list or for an index past it.
  virtual XCode getConfigFilterRule(unsigned int index,
                                    LS_FilterType::Type& type,
                                    IpAddress& address) const = 0;
  // Failure without an own list or for an index past it.
  virtual XCode modifyConfigFilterRule(unsigned int index,
                                       LS_FilterType::Type type,
                                       IpAddress const& address) = 0;
  // Inserts at min(index, length), starting an empty own list when the face
  // has none (inherited rules are not copied into it).
  virtual XCode insertConfigFilterRule(unsigned int index,
                                       LS_FilterType::Type type,
                                       IpAddress const& address) = 0;
  // An index past the own list is ignored. Removing the last own rule drops
  // the list, so that the inherited rules apply again.
  virtual void removeConfigFilterRule(unsigned int index) = 0;

 protected:
  ~LS_IInboundConfig() = default;
};
