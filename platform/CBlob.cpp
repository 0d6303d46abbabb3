#include "CBlob.h"

#include <climits>
#include <new>
#include <stdexcept>

int CBlob::Insert(unsigned int position, unsigned char const* data, unsigned int length) {
  unsigned int const size = GetSize();
  if (position > size)
    return -1;
  if (length == 0)
    return static_cast<int>(size);
  if (!data || length > static_cast<unsigned int>(INT_MAX) - size)
    return -1;
  try {
    m_bytes.insert(m_bytes.begin() + position, data, data + length);
  } catch (std::bad_alloc const&) {
    return -1;
  } catch (std::length_error const&) {
    return -1;
  }
  return static_cast<int>(m_bytes.size());
}
