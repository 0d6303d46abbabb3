#include "store/BindingStore.h"

#include "store/SqliteBackend.h"
#include "store/WriteBehindStore.h"

bool BindingStore::open(std::string const& where, std::unique_ptr<BindingStore>& store, std::string& error) {
  store.reset();
  if (where == "none")
    return true;
  if (where.empty()) {
    error = "the store needs a file, a postgresql:// URI or none";
    return false;
  }
  auto opened = std::make_unique<WriteBehindStore>(std::make_unique<SqliteBackend>(where), where);
  if (!opened->connect(error))
    return false;
  store = std::move(opened);
  return true;
}
