// FaceNames: the words the script language uses for an identity's seven faces,
// in the order of LS_IdentityFace's values. They are the faces' element names,
// which people already see in logs; the enumeration's own texts hold blanks
// ("Outbound Registration") and would need quoting on every line.
#pragma once

#include <string>
#include <vector>

inline std::vector<std::string> const& faceNames() {
  static std::vector<std::string> const names = {
      "authentication-outbound", "authentication-inbound", "registration-outbound", "registration-inbound",
      "message-subscription",    "call-outbound",          "call-inbound"};
  return names;
}
