#include "store/StoreSchema.h"

std::string StoreSchema::withClock(char const* text, char const* now) {
  static constexpr char kPlaceholder[] = "{now}";
  std::string result = text;
  for (size_t at = result.find(kPlaceholder); at != std::string::npos;
       at = result.find(kPlaceholder, at + std::char_traits<char>::length(now)))
    result.replace(at, sizeof kPlaceholder - 1, now);
  return result;
}

namespace {

bool readNumber(char const* text, uint64_t& value) {
  if (!text || !*text)
    return false;
  value = 0;
  for (; *text; ++text) {
    if (*text < '0' || *text > '9')
      return false;
    value = value * 10 + static_cast<uint64_t>(*text - '0');
  }
  return true;
}

}  // namespace

std::vector<std::string> StoreSchema::upsertParameters(StoredBinding const& binding, uint64_t nowMs) {
  uint64_t const remaining = binding.expiresAtMs > nowMs ? binding.expiresAtMs - nowMs : 0;
  return {binding.service,
          binding.identity,
          binding.uri,
          binding.contact,
          binding.callId,
          std::to_string(binding.cseq),
          binding.source,
          binding.transport,
          std::to_string(remaining),
          binding.dynamic ? "1" : "0"};
}

bool StoreSchema::fromRow(char const* const* columns, uint64_t nowMs, StoredBinding& binding) {
  uint64_t cseq = 0;
  uint64_t remaining = 0;
  uint64_t dynamic = 0;
  // The remaining time may read negative when the row expired between the
  // statement's clock readings: not a number here, and skipped.
  if (!readNumber(columns[5], cseq) || cseq > UINT32_MAX || !readNumber(columns[8], remaining) ||
      !readNumber(columns[9], dynamic))
    return false;
  for (int i : {0, 1, 2, 3, 4, 6, 7})
    if (!columns[i])
      return false;
  binding.service = columns[0];
  binding.identity = columns[1];
  binding.uri = columns[2];
  binding.contact = columns[3];
  binding.callId = columns[4];
  binding.cseq = static_cast<uint32_t>(cseq);
  binding.source = columns[6];
  binding.transport = columns[7];
  binding.expiresAtMs = nowMs + remaining;
  binding.dynamic = dynamic != 0;
  return true;
}
