// UUID: a 128-bit identifier with a name attached for diagnostics.
//
// The bytes follow the GUID layout: a 32-bit field and two 16-bit fields,
// each stored little-endian, then eight bytes in order. The text form is the
// usual 8-4-4-4-12 hexadecimal one, whose first three groups are those three
// fields, so "192df9cc-..." is stored as cc f9 2d 19 .... Identity is the
// bytes alone; the name is commentary and is shared, not copied, by copies.
#pragma once

#include "Export.h"

class LS_EXPORT UUID {
 public:
  // The nil identifier (all zero), with an empty name.
  UUID() = default;
  // Parses text; a malformed text yields the nil identifier. name must
  // outlive every copy (the identifiers of the system use literals).
  UUID(char const* text, char const* name);

  // Parses the 8-4-4-4-12 form (either case of hexadecimal digits); false
  // and bytes untouched when text is malformed or null.
  static bool parse(char const* text, unsigned char (&bytes)[16]);

  unsigned char const* bytes() const { return m_bytes; }
  char const* name() const { return m_name; }
  bool isNil() const;

  bool operator==(UUID const& other) const;
  bool operator!=(UUID const& other) const { return !(*this == other); }

 private:
  unsigned char m_bytes[16] = {};
  char const* m_name = "";
};
