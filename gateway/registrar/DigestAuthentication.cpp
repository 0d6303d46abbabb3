#include "registrar/DigestAuthentication.h"

std::string digestChallenge(pl const& realm, std::string const& nonce, bool stale) {
  std::string value = "Digest realm=\"";
  value.append(realm.p, realm.l);
  value += "\", nonce=\"" + nonce + "\", algorithm=MD5, qop=\"auth\"";
  if (stale)
    value += ", stale=true";
  return value;
}

bool digestResponseMatches(httpauth_digest_resp const& response, pl const& method, char const* password) {
  if (pl_strcmp(&response.qop, "auth") != 0)
    return false;
  uint8_t ha1[MD5_SIZE];
  if (md5_printf(ha1, "%r:%r:%s", &response.username, &response.realm, password) != 0)
    return false;
  return httpauth_digest_response_auth(&response, &method, ha1) == 0;
}
