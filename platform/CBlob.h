// CBlob: the SIP stack's growable byte buffer, into which address types
// serialise their text. It holds bytes only: no terminating zero is added,
// and no encoding or text handling belongs here.
#pragma once

#include "Export.h"

#include <vector>

class LS_EXPORT CBlob {
 public:
  CBlob() = default;

  // Inserts length bytes at position (0 to GetSize(); GetSize() appends).
  // Returns the new size, which is never above INT_MAX, or a negative value
  // with the buffer unchanged when position lies past the end, data is null
  // with a non-zero length, or the buffer cannot grow that far.
  int Insert(unsigned int position, unsigned char const* data, unsigned int length);

  unsigned int GetSize() const { return static_cast<unsigned int>(m_bytes.size()); }
  // Valid until the next Insert; may be null while the buffer is empty.
  unsigned char const* GetData() const { return m_bytes.data(); }

 private:
  std::vector<unsigned char> m_bytes;
};
