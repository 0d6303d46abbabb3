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
//   the queue keeps the changes meanwhile, bounded by kQueueLimit for every
//   kind of change: past it the oldest queued refresh is dropped first (its
//   binding's earlier row stays in the store), and only when no refresh is
//   queued the oldest addition or removal (a binding then missing from the
//   store, or a row left to run out). The counts dropped are logged when
//   the store is back, and counted. Refreshes queue apart from the other
//   changes, so that dropping one costs the loop O(1); the writer merges
//   both by sequence number, which keeps every binding's changes in order.
// - A batch the database refuses while it stays reachable (a row holding
//   what it cannot store) is written again row by row, each in its own
//   transaction: the rows it refuses are logged, counted and dropped, the
//   others written. Retrying the whole batch would refuse it forever and
//   stop every later change, and another gateway's with it.
// - The writer takes the whole queue at once (a swap under the mutex) and
//   builds its batch outside it, so the loop never waits while rows are
//   copied or written. The thread connects again after
//   1 s, doubling up to kMaxBackoffMs; once back it writes the queue, then
//   reads the whole store for the loop when others share it.
// - A change the loop queued after the thread read an identity is newer
//   than what was read: each change carries a sequence number, and the
//   loop applies an identity's update only when every change it queued
//   for that identity had been written before the read. An update set
//   aside so (and, after the store was away, each identity left untouched)
//   is read again once the loop's change is written: the read may hold
//   another gateway's change too, which nothing else would bring.
// - close() writes everything queued before it returns (SIGTERM); a store
//   still away then loses the queue, and the log says how many.
//
// Owned by the Gateway through BindingStore; the backend is owned here.
#pragma once

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <set>
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
  // Identities read again one query each at most; more, and the whole
  // store is read.
  static constexpr size_t kReadAgainOneByOne = 256;

  // name: what the messages call the store (no password in it); queueLimit:
  // the changes queued at most (a smaller one for tests).
  WriteBehindStore(std::unique_ptr<StoreBackend> backend, std::string name, size_t queueLimit = kQueueLimit);
  ~WriteBehindStore() override;

  // Connects the backend on the caller's thread; the error names the store.
  bool connect(std::string& error);

  bool load(std::vector<StoredBinding>& bindings, std::string& error) override;
  void start(UpdateHandler handler) override;
  void record(StoreChange::Kind kind, StoredBinding const& binding) override;
  void close() override;
  bool shared() const override { return m_shared; }
  uint64_t rowsRefused() const override { return m_rowsRefused; }
  uint64_t changesDropped() const override { return m_changesDropped; }

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
  // Writes the queue; false when the store went away, what was not written
  // then put back in front of what came meanwhile.
  bool flush();
  // Writes each change in a transaction of its own, dropping those the
  // database refuses; false when the store went away, the changes from
  // that one on put back.
  bool writeOneByOne(std::vector<Queued>& taken);
  // Puts taken[from...] back in front of the queue, then bounds it.
  void putBack(std::vector<Queued>& taken, size_t from);
  // Drops the oldest changes, refreshes first, while the queue is over its
  // bound; with the mutex held.
  void bound(size_t room);
  // Reads again the identities whose updates the loop set aside; false
  // when the store went away.
  bool readAgain();
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
  size_t const m_queueLimit;
  UpdateHandler m_handler;
  mqueue* m_toLoop = nullptr;
  std::thread m_writer;
  int m_wakeRead = -1;
  int m_wakeWrite = -1;

  std::mutex m_mutex;  // guards the members up to m_closing
  Queue m_queue;
  std::vector<Learnt> m_learnt;
  uint64_t m_written = 0;      // the sequence of the last change written or refused
  size_t m_dropped = 0;        // refreshes dropped since the store went away
  size_t m_droppedOthers = 0;  // additions and removals dropped so
  std::set<IdentityName> m_readAgain;
  bool m_closing = false;

  // Read by the loop for the statistics.
  std::atomic<uint64_t> m_rowsRefused{0};
  std::atomic<uint64_t> m_changesDropped{0};

  // Loop only: the sequence of the last change queued per identity.
  uint64_t m_sequence = 0;
  std::map<IdentityName, uint64_t> m_lastChange;
  bool m_closed = false;

  // Writer thread only.
  bool m_up = true;
  bool m_shared = false;
};
