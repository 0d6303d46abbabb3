#include "store/SqliteBackend.h"

#include <gtest/gtest.h>
#include <sqlite3.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <memory>
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
  bool write(std::vector<StoreChange> const& changes, std::string& error) override {
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
