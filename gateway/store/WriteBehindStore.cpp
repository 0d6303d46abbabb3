#include "store/WriteBehindStore.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "sip/MonotonicClock.h"

namespace {

void say(std::string const& line) {
  // One write a line: the thread and the loop both log.
  std::string const text = "location-gateway: " + line + "\n";
  std::fwrite(text.data(), 1, text.size(), stderr);
  std::fflush(stderr);
}

}  // namespace

WriteBehindStore::WriteBehindStore(std::unique_ptr<StoreBackend> backend, std::string name, size_t queueLimit)
    : m_backend(std::move(backend)), m_name(std::move(name)), m_queueLimit(queueLimit) {
  int ends[2];
  if (pipe2(ends, O_CLOEXEC | O_NONBLOCK) == 0) {
    m_wakeRead = ends[0];
    m_wakeWrite = ends[1];
  }
}

WriteBehindStore::~WriteBehindStore() {
  close();
  if (m_wakeRead >= 0) {
    ::close(m_wakeRead);
    ::close(m_wakeWrite);
  }
}

bool WriteBehindStore::connect(std::string& error) {
  if (m_wakeRead < 0) {
    error = "the store " + m_name + " cannot start its writer: no pipe";
    return false;
  }
  if (!m_backend->connect(error))
    return false;
  m_shared = m_backend->notificationSocket() >= 0;
  return true;
}

bool WriteBehindStore::load(std::vector<StoredBinding>& bindings, std::string& error) {
  return m_backend->deleteExpired(error) && m_backend->read(nullptr, bindings, error);
}

void WriteBehindStore::start(UpdateHandler handler) {
  m_handler = std::move(handler);
  if (mqueue_alloc(&m_toLoop, onLearnt, this) != 0)
    m_toLoop = nullptr;
  m_writer = std::thread([this] { run(); });
}

void WriteBehindStore::record(StoreChange::Kind kind, StoredBinding const& binding) {
  if (m_closed)
    return;
  uint64_t const sequence = ++m_sequence;
  if (m_shared)
    m_lastChange[IdentityName(binding.service, binding.identity)] = sequence;
  bool first = false;
  {
    std::lock_guard<std::mutex> lock(m_mutex);
    first = m_queue.empty();
    // A refresh is worth less than any other change: in a queue full of
    // those, the newcomer goes.
    if (m_queue.size() >= m_queueLimit && m_queue.refreshes.empty() && kind == StoreChange::Kind::REFRESHED) {
      ++m_dropped;
      ++m_changesDropped;
      return;
    }
    bound(1);
    auto& list = kind == StoreChange::Kind::REFRESHED ? m_queue.refreshes : m_queue.others;
    list.push_back(Queued{sequence, StoreChange{kind, binding}});
  }
  if (first)
    wake();
}

void WriteBehindStore::close() {
  if (m_closed)
    return;
  m_closed = true;
  if (m_writer.joinable()) {
    {
      std::lock_guard<std::mutex> lock(m_mutex);
      m_closing = true;
    }
    wake();
    m_writer.join();
  }
  m_toLoop = static_cast<mqueue*>(mem_deref(m_toLoop));
  m_learnt.clear();
}

void WriteBehindStore::wake() {
  char const byte = 0;
  // A full pipe already holds a wake-up.
  [[maybe_unused]] ssize_t const written = ::write(m_wakeWrite, &byte, 1);
}

void WriteBehindStore::run() {
  uint64_t backoff = kFirstBackoffMs;
  bool catchUp = false;
  for (;;) {
    if (!m_up) {
      if (!reconnect()) {
        bool notified = false;
        // Woken early by changes too: those only wait for the next try.
        uint64_t const until = MonotonicClock::nowMs() + backoff;
        for (uint64_t now = MonotonicClock::nowMs(); now < until; now = MonotonicClock::nowMs()) {
          wait(static_cast<int>(until - now), notified);
          std::lock_guard<std::mutex> lock(m_mutex);
          if (m_closing)
            break;
        }
        backoff = std::min(backoff * 2, kMaxBackoffMs);
        std::lock_guard<std::mutex> lock(m_mutex);
        if (!m_closing)
          continue;
        if (!m_queue.empty() || m_dropped || m_droppedOthers)
          say("the store " + m_name + " is away: " +
              std::to_string(m_queue.size() + m_dropped + m_droppedOthers) + " changes not written at exit");
        return;
      }
      backoff = kFirstBackoffMs;
      catchUp = m_shared;
    }
    if (!flush())
      continue;
    if (catchUp) {
      if (!learn(nullptr))
        continue;
      catchUp = false;
    }
    if (!readAgain())
      continue;
    {
      // Changes recorded after flush() took the queue and before close()
      // said so are written before the thread ends.
      std::lock_guard<std::mutex> lock(m_mutex);
      if (m_closing && m_queue.empty())
        return;
      if (m_closing)
        continue;
    }
    bool notified = false;
    if (wait(-1, notified))
      // The batch's window: later changes join the first one's write.
      wait(static_cast<int>(kBatchWindowMs), notified);
    if (!notified)
      continue;
    std::vector<StoreBackend::IdentityName> changed;
    std::string error;
    if (!m_backend->takeNotifications(changed, error)) {
      lost(error);
      continue;
    }
    // Our own writes first, so that what is read includes them.
    if (!flush())
      continue;
    for (StoreBackend::IdentityName const& identity : changed)
      if (!learn(&identity))
        break;
  }
}

bool WriteBehindStore::reconnect() {
  std::string error;
  if (!m_backend->connect(error))
    return false;
  m_up = true;
  size_t dropped = 0;
  size_t droppedOthers = 0;
  size_t queued = 0;
  {
    std::lock_guard<std::mutex> lock(m_mutex);
    dropped = m_dropped;
    droppedOthers = m_droppedOthers;
    queued = m_queue.size();
    m_dropped = 0;
    m_droppedOthers = 0;
  }
  say("the store " + m_name + " is back; writing " + std::to_string(queued) + " queued changes" +
      (dropped ? "; " + std::to_string(dropped) + " refreshes were dropped while it was away" : "") +
      (droppedOthers ? "; " + std::to_string(droppedOthers) +
                           " additions and removals were dropped while it was away, the queue being full"
                     : ""));
  return true;
}

void WriteBehindStore::lost(std::string const& error) {
  if (m_up)
    say(error + "; answering from memory and queueing changes until it is back");
  m_up = false;
}

void WriteBehindStore::bound(size_t room) {
  while (m_queue.size() + room > m_queueLimit && !m_queue.empty()) {
    if (!m_queue.refreshes.empty()) {
      m_queue.refreshes.pop_front();
      ++m_dropped;
    } else {
      m_queue.others.pop_front();
      ++m_droppedOthers;
    }
    ++m_changesDropped;
  }
}

bool WriteBehindStore::flush() {
  Queue taken;
  {
    std::lock_guard<std::mutex> lock(m_mutex);
    std::swap(taken, m_queue);
  }
  if (taken.empty())
    return true;
  std::vector<Queued> merged;
  merged.reserve(taken.size());
  auto refresh = taken.refreshes.begin();
  auto other = taken.others.begin();
  while (refresh != taken.refreshes.end() || other != taken.others.end()) {
    bool const refreshFirst = other == taken.others.end() ||
                              (refresh != taken.refreshes.end() && refresh->sequence < other->sequence);
    merged.push_back(std::move(refreshFirst ? *refresh++ : *other++));
  }
  taken = Queue();
  std::vector<StoreChange> batch;
  batch.reserve(merged.size());
  for (Queued const& queued : merged)
    batch.push_back(queued.change);
  std::string error;
  switch (m_backend->write(batch, error)) {
    case StoreBackend::Written::ALL: {
      std::lock_guard<std::mutex> lock(m_mutex);
      m_written = merged.back().sequence;
      return true;
    }
    case StoreBackend::Written::REFUSED:
      batch.clear();
      return writeOneByOne(merged);
    case StoreBackend::Written::AWAY:
      break;
  }
  putBack(merged, 0);
  lost(error);
  return false;
}

bool WriteBehindStore::writeOneByOne(std::vector<Queued>& taken) {
  std::vector<StoreChange> one(1);
  for (size_t i = 0; i < taken.size(); ++i) {
    StoreChange const& change = taken[i].change;
    one[0] = change;
    std::string error;
    StoreBackend::Written const written = m_backend->write(one, error);
    if (written == StoreBackend::Written::AWAY) {
      putBack(taken, i);
      lost(error);
      return false;
    }
    if (written == StoreBackend::Written::REFUSED) {
      ++m_rowsRefused;
      say(error + "; the change to " + change.binding.service + "/" + change.binding.identity + " <" +
          change.binding.uri + "> is dropped");
    }
    std::lock_guard<std::mutex> lock(m_mutex);
    m_written = taken[i].sequence;
  }
  return true;
}

void WriteBehindStore::putBack(std::vector<Queued>& taken, size_t from) {
  Queue back;
  for (size_t i = from; i < taken.size(); ++i) {
    auto& list = taken[i].change.kind == StoreChange::Kind::REFRESHED ? back.refreshes : back.others;
    list.push_back(std::move(taken[i]));
  }
  std::lock_guard<std::mutex> lock(m_mutex);
  // What came meanwhile goes behind what was taken: only that much is
  // moved under the mutex.
  for (Queued& queued : m_queue.refreshes)
    back.refreshes.push_back(std::move(queued));
  for (Queued& queued : m_queue.others)
    back.others.push_back(std::move(queued));
  std::swap(back, m_queue);
  bound(0);
}

bool WriteBehindStore::readAgain() {
  std::set<IdentityName> names;
  {
    std::lock_guard<std::mutex> lock(m_mutex);
    names.swap(m_readAgain);
  }
  // After the store was away, every identity changed meanwhile may be
  // here: one read of the whole table then, not a query each.
  if (names.size() > kReadAgainOneByOne)
    return learn(nullptr);
  for (auto name = names.begin(); name != names.end(); ++name) {
    if (learn(&*name))
      continue;
    std::lock_guard<std::mutex> lock(m_mutex);
    m_readAgain.insert(name, names.end());
    return false;
  }
  return true;
}

bool WriteBehindStore::learn(IdentityName const* identity) {
  uint64_t written = 0;
  {
    std::lock_guard<std::mutex> lock(m_mutex);
    written = m_written;
  }
  Learnt learnt{Update(), written};
  learnt.update.everything = identity == nullptr;
  if (identity)
    learnt.update.identity = *identity;
  std::string error;
  if (!m_backend->read(identity, learnt.update.bindings, error)) {
    lost(error);
    return false;
  }
  {
    std::lock_guard<std::mutex> lock(m_mutex);
    m_learnt.push_back(std::move(learnt));
  }
  if (m_toLoop)
    mqueue_push(m_toLoop, 0, nullptr);
  return true;
}

bool WriteBehindStore::wait(int timeoutMs, bool& notified) {
  pollfd watched[2] = {{m_wakeRead, POLLIN, 0}, {m_backend->notificationSocket(), POLLIN, 0}};
  nfds_t const count = watched[1].fd >= 0 ? 2 : 1;
  if (poll(watched, count, timeoutMs) <= 0)
    return false;
  notified = notified || (count == 2 && (watched[1].revents & (POLLIN | POLLHUP | POLLERR)));
  if (!(watched[0].revents & POLLIN))
    return false;
  char drained[64];
  while (::read(m_wakeRead, drained, sizeof drained) > 0) {
  }
  return true;
}

void WriteBehindStore::onLearnt(int, void*, void* argument) {
  WriteBehindStore& store = *static_cast<WriteBehindStore*>(argument);
  std::vector<Learnt> learnt;
  {
    std::lock_guard<std::mutex> lock(store.m_mutex);
    learnt.swap(store.m_learnt);
  }
  // Identities whose read was older than this gateway's state: read again
  // once that is written.
  std::set<IdentityName> again;
  for (Learnt& entry : learnt) {
    Update& update = entry.update;
    for (auto last = store.m_lastChange.begin(); last != store.m_lastChange.end();) {
      if (last->second <= entry.writtenBefore) {
        last = store.m_lastChange.erase(last);
        continue;
      }
      if (update.everything) {
        update.untouched.insert(last->first);
        again.insert(last->first);
      }
      ++last;
    }
    if (!update.everything && store.m_lastChange.count(update.identity)) {
      again.insert(update.identity);
      continue;
    }
    if (store.m_handler)
      store.m_handler(update);
  }
  if (again.empty())
    return;
  {
    std::lock_guard<std::mutex> lock(store.m_mutex);
    store.m_readAgain.insert(again.begin(), again.end());
  }
  store.wake();
}
