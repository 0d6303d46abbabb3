// StorableText: whether a text a REGISTER brings can be kept in the binding
// store as it came. The stores hold text columns, and PostgreSQL refuses a
// byte sequence that is not UTF-8 (and a NUL byte in any text), so the
// registrar refuses such a Call-ID or Contact before it answers, rather
// than answering 200 for a binding the store cannot hold. SIP's grammar
// asks no more of them (RFC 3261 section 25: UTF-8 in quoted strings,
// escapes elsewhere).
#pragma once

#include <cstddef>

// True for well-formed UTF-8 (RFC 3629: no overlong forms, no surrogates,
// nothing past U+10FFFF) without a NUL byte.
bool isStorableText(char const* data, size_t size);
