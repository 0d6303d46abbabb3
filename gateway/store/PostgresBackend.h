// PostgresBackend: the binding store in a PostgreSQL database that several
// gateways share, through libpq. Each gateway writes its own changes and,
// in the same transaction, NOTIFYs the identities they touched on channel
// location_gateway; every other gateway LISTENs there and reads those
// identities back. The notification carries this connection's origin, a
// random number drawn per process, so that a gateway skips its own.
//
// Decisions, with their reasons:
// - LISTEN/NOTIFY needs nothing beside the server: no broker, no polling of
//   the table. A notification is lost while a gateway is disconnected; the
//   writer reads the whole table after every reconnection instead.
// - The schema is created under a transaction-scoped advisory lock, so that
//   two gateways starting on an empty database do not both create it.
// - Blocking libpq calls, on the writer thread only: the event loop never
//   waits on the server. A connection attempt gives up after 5 s unless the
//   URI says otherwise.
// - A batch is sent in pipeline mode, its answers read every 256
//   statements: a round trip per 256 rows rather than per row, which is
//   what a storm of REGISTERs needs from a server across a network.
// - A failed batch is the rows' fault (REFUSED) only when the server is
//   still there to roll it back and the SQLSTATE's class is a data
//   exception, an integrity constraint or a program limit; any other class
//   (a deadlock with another gateway's batch, a full disk, a shutdown) is
//   worth retrying whole, and so AWAY.
#pragma once

#include <string>
#include <vector>

#include "store/StoreBackend.h"

struct pg_conn;
struct pg_result;

class PostgresBackend : public StoreBackend {
 public:
  // uri: a postgresql:// connection URI; name: how messages call it.
  PostgresBackend(std::string uri, std::string name);
  ~PostgresBackend() override;
  PostgresBackend(PostgresBackend const&) = delete;
  PostgresBackend& operator=(PostgresBackend const&) = delete;

  bool connect(std::string& error) override;
  bool read(IdentityName const* identity, std::vector<StoredBinding>& bindings, std::string& error) override;
  bool deleteExpired(std::string& error) override;
  Written write(std::vector<StoreChange> const& changes, std::string& error) override;
  int notificationSocket() const override;
  bool takeNotifications(std::vector<IdentityName>& changed, std::string& error) override;

 private:
  // Creates the schema in a database without it; refuses a newer one.
  bool adopt(std::string& error);
  // Runs sql with text parameters; false with error unless the result has
  // the expected status. The result, when wanted, is the caller's to clear.
  bool run(std::string const& sql,
           std::vector<std::string> const& parameters,
           std::string& error,
           pg_result** result = nullptr);
  bool prepare(char const* name, std::string const& sql, std::string& error);
  // Synchronises the pipeline and reads the answers of the pending
  // statements; false when one failed.
  bool answered(size_t& pending, std::string& error);
  std::string failure(char const* what) const;
  void disconnect();

  std::string m_uri;
  std::string m_name;
  std::string m_origin;  // the prefix of this process's notifications
  pg_conn* m_connection = nullptr;
  // The SQLSTATE of the first statement of the last write that failed.
  std::string m_failedState;
};
