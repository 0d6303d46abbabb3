#include "store/StorableText.h"

bool isStorableText(char const* data, size_t size) {
  auto const* byte = reinterpret_cast<unsigned char const*>(data);
  auto const* const end = byte + size;
  while (byte < end) {
    unsigned char const lead = *byte++;
    if (lead == 0)
      return false;
    if (lead < 0x80)
      continue;
    size_t trailing = 0;
    // The first continuation byte's range, narrowed where the lead alone
    // would allow an overlong form, a surrogate or a code point too high.
    unsigned char low = 0x80;
    unsigned char high = 0xbf;
    if (lead >= 0xc2 && lead <= 0xdf) {
      trailing = 1;
    } else if (lead >= 0xe0 && lead <= 0xef) {
      trailing = 2;
      low = lead == 0xe0 ? 0xa0 : 0x80;
      high = lead == 0xed ? 0x9f : 0xbf;
    } else if (lead >= 0xf0 && lead <= 0xf4) {
      trailing = 3;
      low = lead == 0xf0 ? 0x90 : 0x80;
      high = lead == 0xf4 ? 0x8f : 0xbf;
    } else {
      return false;
    }
    if (static_cast<size_t>(end - byte) < trailing || *byte < low || *byte > high)
      return false;
    for (++byte; --trailing > 0; ++byte)
      if (*byte < 0x80 || *byte > 0xbf)
        return false;
  }
  return true;
}
