#include "store/SqliteBackend.h"

#include <sqlite3.h>
#include <sys/stat.h>

#include "sip/Libre.h"
#include "sip/MonotonicClock.h"
#include "store/StoreSchema.h"

namespace {

// Milliseconds since the epoch by SQLite's clock (julianday of 1970-01-01).
constexpr char kNow[] = "CAST((julianday('now') - 2440587.5) * 86400000 AS INTEGER)";

bool bindAll(sqlite3_stmt* statement, std::vector<std::string> const& parameters) {
  sqlite3_reset(statement);
  for (size_t i = 0; i < parameters.size(); ++i)
    if (sqlite3_bind_text(statement, static_cast<int>(i + 1), parameters[i].data(),
                          static_cast<int>(parameters[i].size()), SQLITE_TRANSIENT) != SQLITE_OK)
      return false;
  return true;
}

// Whether a statement failed for what its row holds, the file being fine:
// a constraint or trigger, a value too large or of the wrong kind. A full
// disk, I/O, a lock or damage is the store's, not the row's.
bool refusedForTheRow(int code) {
  switch (code & 0xff) {
    case SQLITE_CONSTRAINT:
    case SQLITE_TOOBIG:
    case SQLITE_MISMATCH:
    case SQLITE_RANGE:
      return true;
    default:
      return false;
  }
}

}  // namespace

SqliteBackend::~SqliteBackend() {
  close();
}

void SqliteBackend::close() {
  sqlite3_finalize(m_upsert);
  sqlite3_finalize(m_delete);
  sqlite3_finalize(m_deleteIfExpired);
  m_upsert = m_delete = m_deleteIfExpired = nullptr;
  // Closing the last connection checkpoints the log into the file and
  // removes it.
  sqlite3_close_v2(m_database);
  m_database = nullptr;
}

// Why the file cannot be read as a database at all: damaged (a store cut
// short or overwritten) or not a database.
std::string SqliteBackend::unreadable() const {
  if ((sqlite3_errcode(m_database) & 0xff) == SQLITE_CORRUPT)
    return "the store " + m_path + " is damaged: " + sqlite3_errmsg(m_database);
  return failure("is not a store of location-gateway");
}

std::string SqliteBackend::failure(char const* what) const {
  return "the store " + m_path + " " + what + ": " +
         (m_database ? sqlite3_errmsg(m_database) : "out of memory");
}

bool SqliteBackend::connect(std::string& error) {
  close();
  struct stat status;
  bool const exists = ::stat(m_path.c_str(), &status) == 0;
  if (exists && !S_ISREG(status.st_mode)) {
    error = "the store " + m_path + " is not a file";
    return false;
  }
  // An existing file is opened without CREATE, so that a path that vanishes
  // meanwhile is an error rather than a new store.
  int const flags = SQLITE_OPEN_READWRITE | (exists ? 0 : SQLITE_OPEN_CREATE);
  if (sqlite3_open_v2(m_path.c_str(), &m_database, flags, nullptr) != SQLITE_OK) {
    error = failure("cannot be opened");
    close();
    return false;
  }
  sqlite3_extended_result_codes(m_database, 1);
  if (!adopt(error)) {
    close();
    return false;
  }
  std::string const upsert = StoreSchema::withClock(StoreSchema::kUpsert, kNow);
  if (!execute("PRAGMA journal_mode=WAL", error) || !execute("PRAGMA synchronous=NORMAL", error) ||
      !(m_upsert = prepare(upsert, error)) || !(m_delete = prepare(StoreSchema::kDelete, error)) ||
      !(m_deleteIfExpired = prepare(StoreSchema::withClock(StoreSchema::kDeleteIfExpired, kNow), error))) {
    close();
    return false;
  }
  return true;
}

bool SqliteBackend::adopt(std::string& error) {
  sqlite3_stmt* tables = nullptr;
  if (sqlite3_prepare_v2(m_database, "SELECT name FROM sqlite_master WHERE type = 'table'", -1, &tables,
                         nullptr) != SQLITE_OK) {
    error = unreadable();
    return false;
  }
  bool any = false;
  bool ours = false;
  int step;
  while ((step = sqlite3_step(tables)) == SQLITE_ROW) {
    any = true;
    char const* name = reinterpret_cast<char const*>(sqlite3_column_text(tables, 0));
    ours = ours || (name && std::string(name) == StoreSchema::kMetaTable);
  }
  sqlite3_finalize(tables);
  if (step != SQLITE_DONE) {
    error = unreadable();
    return false;
  }
  if (!any) {
    std::string const version = std::to_string(StoreSchema::kVersion);
    sqlite3_stmt* insert = nullptr;
    bool const created = execute("BEGIN", error) && execute(StoreSchema::kCreateMeta, error) &&
                         execute(StoreSchema::kCreateBindings, error) &&
                         (insert = prepare(StoreSchema::kInsertVersion, error)) &&
                         bindAll(insert, {version}) && sqlite3_step(insert) == SQLITE_DONE;
    sqlite3_finalize(insert);
    if (!created) {
      if (error.empty())
        error = failure("cannot be created");
      return false;
    }
    return execute("COMMIT", error);
  }
  if (!ours) {
    error = "the store " + m_path + " is not a store of location-gateway (an SQLite database without its " +
            StoreSchema::kMetaTable + " table)";
    return false;
  }
  sqlite3_stmt* check = prepare("PRAGMA quick_check", error);
  if (!check)
    return false;
  step = sqlite3_step(check);
  std::string const verdict = step == SQLITE_ROW
                                  ? reinterpret_cast<char const*>(sqlite3_column_text(check, 0))
                                  : sqlite3_errmsg(m_database);
  sqlite3_finalize(check);
  if (verdict != "ok") {
    error = "the store " + m_path + " is damaged: " + verdict;
    return false;
  }
  sqlite3_stmt* select = prepare(StoreSchema::kSelectVersion, error);
  if (!select)
    return false;
  long long version = 0;
  if (sqlite3_step(select) == SQLITE_ROW)
    version = sqlite3_column_int64(select, 0);
  sqlite3_finalize(select);
  if (version > StoreSchema::kVersion) {
    error = "the store " + m_path + " was written by a newer location-gateway (store version " +
            std::to_string(version) + "; this one reads version " + std::to_string(StoreSchema::kVersion) +
            " and older)";
    return false;
  }
  if (version < 1) {
    error = "the store " + m_path + " is not a store of location-gateway (no schema version)";
    return false;
  }
  return true;
}

bool SqliteBackend::execute(std::string const& sql, std::string& error) {
  char* message = nullptr;
  if (sqlite3_exec(m_database, sql.c_str(), nullptr, nullptr, &message) == SQLITE_OK)
    return true;
  error = "the store " + m_path + ": " + (message ? message : "failed");
  sqlite3_free(message);
  return false;
}

sqlite3_stmt* SqliteBackend::prepare(std::string const& sql, std::string& error) {
  sqlite3_stmt* statement = nullptr;
  if (sqlite3_prepare_v2(m_database, sql.c_str(), static_cast<int>(sql.size()), &statement, nullptr) ==
      SQLITE_OK)
    return statement;
  error = failure("cannot be read");
  return nullptr;
}

bool SqliteBackend::read(IdentityName const* identity,
                         std::vector<StoredBinding>& bindings,
                         std::string& error) {
  sqlite3_stmt* select = prepare(
      StoreSchema::withClock(identity ? StoreSchema::kSelectIdentity : StoreSchema::kSelectLive, kNow),
      error);
  if (!select)
    return false;
  if (identity)
    bindAll(select, {identity->first, identity->second});
  uint64_t const now = MonotonicClock::nowMs();
  int step;
  while ((step = sqlite3_step(select)) == SQLITE_ROW) {
    char const* columns[10];
    for (int i = 0; i < 10; ++i)
      columns[i] = reinterpret_cast<char const*>(sqlite3_column_text(select, i));
    StoredBinding binding;
    if (StoreSchema::fromRow(columns, now, binding))
      bindings.push_back(std::move(binding));
  }
  sqlite3_finalize(select);
  if (step == SQLITE_DONE)
    return true;
  error = failure("cannot be read");
  return false;
}

bool SqliteBackend::deleteExpired(std::string& error) {
  return execute(StoreSchema::withClock(StoreSchema::kDeleteExpired, kNow), error);
}

StoreBackend::Written SqliteBackend::write(std::vector<StoreChange> const& changes, std::string& error) {
  if (!execute("BEGIN", error))
    return Written::AWAY;
  uint64_t const now = MonotonicClock::nowMs();
  for (StoreChange const& change : changes) {
    StoredBinding const& binding = change.binding;
    bool const removal = change.removal();
    sqlite3_stmt* const statement = !removal                                    ? m_upsert
                                    : change.kind == StoreChange::Kind::EXPIRED ? m_deleteIfExpired
                                                                                : m_delete;
    bool const bound = removal ? bindAll(statement, {binding.service, binding.identity, binding.uri})
                               : bindAll(statement, StoreSchema::upsertParameters(binding, now));
    if (!bound || sqlite3_step(statement) != SQLITE_DONE) {
      error = failure("cannot be written");
      // A failed step's code comes back from the reset; a failed bind's
      // stays on the connection.
      int const code = bound ? sqlite3_reset(statement) : sqlite3_errcode(m_database);
      sqlite3_reset(statement);
      bool const refused = refusedForTheRow(code);
      std::string ignored;
      execute("ROLLBACK", ignored);
      return refused ? Written::REFUSED : Written::AWAY;
    }
  }
  sqlite3_reset(m_upsert);
  sqlite3_reset(m_delete);
  sqlite3_reset(m_deleteIfExpired);
  return execute("COMMIT", error) ? Written::ALL : Written::AWAY;
}
