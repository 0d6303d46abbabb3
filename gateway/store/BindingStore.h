// BindingStore: where the registrar's bindings outlive the process. The
// registrar reports every binding added, refreshed or removed; at start it
// takes back the bindings not yet expired. What the store is (a file, a
// database server shared with other gateways, nothing) is its own business;
// the registrar never waits on it.
//
// Decisions, with their reasons:
// - Changes are written behind, in batches, by a thread of the store's own:
//   the event loop only appends a change to a queue, so a REGISTER storm
//   costs the loop no I/O. What the store learns from elsewhere (another
//   gateway on the same database) comes back to the loop as a whole
//   identity's bindings, handed over through libre's mqueue, and the loop
//   alone applies it to the library.
// - A binding that lives only as long as its connection (received over a
//   connection-oriented transport with an outbound flow) is not stored by
//   the registrar: the connection dies with the process.
//
// Owned by the Gateway; close() before the registrar is destroyed, so that the
// removals the registrar makes while shutting down never reach the store.
// Every member is called on the event loop's thread.
#pragma once

#include <functional>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "store/StoredBinding.h"

class BindingStore {
 public:
  // (service, identity)
  using IdentityName = std::pair<std::string, std::string>;
  // What another gateway sharing the store changed: the bindings one
  // identity has now (an empty list removes them all), or, after the store
  // was away, every identity's, replacing all the loop holds except for
  // the identities in untouched, which this gateway changed since and whose
  // state it holds newer than the store's.
  struct Update {
    bool everything = false;
    IdentityName identity;  // when not everything
    std::vector<StoredBinding> bindings;
    std::set<IdentityName> untouched;
  };
  using UpdateHandler = std::function<void(Update const& update)>;

  virtual ~BindingStore() = default;

  // Every binding not yet expired, for the registrar to restore before the
  // first request; the expired ones are deleted from the store.
  virtual bool load(std::vector<StoredBinding>& bindings, std::string& error) = 0;
  // Starts writing behind and, where others share the store, listening to
  // them; their changes reach update on the loop.
  virtual void start(UpdateHandler handler) = 0;
  virtual void record(StoreChange::Kind kind, StoredBinding const& binding) = 0;
  // Writes everything queued and stops; waits for it. Later records are
  // dropped.
  virtual void close() = 0;
  // Whether other gateways write the store too. Then what this one's
  // configuration lacks says nothing about theirs: it deletes no binding
  // for an identity it does not have (see BindingReplay).
  virtual bool shared() const { return false; }
  // Changes the database refused, and changes dropped from a full queue,
  // since the start; any thread.
  virtual uint64_t rowsRefused() const { return 0; }
  virtual uint64_t changesDropped() const { return 0; }

  // WHERE: a file path (SQLite), a postgresql:// or postgres:// URI, or
  // "none" (then store is null). False with a text naming WHERE when it
  // cannot be opened or is not a store of this program.
  static bool open(std::string const& where, std::unique_ptr<BindingStore>& store, std::string& error);
};
