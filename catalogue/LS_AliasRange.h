// LS_AliasRange: one range of alias values of an identity, from and to
// inclusive, shown as "%s..%s". How a user name falls into a range is the
// identity's business, not this record's.
#pragma once

#include "Export.h"

#include "String.h"

struct LS_EXPORT LS_AliasRange {
  String from;
  String to;

  // Byte-wise on both ends; removing a range from an alias removes the first
  // range equal by this operator.
  bool operator==(LS_AliasRange const& other) const { return from == other.from && to == other.to; }
};
