// LS_LifetimeRange: the registration lifetimes, in seconds, that an inbound
// registration face grants, shown as "[%us..%us] (Default: %us)" with the
// three fields in order. The defaults handed out when no range is configured
// belong to the face, not here.
#pragma once

#include "Export.h"

// The fields are kept as configured, whatever their order of size.
struct LS_EXPORT LS_LifetimeRange {
  unsigned int minimum = 0;
  unsigned int maximum = 0;
  // Granted when the request asks for no lifetime.
  unsigned int defaultLifetime = 0;

  // Field by field: a data value that is given the range it already holds
  // announces no change.
  bool operator==(LS_LifetimeRange const& other) const {
    return minimum == other.minimum && maximum == other.maximum && defaultLifetime == other.defaultLifetime;
  }
  bool operator!=(LS_LifetimeRange const& other) const { return !(*this == other); }
};
