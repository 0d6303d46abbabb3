// Libre: the SIP stack's headers, for C++. libre's headers use the fixed-width
// integer types without including their header, so every file of the gateway
// reaches libre through this one.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

// Without it, libre's headers define bool, true and false as macros, which
// in C++ turns true into the int 1 and keeps clang from parsing the
// standard library headers included after them.
#ifndef HAVE_STDBOOL_H
#define HAVE_STDBOOL_H
#endif
#include <re.h>

// A span of a message libre parsed, as a string; a span never set (a null
// pointer) is the empty text.
inline std::string textOf(pl const& value) {
  return value.p ? std::string(value.p, value.l) : std::string();
}
