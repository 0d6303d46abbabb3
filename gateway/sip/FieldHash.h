// FieldHash: FNV-1a, 64 bits on every platform, over a request's fields one
// at a time, each closed by a marker so that "ab" then "c" hashes unlike
// "a" then "bc". For what the gateway recognises a request by (the To tag
// it answers with, a REGISTER's fingerprint, a registration). Without a
// secret key an outsider can make collisions: key it where that matters.
#pragma once

#include <cstddef>
#include <cstdint>

class FieldHash {
 public:
  explicit FieldHash(uint64_t key = 0) : m_hash(kOffset ^ key) {}

  FieldHash& add(char const* bytes, size_t length) {
    for (size_t i = 0; i < length; ++i) {
      m_hash ^= static_cast<unsigned char>(bytes[i]);
      m_hash *= kPrime;
    }
    m_hash ^= 0x100;  // the field's end
    m_hash *= kPrime;
    return *this;
  }
  FieldHash& add(uint32_t number) { return add(reinterpret_cast<char const*>(&number), sizeof number); }

  uint64_t value() const { return m_hash; }

 private:
  static constexpr uint64_t kOffset = 14695981039346656037ull;
  static constexpr uint64_t kPrime = 1099511628211ull;

  uint64_t m_hash;
};
