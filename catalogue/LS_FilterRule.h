// LS_FilterRule: one rule of an inbound face's filter. Matching a peer
// against the rules, and the dump line of a rule, belong to the face, not
// here.
#pragma once

#include "Export.h"

#include "IpAddress.h"
#include "LS_FilterType.h"

struct LS_EXPORT LS_FilterRule {
  LS_FilterType::Type type = LS_FilterType::ACCEPT;
  // Address and net mask that the rule matches; empty matches any address.
  IpAddress address;
};
