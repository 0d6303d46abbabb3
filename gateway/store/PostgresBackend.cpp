#include "store/PostgresBackend.h"

#include <libpq-fe.h>

#include <set>

#include "sip/Libre.h"
#include "sip/MonotonicClock.h"
#include "store/StoreSchema.h"

namespace {

// Milliseconds since the epoch by the server's clock, read afresh each time
// (now() would stay at the transaction's start).
constexpr char kNow[] = "CAST(EXTRACT(EPOCH FROM clock_timestamp()) * 1000 AS BIGINT)";
constexpr char kChannel[] = "location_gateway";
// Any constant, the same in every gateway: the advisory lock around the
// creation of the schema.
constexpr char kSchemaLock[] = "SELECT pg_advisory_xact_lock(4242001)";
constexpr char kNotify[] = "SELECT pg_notify('location_gateway', $1)";
constexpr char kUpsertName[] = "upsert";
constexpr char kDeleteName[] = "delete";
constexpr char kDeleteIfExpiredName[] = "delete_if_expired";
// Separates the origin, the service and the identity in a notification;
// neither name can hold it.
constexpr char kSeparator = '\t';
// Statements sent before their answers are read, in one write.
constexpr size_t kPipelineDepth = 256;

// Whether a statement failed for what its row holds, the server being fine:
// a data exception (a byte sequence the database's encoding refuses, a value
// out of range), an integrity constraint, or a program limit (an index row
// or a notification too large). Connection, resource, operator and
// transaction-rollback classes (a deadlock between two gateways' batches)
// are the store's, and the batch is tried again as a whole.
bool refusedForTheRow(std::string const& state) {
  std::string const kind = state.substr(0, 2);
  return kind == "22" || kind == "23" || kind == "54";
}

}  // namespace

PostgresBackend::PostgresBackend(std::string uri, std::string name)
    : m_uri(std::move(uri)), m_name(std::move(name)) {
  char origin[24];
  re_snprintf(origin, sizeof origin, "%016llx", static_cast<unsigned long long>(rand_u64()));
  m_origin = origin;
}

PostgresBackend::~PostgresBackend() {
  disconnect();
}

void PostgresBackend::disconnect() {
  PQfinish(m_connection);
  m_connection = nullptr;
}

std::string PostgresBackend::failure(char const* what) const {
  // libpq's messages run over several indented lines: one line here.
  std::string message;
  for (char const* c = m_connection ? PQerrorMessage(m_connection) : "out of memory"; *c; ++c) {
    bool const space = *c == '\n' || *c == '\t' || *c == ' ';
    if (!space)
      message += *c;
    else if (!message.empty() && message.back() != ' ')
      message += ' ';
  }
  while (!message.empty() && message.back() == ' ')
    message.pop_back();
  return "the store " + m_name + " " + what + ": " + message;
}

bool PostgresBackend::connect(std::string& error) {
  disconnect();
  // Keywords in order, later ones winning: the URI may set its own timeout.
  char const* const keywords[] = {"connect_timeout", "dbname", nullptr};
  char const* const values[] = {"5", m_uri.c_str(), nullptr};
  m_connection = PQconnectdbParams(keywords, values, 1);
  if (PQstatus(m_connection) != CONNECTION_OK) {
    error = failure("cannot be reached");
    disconnect();
    return false;
  }
  // The server's notices (its shutdown among them) would go to standard
  // error line by line; the failures they explain are logged once instead.
  PQsetNoticeProcessor(
      m_connection, [](void*, char const*) {}, nullptr);
  std::string const listen = std::string("LISTEN ") + kChannel;
  if (!adopt(error) || !run(listen, {}, error) ||
      !prepare(kUpsertName, StoreSchema::withClock(StoreSchema::kUpsert, kNow), error) ||
      !prepare(kDeleteName, StoreSchema::kDelete, error) ||
      !prepare(kDeleteIfExpiredName, StoreSchema::withClock(StoreSchema::kDeleteIfExpired, kNow), error)) {
    disconnect();
    return false;
  }
  return true;
}

bool PostgresBackend::prepare(char const* name, std::string const& sql, std::string& error) {
  PGresult* const result = PQprepare(m_connection, name, sql.c_str(), 0, nullptr);
  bool const prepared = PQresultStatus(result) == PGRES_COMMAND_OK;
  if (!prepared)
    error = failure("cannot prepare its statements");
  PQclear(result);
  return prepared;
}

bool PostgresBackend::run(std::string const& sql,
                          std::vector<std::string> const& parameters,
                          std::string& error,
                          pg_result** kept) {
  std::vector<char const*> values;
  for (std::string const& parameter : parameters)
    values.push_back(parameter.c_str());
  PGresult* const result = PQexecParams(m_connection, sql.c_str(), static_cast<int>(values.size()), nullptr,
                                        values.data(), nullptr, nullptr, 0);
  ExecStatusType const status = PQresultStatus(result);
  if (status != PGRES_COMMAND_OK && status != PGRES_TUPLES_OK) {
    error = failure("failed");
    PQclear(result);
    return false;
  }
  if (kept)
    *kept = result;
  else
    PQclear(result);
  return true;
}

bool PostgresBackend::adopt(std::string& error) {
  std::string const table = std::string("SELECT to_regclass('") + StoreSchema::kMetaTable + "') IS NOT NULL";
  PGresult* exists = nullptr;
  if (!run("BEGIN", {}, error) || !run(kSchemaLock, {}, error) || !run(table, {}, error, &exists))
    return false;
  bool const ours = PQntuples(exists) == 1 && std::string(PQgetvalue(exists, 0, 0)) == "t";
  PQclear(exists);
  if (!ours) {
    bool const created = run(StoreSchema::kCreateMeta, {}, error) &&
                         run(StoreSchema::kCreateBindings, {}, error) &&
                         run(StoreSchema::kInsertVersion, {std::to_string(StoreSchema::kVersion)}, error);
    if (!created) {
      std::string ignored;
      run("ROLLBACK", {}, ignored);
      return false;
    }
    return run("COMMIT", {}, error);
  }
  PGresult* selected = nullptr;
  if (!run(StoreSchema::kSelectVersion, {}, error, &selected))
    return false;
  long const version = PQntuples(selected) == 1 ? std::strtol(PQgetvalue(selected, 0, 0), nullptr, 10) : 0;
  PQclear(selected);
  std::string ignored;
  run("COMMIT", {}, ignored);
  if (version > StoreSchema::kVersion) {
    error = "the store " + m_name + " was written by a newer location-gateway (store version " +
            std::to_string(version) + "; this one reads version " + std::to_string(StoreSchema::kVersion) +
            " and older)";
    return false;
  }
  if (version < 1) {
    error = "the store " + m_name + " is not a store of location-gateway (no schema version)";
    return false;
  }
  return true;
}

bool PostgresBackend::read(IdentityName const* identity,
                           std::vector<StoredBinding>& bindings,
                           std::string& error) {
  std::string const sql =
      StoreSchema::withClock(identity ? StoreSchema::kSelectIdentity : StoreSchema::kSelectLive, kNow);
  std::vector<std::string> parameters;
  if (identity)
    parameters = {identity->first, identity->second};
  PGresult* result = nullptr;
  if (!run(sql, parameters, error, &result))
    return false;
  uint64_t const now = MonotonicClock::nowMs();
  int const rows = PQntuples(result);
  for (int row = 0; row < rows; ++row) {
    char const* columns[10];
    for (int i = 0; i < 10; ++i)
      columns[i] = PQgetisnull(result, row, i) ? nullptr : PQgetvalue(result, row, i);
    StoredBinding binding;
    if (StoreSchema::fromRow(columns, now, binding))
      bindings.push_back(std::move(binding));
  }
  PQclear(result);
  return true;
}

bool PostgresBackend::deleteExpired(std::string& error) {
  return run(StoreSchema::withClock(StoreSchema::kDeleteExpired, kNow), {}, error);
}

StoreBackend::Written PostgresBackend::write(std::vector<StoreChange> const& changes, std::string& error) {
  if (!m_connection)
    return Written::AWAY;
  if (!PQenterPipelineMode(m_connection)) {
    error = failure("cannot be written");
    return Written::AWAY;
  }
  m_failedState.clear();
  uint64_t const now = MonotonicClock::nowMs();
  std::set<IdentityName> touched;
  size_t pending = 0;
  // Sends one statement; every kPipelineDepth, waits for the answers so
  // far, so that neither side's buffers fill while the other only writes.
  auto send = [&](char const* prepared, char const* sql, std::vector<std::string> const& parameters) -> bool {
    std::vector<char const*> values;
    for (std::string const& parameter : parameters)
      values.push_back(parameter.c_str());
    int const count = static_cast<int>(values.size());
    int const sent =
        prepared ? PQsendQueryPrepared(m_connection, prepared, count, values.data(), nullptr, nullptr, 0)
                 : PQsendQueryParams(m_connection, sql, count, nullptr, values.data(), nullptr, nullptr, 0);
    if (!sent) {
      error = failure("cannot be written");
      return false;
    }
    return ++pending < kPipelineDepth || answered(pending, error);
  };
  bool written = send(nullptr, "BEGIN", {});
  for (auto change = changes.begin(); written && change != changes.end(); ++change) {
    StoredBinding const& binding = change->binding;
    touched.emplace(binding.service, binding.identity);
    char const* const deletion =
        change->kind == StoreChange::Kind::EXPIRED ? kDeleteIfExpiredName : kDeleteName;
    written = change->removal() ? send(deletion, nullptr, {binding.service, binding.identity, binding.uri})
                                : send(kUpsertName, nullptr, StoreSchema::upsertParameters(binding, now));
  }
  for (auto identity = touched.begin(); written && identity != touched.end(); ++identity)
    written =
        send(nullptr, kNotify, {m_origin + kSeparator + identity->first + kSeparator + identity->second});
  written = written && send(nullptr, "COMMIT", {}) && answered(pending, error);
  PQexitPipelineMode(m_connection);
  if (written)
    return Written::ALL;
  // Refused only when the server is still there to roll back.
  std::string ignored;
  bool const rolledBack = run("ROLLBACK", {}, ignored);
  return rolledBack && refusedForTheRow(m_failedState) ? Written::REFUSED : Written::AWAY;
}

bool PostgresBackend::answered(size_t& pending, std::string& error) {
  if (pending == 0)
    return true;
  if (!PQpipelineSync(m_connection)) {
    error = failure("cannot be written");
    return false;
  }
  // Every statement's results (a statement after a failure reports being
  // aborted), then the synchronisation point itself.
  bool succeeded = true;
  for (; pending > 0; --pending) {
    while (PGresult* result = PQgetResult(m_connection)) {
      ExecStatusType const status = PQresultStatus(result);
      if (status != PGRES_COMMAND_OK && status != PGRES_TUPLES_OK && succeeded) {
        error = failure("cannot be written");
        char const* const state = PQresultErrorField(result, PG_DIAG_SQLSTATE);
        m_failedState = state ? state : "";
        succeeded = false;
      }
      PQclear(result);
    }
  }
  PGresult* const sync = PQgetResult(m_connection);
  bool const synchronised = PQresultStatus(sync) == PGRES_PIPELINE_SYNC;
  PQclear(sync);
  if (!synchronised && succeeded)
    error = failure("cannot be written");
  return succeeded && synchronised;
}

int PostgresBackend::notificationSocket() const {
  return m_connection ? PQsocket(m_connection) : -1;
}

bool PostgresBackend::takeNotifications(std::vector<IdentityName>& changed, std::string& error) {
  if (!m_connection || !PQconsumeInput(m_connection) || PQstatus(m_connection) != CONNECTION_OK) {
    error = failure("was lost");
    return false;
  }
  std::set<IdentityName> seen;
  while (PGnotify* notification = PQnotifies(m_connection)) {
    std::string const payload = notification->extra;
    PQfreemem(notification);
    size_t const first = payload.find(kSeparator);
    size_t const second = first == std::string::npos ? first : payload.find(kSeparator, first + 1);
    if (second == std::string::npos || payload.compare(0, first, m_origin) == 0)
      continue;
    IdentityName identity(payload.substr(first + 1, second - first - 1), payload.substr(second + 1));
    if (seen.insert(identity).second)
      changed.push_back(std::move(identity));
  }
  return true;
}
