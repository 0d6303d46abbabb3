// LS_CInbound: the common base of an identity's inbound faces (inbound
// registration, inbound call): the ordered list of filter rules that accept
// or deny the peers of requests arriving for the identity.
//
// The face has no state of its own: the list is a data value stored as the
// child "filter" of the face's container. The base of a face is the same face
// of the base identity, so while this face has no list of its own the
// inherited one is in effect: config getters read "localOnly", effective
// getters "localOrBase". Edits change the face's own list in place and
// announce it with changeElement("filter"); removing the last own rule drops
// the list, which gives inheritance back.
//
// Ownership: counted; the identity holds the face as its child, and the face
// dies with its last reference, taking its values with it. Threading: no lock
// of its own; callers hold the face's lock for the whole call. create() stays
// abstract: each concrete face makes an empty instance of itself. The
// settings of the derived faces, and their dump headings, do not belong here.
#pragma once

#include "CInherit.h"
#include "IInfo.h"
#include "LS_CContainer.h"
#include "LS_CData.h"
#include "LS_FilterRule.h"
#include "LS_IInbound.h"
#include "LS_IInboundConfig.h"
#include "Vector.h"

class LS_CInbound : public CInherit<LS_CInbound, LS_CContainer, LS_IInboundConfig, LS_IInbound, IInfo> {
 public:
  LS_CInbound();
  ~LS_CInbound() override;

  // LS_IInboundConfig
  unsigned int getNumberOfConfigFilterRules() const override;
  XCode getConfigFilterRule(unsigned int index, LS_FilterType::Type& type, IpAddress& address) const override;
  XCode modifyConfigFilterRule(unsigned int index,
                               LS_FilterType::Type type,
                               IpAddress const& address) override;
  XCode insertConfigFilterRule(unsigned int index,
                               LS_FilterType::Type type,
                               IpAddress const& address) override;
  void removeConfigFilterRule(unsigned int index) override;

  // LS_IInbound
  unsigned int getNumberOfFilterRules() const override;
  XCode getFilterRule(unsigned int index, LS_FilterType::Type& type, IpAddress& address) const override;

  // IInfo: the effective rules (inherited ones included) under a "Filter"
  // row at level + 1, nothing at all without rules; no heading of its own,
  // and prefix is ignored. The derived faces write their heading, then
  // these rows.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 private:
  // The list that strategy sees; null when there is none.
  Vector<LS_FilterRule> const* filterRules(LS_Strategy::Type strategy) const;
  // This face's own list for editing in place; null when it has none.
  Vector<LS_FilterRule>* ownFilterRules();
};
