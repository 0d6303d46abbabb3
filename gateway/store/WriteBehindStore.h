// WriteBehindStore: a BindingStore on a StoreBackend, written by a thread of
// its own. The loop appends each change to a queue under a mutex and goes
// on; the writer thread takes the queue in batches, one transaction each,
// at most kBatchWindowMs after the first change of a batch was queued, so
// that a storm of REGISTERs becomes a few hundred rows a transaction and a
// change reaches the store within 100 ms of its answer.
//
// Decisions, with their reasons:
// - The thread does SQL only. What it learns for the loop (another
//   gateway's changes, the whole store after it was away) it leaves in a
//   list under the mutex and wakes the loop through libre's mqueue; the
//   loop takes the list and alone calls the update handler, which calls
//   the library.
// - The store going away (a server stopped, a disk full) is logged once;
//   the queue keeps the changes meanwhile, bounded by kQueueLimit: past it
//   the oldest queued refresh is dropped (its binding's earlier row stays
//   in the store), never an addition or a removal, and the count dropped
//   is logged when the store is back. Refreshes queue apart from the other
//   changes, so that dropping one costs the loop O(1); the writer merges
//   both by sequence number, which keeps every binding's changes in order.
// - The writer takes the whole queue at once (a swap under the mutex) and
//   builds its batch outside it, so the loop never waits while rows are
//   copied or written. The thread connects again after
//   1 s, doubling up to kMaxBackoffMs; once back it writes the queue, then
//   reads the whole store for the loop when others share it.
// - A change the loop queued after the thread read an identity is newer
//   than what was read: each change carries a sequence number, and the
//   loop applies an identity's update only when every change it queued
//   for that identity had been written before the read.
// - close() writes everything queued before it returns (SIGTERM); a store
//   still away then loses the queue, and the log says how many.
//
// Owned by main through BindingStore; the backend is owned here.
#pragma once

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "sip/Libre.h"
#include "store/BindingStore.h"
#include "store/StoreBackend.h"

class WriteBehindStore : public BindingStore {
 public:
  static constexpr uint64_t kBatchWindowMs = 50;
  static constexpr size_t kQueueLimit = 100000;
  static constexpr uint64_t kFirstBackoffMs = 1000;
  static constexpr uint64_t kMaxBackoffMs = 5000;

  // name: what the messages call the store (no password in it).
  WriteBehindStore(std::unique_ptr<StoreBackend> backend, std::string name);
  ~WriteBehindStore() override;

  // Connects the backend on the caller's thread; the error names the store.
  bool connect(std::string& error);

  bool load(std::vector<StoredBinding>& bindings, std::string& error) override;
  void start(UpdateHandler handler) override;
  void record(StoreChange::Kind kind, StoredBinding const& binding) override;
  void close() override;

 private:
  struct Queued {
    uint64_t sequence;
    StoreChange change;
  };
  // The changes not yet written, each list in sequence order.
  struct Queue {
    std::deque<Queued> refreshes;
    std::deque<Queued> others;  // additions and removals

    size_t size() const { return refreshes.size() + others.size(); }
    bool empty() const { return refreshes.empty() && others.empty(); }
  };
  struct Learnt {
    Update update;
    uint64_t writtenBefore;  // every change up to this one was written first
  };

  void run();
  // Connects, logging the first failure of an outage; false while away.
  bool reconnect();
  // Writes the queue; false when the store went away, the queue then put
  // back in front of what came meanwhile.
  bool flush();
  // Drops the oldest refreshes while the queue is over its bound; with the
  // mutex held.
  void bound(size_t room);
  // Reads for the loop: one identity, or every one when identity is null.
  bool learn(IdentityName const* identity);
  // Waits for a change, a notification, close(), or timeoutMs (-1: none).
  // True when a change or close() woke it.
  bool wait(int timeoutMs, bool& notified);
  void wake();
  void lost(std::string const& error);
  static void onLearnt(int id, void* data, void* store);

  std::unique_ptr<StoreBackend> m_backend;
  std::string m_name;
  UpdateHandler m_handler;
  mqueue* m_toLoop = nullptr;
  std::thread m_writer;
  int m_wakeRead = -1;
  int m_wakeWrite = -1;

  std::mutex m_mutex;  // guards the members up to m_closing
  Queue m_queue;
  std::vector<Learnt> m_learnt;
  uint64_t m_written = 0;  // the sequence of the last change written
  size_t m_dropped = 0;    // refreshes dropped since the store went away
  bool m_closing = false;

  // Loop only: the sequence of the last change queued per identity.
  uint64_t m_sequence = 0;
  std::map<IdentityName, uint64_t> m_lastChange;
  bool m_closed = false;

  // Writer thread only.
  bool m_up = true;
  bool m_shared = false;
};
