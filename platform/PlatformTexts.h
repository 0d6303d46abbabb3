// The utility library's constant texts for flags and invalid values. Texts
// of the system's own enumerations do not belong here.
#pragma once

// "yes" or "no".
inline char const* YES_NO(bool flag) {
  return flag ? "yes" : "no";
}

namespace ERROR {
// The text for a value outside its table: "<invalid>". It differs on purpose
// from "(invalid)", which one enumeration of the system uses as its own
// out-of-range text, so that a dump shows which of the two answered.
extern char const INVALID[];
}  // namespace ERROR
