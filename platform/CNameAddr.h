// CNameAddr: a SIP name-addr ("display name" <uri>) or a bare URI, as
// the stack hands over a To, From or Contact address and as the model keeps
// registered contacts. It parses and serialises one address; header
// parameters after the closing '>' (";tag=", ";expires=") belong to the
// header that carries the address and are not accepted here.
#pragma once

#include "Export.h"

#include <cstddef>

#include "CBlob.h"
#include "CSipUri.h"
#include "CString.h"
#include "CTelUri.h"

// A value type; copies are independent and the URI pointers handed out
// point into the object they were asked from.
//
// Equality compares the URI kind and the URI text as written, ignoring the
// display name: a contact binding is identified by its URI, and the same
// contact re-registered under another display name must replace, not add,
// the binding. No SIP URI comparison rules (case of the host, order of
// parameters) are applied, so a URI equals exactly the text it was
// registered with.
class LS_EXPORT CNameAddr {
 public:
  // Values of GetUriKind().
  enum : unsigned int {
    URI_NONE = 0,
    URI_SIP = 1,
    URI_SIPS = 2,
    URI_TEL = 3,
    // Any other absolute URI ("mailto:", "http:"), kept as written only.
    URI_OTHER = 4,
  };

  // No URI.
  CNameAddr() = default;

  // Accepts, with blanks and tabs around the parts:
  //   "quoted display" <uri>   (quoted string with backslash escapes)
  //   plain display words <uri>
  //   <uri>
  //   uri                      (a bare URI)
  // Schemes compare case-insensitively. Control bytes (a zero byte, CR and
  // LF included) are rejected everywhere but as a tab in white space. On
  // malformed text the value is reset (no URI) and false returned.
  bool Parse(char const* text, size_t length);

  // Appends the text form: `<uri>` without a display name, `"display" <uri>`
  // with one, where '"' and '\' in the display name are escaped with '\'.
  // The URI is written as it was parsed. Appends nothing without a URI.
  void Serialize(CBlob& out) const;

  // The display name without its quotes and with escapes resolved; plain
  // display words as written, without the blanks around them.
  CString const& GetDisplayName() const { return m_displayName; }
  unsigned int GetUriKind() const { return m_uriKind; }
  // Null unless the kind is URI_SIP or URI_SIPS.
  CSipUri const* GetSipUri() const;
  // Null unless the kind is URI_TEL.
  CTelUri const* GetTelUri() const;

  friend bool operator==(CNameAddr const& a, CNameAddr const& b) {
    return a.m_uriKind == b.m_uriKind && a.m_uri == b.m_uri;
  }
  friend bool operator!=(CNameAddr const& a, CNameAddr const& b) { return !(a == b); }

 private:
  // Fill a value that is still in its default state.
  bool assign(char const* text, size_t length);
  bool parseUri(char const* text, size_t length);
  void Reset();

  CString m_displayName;
  unsigned int m_uriKind = URI_NONE;
  // The URI as written; empty for URI_NONE.
  CString m_uri;
  // Meaningful only for the kinds that GetSipUri() and GetTelUri() answer.
  CSipUri m_sipUri;
  CTelUri m_telUri;
};
