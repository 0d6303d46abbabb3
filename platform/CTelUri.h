// CTelUri: a telephone-number URI, tel:number[;params]. It keeps the number
// and the "phone-context" parameter as written; other parameters are checked
// but not kept. Number normalisation (removing visual separators, adding a
// country code) does not belong here.
#pragma once

#include "Export.h"

#include <cstddef>

#include "CString.h"

class LS_EXPORT CTelUri {
 public:
  CTelUri() = default;

  // Parses a whole URI, scheme included ("tel:", any case). The number is
  // either global ("+" and digits) or local (hex digits, "*", "#"), each
  // with the visual separators "-.()" anywhere and at least one digit.
  // A parameter is ";name[=value]" with a non-empty value when "=" is given;
  // "phone-context" (any case) may appear once and must carry a host name
  // (SipGrammar::isHostName) or a global number. The context becomes the
  // host that selects a location service, so it obeys the same rule as a
  // SIP URI's host: no wildcard from the network. On malformed text the
  // value is reset and false returned.
  bool Parse(char const* text, size_t length);

  // The number as written, visual separators included.
  CString const& GetNumber() const { return m_number; }
  // The value of the "phone-context" parameter, null when there is none.
  // The pointer lives as long as this value is neither changed nor destroyed.
  CString const* GetPhoneContext() const { return m_hasPhoneContext ? &m_phoneContext : nullptr; }

 private:
  // Stores the parts of a well-formed text; leaves the value alone otherwise.
  bool assign(char const* text, size_t length);
  void Reset();

  CString m_number;
  bool m_hasPhoneContext = false;
  CString m_phoneContext;
};
