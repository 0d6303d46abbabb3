// Feeds arbitrary bytes to a gateway's start as the rows of its store: the
// bytes become the bindings table of an SQLite store file, which the
// gateway opens as it would at start (BindingStore::open), reads
// (SqliteBackend::read and the row decoding) and restores into the
// registrar (BindingReplay) against the gateway tests' model
// (GatewayHarness::loadModel). Another program may have written the file:
// the table here has the store's columns and key but no types or NOT NULL,
// so a column may hold text, a blob, an integer, a real or NULL.
//
// The input is lines, one row each, at most kMaximumRows; each line is
// fields separated by tabs, in the order of the table's columns (service,
// identity, uri, contact, call_id, cseq, source, transport, expires,
// dynamic). A missing field is NULL, and so is "~"; "#N" is the integer
// N, "%N" the real N, "!TEXT" a blob of TEXT's bytes, anything else that
// text, bytes as given. expires is milliseconds since the epoch on
// SQLite's clock, which a VFS of the harness fixes at
// GatewayHarness::kStartMs: "#1764000060000" has a minute to live.
//
// Every input starts from a new file and a fresh model and registrar.
// Besides not crashing, leaking or tripping the sanitizers, destroying the
// registrar must bring the global count of registered contacts back to
// where it was.
#include <sqlite3.h>
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

#include "GatewayHarness.h"
#include "SipStatistics.h"
#include "registrar/BindingReplay.h"
#include "registrar/Registrar.h"
#include "sip/LibraryClock.h"
#include "store/BindingStore.h"
#include "store/StoreSchema.h"

namespace {

constexpr size_t kMaximumRows = 64;
constexpr int kColumns = 10;
// The Unix epoch in milliseconds since the Julian day epoch, SQLite's
// origin for the current time.
constexpr sqlite3_int64 kUnixEpochJulianMs = 210866760000000ll;

void check(bool condition, char const* what) {
  if (condition)
    return;
  std::fprintf(stderr, "store_rows_fuzzer: %s\n", what);
  std::abort();
}

int fixedTime(sqlite3_vfs*, sqlite3_int64* now) {
  *now = kUnixEpochJulianMs + static_cast<sqlite3_int64>(GatewayHarness::kStartMs);
  return SQLITE_OK;
}

int fixedDays(sqlite3_vfs* vfs, double* now) {
  sqlite3_int64 milliseconds = 0;
  fixedTime(vfs, &milliseconds);
  *now = static_cast<double>(milliseconds) / 86400000.0;
  return SQLITE_OK;
}

// The system's VFS with a clock that stands still, made the default for
// every connection of the process.
void fixSqliteClock() {
  static bool const done = [] {
    static sqlite3_vfs fixed = *sqlite3_vfs_find(nullptr);
    fixed.zName = "fixed-clock";
    fixed.xCurrentTimeInt64 = fixedTime;
    fixed.xCurrentTime = fixedDays;
    check(sqlite3_vfs_register(&fixed, 1) == SQLITE_OK, "the fixed clock cannot be registered");
    return true;
  }();
  (void)done;
}

std::string const& storePath() {
  static std::string const path = [] {
    // In memory where the system has a file system there: the gateway
    // syncs the store as it writes.
    char const* directory = std::getenv("TMPDIR");
    if (!directory || !*directory)
      directory = ::access("/dev/shm", W_OK) == 0 ? "/dev/shm" : "/tmp";
    return std::string(directory) + "/store_rows_fuzzer-" + std::to_string(::getpid()) + ".sqlite";
  }();
  return path;
}

void removeStore() {
  for (char const* suffix : {"", "-wal", "-shm", "-journal"})
    ::unlink((storePath() + suffix).c_str());
}

bool bindField(sqlite3_stmt* insert, int column, std::string const& field) {
  if (field == "~")
    return sqlite3_bind_null(insert, column) == SQLITE_OK;
  std::string const rest = field.empty() ? std::string() : field.substr(1);
  switch (field.empty() ? '\0' : field[0]) {
    case '#':
      return sqlite3_bind_int64(insert, column, std::strtoll(rest.c_str(), nullptr, 10)) == SQLITE_OK;
    case '%':
      return sqlite3_bind_double(insert, column, std::strtod(rest.c_str(), nullptr)) == SQLITE_OK;
    case '!':
      return sqlite3_bind_blob(insert, column, rest.data(), static_cast<int>(rest.size()),
                               SQLITE_TRANSIENT) == SQLITE_OK;
    default:
      return sqlite3_bind_text(insert, column, field.data(), static_cast<int>(field.size()),
                               SQLITE_TRANSIENT) == SQLITE_OK;
  }
}

std::vector<std::string> split(std::string const& text, char separator) {
  std::vector<std::string> parts;
  size_t start = 0;
  for (size_t end = text.find(separator); end != std::string::npos; end = text.find(separator, start)) {
    parts.push_back(text.substr(start, end - start));
    start = end + 1;
  }
  parts.push_back(text.substr(start));
  return parts;
}

// A store of the current version whose bindings are the input's rows.
void writeStore(std::string const& input) {
  removeStore();
  sqlite3* database = nullptr;
  check(sqlite3_open(storePath().c_str(), &database) == SQLITE_OK, "the store file cannot be made");
  std::string const meta = std::string(StoreSchema::kCreateMeta) +
                           "; INSERT INTO location_gateway VALUES ('schema', '" +
                           std::to_string(StoreSchema::kVersion) + "');" +
                           "CREATE TABLE bindings (service, identity, uri, contact, call_id, cseq, source, "
                           "transport, expires, dynamic, PRIMARY KEY (service, identity, uri))";
  // Written without syncing: the file only has to outlive this input.
  check(sqlite3_exec(database, ("PRAGMA synchronous=OFF; PRAGMA journal_mode=MEMORY; " + meta).c_str(),
                     nullptr, nullptr, nullptr) == SQLITE_OK,
        "the store cannot be made");
  sqlite3_stmt* insert = nullptr;
  check(sqlite3_prepare_v2(database, "INSERT OR REPLACE INTO bindings VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?)",
                           -1, &insert, nullptr) == SQLITE_OK,
        "the rows cannot be written");
  std::vector<std::string> const rows = split(input, '\n');
  for (size_t row = 0; row < rows.size() && row < kMaximumRows; ++row) {
    std::vector<std::string> const fields = split(rows[row], '\t');
    sqlite3_reset(insert);
    sqlite3_clear_bindings(insert);
    for (int column = 0; column < kColumns && static_cast<size_t>(column) < fields.size(); ++column)
      check(bindField(insert, column + 1, fields[column]), "a field cannot be bound");
    sqlite3_step(insert);
  }
  sqlite3_finalize(insert);
  sqlite3_close(database);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
  GatewayHarness::startInput();
  fixSqliteClock();
  writeStore(std::string(reinterpret_cast<char const*>(data), size));
  ScriptSession session;
  GatewayHarness::loadModel(session);
  LibraryClock clock(false);
  int const registeredBefore = s_sipStatistics.getInboundRegistrations();
  {
    // The store outlives the registrar that reports to it, as in the gateway.
    std::unique_ptr<BindingStore> store;
    std::string error;
    Registrar registrar(clock);
    check(BindingStore::open(storePath(), store, error) && store, "the store written is refused");
    BindingReplay replay(session, registrar, clock);
    check(replay.restore(*store, error), "the store written cannot be read");
    store->close();
    // For whoever writes seeds: what was restored.
    static bool const show = std::getenv("STORE_ROWS_FUZZER_SHOW") != nullptr;
    if (show)
      for (Registrar::BindingView const& binding : registrar.bindings(nullptr))
        std::fprintf(stderr, "%s <%s> %llu ms %s\n", ScriptSession::pathOf(binding.identity).c_str(),
                     binding.contact.c_str(), static_cast<unsigned long long>(binding.remainingMs),
                     binding.source.c_str());
  }
  check(s_sipStatistics.getInboundRegistrations() == registeredBefore,
        "registered contacts were left behind by the registrar");
  removeStore();
  return 0;
}
