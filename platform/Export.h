// Export: LS_EXPORT marks a class, function or variable of a public header
// as part of a shared library's interface. Both libraries are built with
// hidden visibility, so that their internal names cannot clash with the
// rest of the gateway's process; only what carries this mark is exported.
// A marked class exports its members, its vtable and its type information,
// so that dynamic_cast and exceptions work across the library boundary.
#pragma once

#define LS_EXPORT __attribute__((visibility("default")))
