#include "store/BindingStore.h"

#include "store/SqliteBackend.h"
#ifdef LS_GATEWAY_POSTGRESQL
#include "store/PostgresBackend.h"
#endif
#include "store/WriteBehindStore.h"

namespace {

bool isDatabaseUri(std::string const& where) {
  return where.rfind("postgresql://", 0) == 0 || where.rfind("postgres://", 0) == 0;
}

// The URI as messages show it: a password in its user part replaced.
std::string withoutPassword(std::string const& uri) {
  size_t const start = uri.find("://") + 3;
  size_t const at = uri.find('@', start);
  size_t const slash = uri.find('/', start);
  if (at == std::string::npos || (slash != std::string::npos && slash < at))
    return uri;
  size_t const colon = uri.find(':', start);
  if (colon == std::string::npos || colon > at)
    return uri;
  return uri.substr(0, colon + 1) + "***" + uri.substr(at);
}

}  // namespace

bool BindingStore::open(std::string const& where, std::unique_ptr<BindingStore>& store, std::string& error) {
  store.reset();
  if (where == "none")
    return true;
  if (where.empty()) {
    error = "the store needs a file, a postgresql:// URI or none";
    return false;
  }
  std::unique_ptr<WriteBehindStore> opened;
  if (isDatabaseUri(where)) {
    std::string const name = withoutPassword(where);
#ifdef LS_GATEWAY_POSTGRESQL
    opened = std::make_unique<WriteBehindStore>(std::make_unique<PostgresBackend>(where, name), name);
#else
    error = "the store " + name + " needs PostgreSQL, which this location-gateway was built without";
    return false;
#endif
  } else {
    opened = std::make_unique<WriteBehindStore>(std::make_unique<SqliteBackend>(where), where);
  }
  if (!opened->connect(error))
    return false;
  store = std::move(opened);
  return true;
}
