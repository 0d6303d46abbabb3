// LS_Alias: every alias of one identity (names, ranges and regular
// expressions), stored as one data value of the identity. Matching a user
// name against the aliases belongs to the identity, not here.
#pragma once

#include "Export.h"

#include "LS_AliasRange.h"
#include "RefPtr.h"
#include "RegEx.h"
#include "String.h"
#include "Vector.h"

// Copies share the compiled patterns (one more reference each) and compile
// nothing again; a pattern is immutable, so the sharing is safe.
struct LS_EXPORT LS_Alias {
  Vector<String> names;
  Vector<LS_AliasRange> ranges;
  // As the configuration gave them.
  Vector<String> expressions;
  // The compiled form of expressions, index for index.
  Vector<RefPtr<RegEx::Pattern>> patterns;
};
