// DigestAuthentication: the HTTP digest pieces of the registrar (MD5 with
// qop "auth"): the WWW-Authenticate value of one challenge, and whether an
// Authorization answers a challenge with a given password. The arithmetic is
// libre's (md5_printf for HA1, httpauth_digest_response_auth for the rest);
// here it is only put together. Which realms to challenge and which
// passwords to try is the library's answer, not decided here.
#pragma once

#include <string>

#include "sip/Libre.h"

// The value of one WWW-Authenticate header.
std::string digestChallenge(pl const& realm, std::string const& nonce, bool stale);

// Whether response, decoded by httpauth_digest_response_decode from a
// request of method, was computed with password. Only qop "auth" is
// accepted: the challenge asks for it, and accepting a response without
// qop would let a client drop the cnonce protection.
bool digestResponseMatches(httpauth_digest_resp const& response, pl const& method, char const* password);
