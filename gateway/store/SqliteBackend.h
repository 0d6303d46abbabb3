// SqliteBackend: the binding store in one SQLite file, the gateway's
// default. The file is opened in WAL mode with synchronous=NORMAL: a
// process killed at any point leaves the file readable with every batch
// committed before it, and a batch costs one append to the log, not a sync
// of the database.
//
// What that costs on a power cut (or a crash of the system): the log is
// synced only when SQLite checkpoints it into the file, once it has grown
// past wal_autocheckpoint's 1,000 pages, and when the last connection
// closes at a clean exit. Every batch committed since the last checkpoint
// may be lost, during a storm seconds of changes, on a quiet gateway hours
// of them; the file comes back intact and consistent, as of that
// checkpoint. synchronous=FULL would sync every batch; the README says
// what a power cut may lose instead, since its cost to a storm of
// REGISTERs was not measured.
//
// A file that exists is only read until it has shown itself to be a store
// of ours, intact (quick_check) and not newer: a file of another kind, a
// truncated store or a newer one is refused with a message naming it, and
// is left as it was. A missing or empty file becomes a new store.
//
// A failed batch is the rows' fault (REFUSED) for a constraint, a value too
// large or of the wrong type; a full disk, I/O, a lock or damage is AWAY.
//
// Not shared: only this process writes the file, so it has no
// notifications. Single-threaded use, see StoreBackend.
#pragma once

#include <string>
#include <vector>

#include "store/StoreBackend.h"

struct sqlite3;
struct sqlite3_stmt;

class SqliteBackend : public StoreBackend {
 public:
  explicit SqliteBackend(std::string path) : m_path(std::move(path)) {}
  ~SqliteBackend() override;
  SqliteBackend(SqliteBackend const&) = delete;
  SqliteBackend& operator=(SqliteBackend const&) = delete;

  bool connect(std::string& error) override;
  bool read(IdentityName const* identity, std::vector<StoredBinding>& bindings, std::string& error) override;
  bool deleteExpired(std::string& error) override;
  Written write(std::vector<StoreChange> const& changes, std::string& error) override;

 private:
  // Whether the open file is ours, intact and readable by this version;
  // creates the schema when it holds no table at all.
  bool adopt(std::string& error);
  bool execute(std::string const& sql, std::string& error);
  sqlite3_stmt* prepare(std::string const& sql, std::string& error);
  std::string failure(char const* what) const;
  std::string unreadable() const;
  void close();

  std::string m_path;
  sqlite3* m_database = nullptr;
  // Prepared once, kept for every batch.
  sqlite3_stmt* m_upsert = nullptr;
  sqlite3_stmt* m_delete = nullptr;
  sqlite3_stmt* m_deleteIfExpired = nullptr;
};
