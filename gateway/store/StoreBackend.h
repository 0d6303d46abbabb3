// StoreBackend: one connection to the database a binding store writes to,
// used by WriteBehindStore on its writer thread only (and on the loop's
// thread before that thread starts). It runs StoreSchema's statements; it
// knows nothing of queues, batches or the library.
//
// Every call blocks until the database has answered; a failure leaves a
// text in error, and the caller connects again before the next call, except
// after a write the database refused while it stayed reachable.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "store/StoredBinding.h"

class StoreBackend {
 public:
  // (service, identity): an identity whose bindings another gateway changed.
  using IdentityName = std::pair<std::string, std::string>;

  virtual ~StoreBackend() = default;

  // (Re)connects and checks that the store is ours and not newer, creating
  // the schema in an empty one.
  virtual bool connect(std::string& error) = 0;
  // The bindings not yet expired: one identity's, or every one when
  // identity is null.
  virtual bool read(IdentityName const* identity,
                    std::vector<StoredBinding>& bindings,
                    std::string& error) = 0;
  virtual bool deleteExpired(std::string& error) = 0;
  // What a write came to. REFUSED: the database is there and refused what
  // the rows hold (a byte it cannot store, a constraint, a size), so that
  // the same rows would be refused again however long the caller waits;
  // the connection stays usable. AWAY: anything else, the database or the
  // way to it gone, its disk full or locked: worth trying again later.
  enum class Written { ALL, REFUSED, AWAY };
  // The changes in one transaction; unless ALL, none is written.
  virtual Written write(std::vector<StoreChange> const& changes, std::string& error) = 0;

  // For a store others share: the descriptor that becomes readable when
  // they wrote, -1 otherwise.
  virtual int notificationSocket() const { return -1; }
  // The identities others changed since the last call.
  virtual bool takeNotifications(std::vector<IdentityName>& /*changed*/, std::string& /*error*/) {
    return true;
  }
};
