// The stack's random numbers, drawn from a pool that OpenSSL's generator
// fills a page at a time.
//
// libre draws a random 64-bit tag for every message it parses, whether the
// answer uses it or not, through rand_u32 and rand_u64, each a RAND_bytes
// call of four bytes; and OpenSSL's generator asks the kernel for the
// process ID on every call, to notice a fork. Under a registration storm
// those system calls were a fifth of the gateway's CPU. These definitions
// take the place of libre's own (the stack calls them through its
// procedure linkage table, so the executable's definitions are the ones it
// reaches) and hand out the same generator's output, a page of it per call
// to OpenSSL. The gateway never forks, so no two processes share a page.
// Everything that calls them runs on the event loop.
#include <openssl/rand.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace {

constexpr size_t kPoolBytes = 4096;

uint8_t g_pool[kPoolBytes];
size_t g_used = kPoolBytes;

void draw(void* value, size_t length) {
  if (kPoolBytes - g_used < length) {
    // Without randomness the stack's tags and branches would repeat.
    if (RAND_bytes(g_pool, sizeof g_pool) != 1)
      std::abort();
    g_used = 0;
  }
  std::memcpy(value, g_pool + g_used, length);
  // Handed out once only.
  std::memset(g_pool + g_used, 0, length);
  g_used += length;
}

}  // namespace

extern "C" __attribute__((visibility("default"))) uint32_t rand_u32(void) {
  uint32_t value;
  draw(&value, sizeof value);
  return value;
}

extern "C" __attribute__((visibility("default"))) uint64_t rand_u64(void) {
  uint64_t value;
  draw(&value, sizeof value);
  return value;
}
