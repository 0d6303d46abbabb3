#include "store/SqliteBackend.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sqlite3.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <iterator>
#include <memory>
#include <mutex>
#include <thread>

#include "sip/Libre.h"
#include "sip/MonotonicClock.h"
#include "store/BindingStore.h"
#include "store/StoreSchema.h"
#include "store/WriteBehindStore.h"

namespace {

std::string contents(std::string const& path) {
  std::ifstream file(path, std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>());
}

void writeFile(std::string const& path, std::string const& data) {
  std::ofstream(path, std::ios::binary) << data;
}

void runSql(std::string const& path, char const* sql) {
  sqlite3* database = nullptr;
  ASSERT_EQ(SQLITE_OK, sqlite3_open(path.c_str(), &database));
  // The store's writer may hold the file for a moment.
  sqlite3_busy_timeout(database, 5000);
  ASSERT_EQ(SQLITE_OK, sqlite3_exec(database, sql, nullptr, nullptr, nullptr)) << sqlite3_errmsg(database);
  sqlite3_close(database);
}

long long rowCount(std::string const& path) {
  sqlite3* database = nullptr;
  sqlite3_open_v2(path.c_str(), &database, SQLITE_OPEN_READONLY, nullptr);
  sqlite3_stmt* statement = nullptr;
  long long count = -1;
  if (sqlite3_prepare_v2(database, "SELECT count(*) FROM bindings", -1, &statement, nullptr) == SQLITE_OK &&
      sqlite3_step(statement) == SQLITE_ROW)
    count = sqlite3_column_int64(statement, 0);
  sqlite3_finalize(statement);
  sqlite3_close(database);
  return count;
}

// Polls until done() holds, for at most 20 s (a slow emulator included).
bool eventually(std::function<bool()> const& done) {
  for (int tries = 0; tries < 1000; ++tries) {
    if (done())
      return true;
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
  }
  return done();
}

// Runs libre's loop, where the store hands over what it learnt, until
// done() holds or 20 s have passed.
struct LoopPoll {
  std::function<bool()> const& done;
  uint64_t deadline;
  tmr timer;

  static void check(void* argument) {
    LoopPoll& poll = *static_cast<LoopPoll*>(argument);
    if (poll.done() || MonotonicClock::nowMs() >= poll.deadline)
      return re_cancel();
    tmr_start(&poll.timer, 10, check, argument);
  }
};

void runLoopUntil(std::function<bool()> const& done) {
  LoopPoll poll{done, MonotonicClock::nowMs() + 20000, {}};
  tmr_init(&poll.timer);
  tmr_start(&poll.timer, 0, LoopPoll::check, &poll);
  re_main(nullptr);
  tmr_cancel(&poll.timer);
}

StoredBinding binding(std::string const& identity, std::string const& uri, uint64_t lifetimeMs) {
  StoredBinding result;
  result.service = "example.com";
  result.identity = identity;
  result.uri = uri;
  result.contact = "<" + uri + ">;q=0.5;+sip.instance=\"<urn:uuid:1>\";reg-id=1";
  result.callId = "call-" + identity;
  result.cseq = 7;
  result.source = "192.0.2.1:5062";
  result.transport = "tcp";
  result.expiresAtMs = MonotonicClock::nowMs() + lifetimeMs;
  return result;
}

class SqliteStoreTest : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(0, libre_init());
    char pattern[] = "/tmp/store-test-XXXXXX";
    ASSERT_NE(nullptr, mkdtemp(pattern));
    m_directory = pattern;
    m_path = m_directory + "/bindings.sqlite";
  }
  void TearDown() override {
    libre_close();
    std::system(("rm -rf " + m_directory).c_str());
  }

  // Opening path must fail with a message naming it and containing reason,
  // leaving the file's bytes as they were.
  void expectRefused(std::string const& reason) {
    std::string const before = contents(m_path);
    std::unique_ptr<BindingStore> store;
    std::string error;
    EXPECT_FALSE(BindingStore::open(m_path, store, error));
    EXPECT_NE(std::string::npos, error.find(m_path)) << error;
    EXPECT_NE(std::string::npos, error.find(reason)) << error;
    EXPECT_EQ(before, contents(m_path));
  }

  std::string m_directory;
  std::string m_path;
};

TEST_F(SqliteStoreTest, BindingsComeBackWithTheirFieldsAndRemainingLifetime) {
  std::unique_ptr<BindingStore> store;
  std::string error;
  ASSERT_TRUE(BindingStore::open(m_path, store, error)) << error;
  store->start(nullptr);
  StoredBinding alice = binding("alice", "sip:alice@192.0.2.1:5062", 600000);
  alice.dynamic = true;
  store->record(StoreChange::Kind::ADDED, alice);
  store->record(StoreChange::Kind::ADDED, binding("bob", "sip:bob@192.0.2.2", 600000));
  store->record(StoreChange::Kind::ADDED, binding("carol", "sip:carol@192.0.2.3", 1));
  store->record(StoreChange::Kind::REMOVED, binding("bob", "sip:bob@192.0.2.2", 0));
  alice.callId = "call-refreshed";
  alice.expiresAtMs = MonotonicClock::nowMs() + 300000;
  store->record(StoreChange::Kind::REFRESHED, alice);
  store->close();
  store.reset();
  std::this_thread::sleep_for(std::chrono::milliseconds(20));

  ASSERT_TRUE(BindingStore::open(m_path, store, error)) << error;
  std::vector<StoredBinding> loaded;
  ASSERT_TRUE(store->load(loaded, error)) << error;
  ASSERT_EQ(1u, loaded.size());
  StoredBinding const& back = loaded[0];
  EXPECT_EQ("example.com", back.service);
  EXPECT_EQ("alice", back.identity);
  EXPECT_EQ(alice.uri, back.uri);
  EXPECT_EQ(alice.contact, back.contact);
  EXPECT_EQ("call-refreshed", back.callId);
  EXPECT_EQ(7u, back.cseq);
  EXPECT_EQ("192.0.2.1:5062", back.source);
  EXPECT_EQ("tcp", back.transport);
  EXPECT_TRUE(back.dynamic);
  uint64_t const remaining = back.expiresAtMs - MonotonicClock::nowMs();
  EXPECT_GT(remaining, 290000u);
  EXPECT_LE(remaining, 300000u);
  // The expired binding was deleted, not only skipped.
  store.reset();
  EXPECT_EQ(1, rowCount(m_path));
}

// A disk that takes its time over each batch, so that changes arrive while
// the writer is inside one.
class SlowDisk : public SqliteBackend {
 public:
  using SqliteBackend::SqliteBackend;
  Written write(std::vector<StoreChange> const& changes, std::string& error) override {
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    return SqliteBackend::write(changes, error);
  }
};

TEST_F(SqliteStoreTest, AChangeRecordedWhileABatchIsWrittenIsWrittenAtClose) {
  {
    WriteBehindStore store(std::make_unique<SlowDisk>(m_path), m_path);
    std::string error;
    ASSERT_TRUE(store.connect(error)) << error;
    store.start(nullptr);
    store.record(StoreChange::Kind::ADDED, binding("alice", "sip:alice@192.0.2.1", 600000));
    // Past the batch window: the writer is inside alice's batch.
    std::this_thread::sleep_for(std::chrono::milliseconds(150));
    store.record(StoreChange::Kind::ADDED, binding("bob", "sip:bob@192.0.2.2", 600000));
    store.close();
  }
  EXPECT_EQ(2, rowCount(m_path));
}

TEST_F(SqliteStoreTest, ARowTheDatabaseRefusesIsDroppedAndTheStoreGoesOnWriting) {
  std::unique_ptr<BindingStore> store;
  std::string error;
  ASSERT_TRUE(BindingStore::open(m_path, store, error)) << error;
  runSql(m_path,
         "CREATE TRIGGER refuse BEFORE INSERT ON bindings WHEN NEW.identity = 'mallory' "
         "BEGIN SELECT RAISE(ABORT, 'refused'); END");
  store->start(nullptr);
  store->record(StoreChange::Kind::ADDED, binding("alice", "sip:alice@192.0.2.1", 600000));
  store->record(StoreChange::Kind::ADDED, binding("mallory", "sip:mallory@192.0.2.6", 600000));
  store->record(StoreChange::Kind::ADDED, binding("bob", "sip:bob@192.0.2.2", 600000));
  EXPECT_TRUE(eventually([&] { return rowCount(m_path) == 2; }));
  // Later batches are written too.
  store->record(StoreChange::Kind::ADDED, binding("carol", "sip:carol@192.0.2.3", 600000));
  EXPECT_TRUE(eventually([&] { return rowCount(m_path) == 3; }));
  EXPECT_EQ(1u, store->rowsRefused());
}

// A file that can be made to go away: while unplugged, it can be neither
// opened nor written.
class Unplugged : public SqliteBackend {
 public:
  using SqliteBackend::SqliteBackend;
  bool connect(std::string& error) override {
    if (away) {
      error = "unplugged";
      return false;
    }
    return SqliteBackend::connect(error);
  }
  Written write(std::vector<StoreChange> const& changes, std::string& error) override {
    if (away) {
      ++refused;
      error = "unplugged";
      return Written::AWAY;
    }
    return SqliteBackend::write(changes, error);
  }
  std::atomic<bool> away{false};
  std::atomic<int> refused{0};
};

TEST_F(SqliteStoreTest, AdditionsAndRemovalsQueuedWhileTheStoreIsAwayAreBounded) {
  auto* const file = new Unplugged(m_path);
  {
    WriteBehindStore store(std::unique_ptr<StoreBackend>(file), m_path, 10);
    std::string error;
    ASSERT_TRUE(store.connect(error)) << error;
    store.start(nullptr);
    file->away = true;
    for (int i = 0; i < 12; ++i)
      store.record(StoreChange::Kind::ADDED, binding("user" + std::to_string(i), "sip:u@192.0.2.9", 600000));
    for (int i = 0; i < 4; ++i)
      store.record(StoreChange::Kind::REMOVED, binding("user" + std::to_string(i), "sip:u@192.0.2.9", 0));
    ASSERT_TRUE(eventually([&] { return file->refused > 0; }));
    file->away = false;
    ASSERT_TRUE(eventually([&] { return rowCount(m_path) > 0; }));
    store.close();
    EXPECT_EQ(6u, store.changesDropped());
  }
  // The newest ten changes: additions of user6 to user11, the removals of
  // users never added here.
  EXPECT_EQ(6, rowCount(m_path));
}

// SQLite as a store others share: the test plays the other gateway, writing
// its rows into the file and telling of them through a pipe.
class SharedFile : public SqliteBackend {
 public:
  explicit SharedFile(std::string path) : SqliteBackend(std::move(path)) {
    if (pipe2(m_pipe, O_CLOEXEC | O_NONBLOCK) != 0)
      m_pipe[0] = m_pipe[1] = -1;
  }
  ~SharedFile() override {
    ::close(m_pipe[0]);
    ::close(m_pipe[1]);
  }
  int notificationSocket() const override { return m_pipe[0]; }
  bool takeNotifications(std::vector<IdentityName>& changed, std::string&) override {
    char drained[16];
    while (::read(m_pipe[0], drained, sizeof drained) > 0) {
    }
    std::lock_guard<std::mutex> lock(m_mutex);
    changed.swap(m_changed);
    m_changed.clear();
    return true;
  }
  bool read(IdentityName const* identity, std::vector<StoredBinding>& bindings, std::string& error) override {
    bool const done = SqliteBackend::read(identity, bindings, error);
    ++reads;
    return done;
  }
  void notify(IdentityName const& identity) {
    {
      std::lock_guard<std::mutex> lock(m_mutex);
      m_changed.push_back(identity);
    }
    [[maybe_unused]] ssize_t const written = ::write(m_pipe[1], "n", 1);
  }
  std::atomic<int> reads{0};

 private:
  int m_pipe[2];
  std::mutex m_mutex;
  std::vector<IdentityName> m_changed;
};

TEST_F(SqliteStoreTest, APeersChangeReadWhileALocalOneWasQueuedIsReadAgain) {
  auto* const file = new SharedFile(m_path);
  WriteBehindStore store(std::unique_ptr<StoreBackend>(file), m_path);
  std::string error;
  ASSERT_TRUE(store.connect(error)) << error;
  size_t seen = 0;
  store.start([&](BindingStore::Update const& update) {
    if (!update.everything && update.identity.second == "alice")
      seen = update.bindings.size();
  });
  StoredBinding alice = binding("alice", "sip:alice@192.0.2.1", 600000);
  store.record(StoreChange::Kind::ADDED, alice);
  ASSERT_TRUE(eventually([&] { return rowCount(m_path) == 1; }));
  runSql(
      m_path,
      "INSERT INTO bindings VALUES ('example.com', 'alice', 'sip:alice@192.0.2.8', '<sip:alice@192.0.2.8>', "
      "'peer', 1, '192.0.2.8:5060', 'udp', CAST((julianday('now') - 2440587.5) * 86400000 AS INTEGER) + "
      "600000, 0)");
  int const before = file->reads;
  file->notify({"example.com", "alice"});
  ASSERT_TRUE(eventually([&] { return file->reads > before; }));
  // Queued after the read: the read is older than this gateway's state.
  alice.expiresAtMs = MonotonicClock::nowMs() + 300000;
  store.record(StoreChange::Kind::REFRESHED, alice);
  runLoopUntil([&] { return seen == 2; });
  EXPECT_EQ(2u, seen);
  store.close();
}

TEST_F(SqliteStoreTest, ChangesAreWrittenWhileTheGatewayRuns) {
  std::unique_ptr<BindingStore> store;
  std::string error;
  ASSERT_TRUE(BindingStore::open(m_path, store, error)) << error;
  store->start(nullptr);
  for (int i = 0; i < 1000; ++i)
    store->record(StoreChange::Kind::ADDED, binding("user" + std::to_string(i), "sip:u@192.0.2.9", 60000));
  // Bounded: a store that only writes at exit never gets there.
  long long count = 0;
  for (int tries = 0; tries < 100 && count != 1000; ++tries) {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    count = rowCount(m_path);
  }
  EXPECT_EQ(1000, count);
}

TEST_F(SqliteStoreTest, AFileOfAnotherKindIsRefusedUntouched) {
  writeFile(m_path, "phone book\nalice 200\n");
  expectRefused("not a store of location-gateway");
}

TEST_F(SqliteStoreTest, AnotherProgramsDatabaseIsRefusedUntouched) {
  runSql(m_path, "CREATE TABLE contacts (name TEXT)");
  expectRefused("not a store of location-gateway");
}

TEST_F(SqliteStoreTest, ATruncatedStoreIsRefusedUntouched) {
  {
    std::unique_ptr<BindingStore> store;
    std::string error;
    ASSERT_TRUE(BindingStore::open(m_path, store, error)) << error;
    store->start(nullptr);
    for (int i = 0; i < 500; ++i)
      store->record(StoreChange::Kind::ADDED, binding("user" + std::to_string(i), "sip:u@192.0.2.9", 60000));
    store->close();
  }
  std::string const whole = contents(m_path);
  ASSERT_GT(whole.size(), 8192u);
  writeFile(m_path, whole.substr(0, whole.size() / 2));
  expectRefused("damaged");
}

TEST_F(SqliteStoreTest, AStoreOfANewerVersionIsRefusedUntouched) {
  {
    std::unique_ptr<BindingStore> store;
    std::string error;
    ASSERT_TRUE(BindingStore::open(m_path, store, error)) << error;
  }
  std::string const update =
      "UPDATE location_gateway SET value = '" + std::to_string(StoreSchema::kVersion + 1) + "'";
  runSql(m_path, update.c_str());
  expectRefused("newer location-gateway");
}

}  // namespace
