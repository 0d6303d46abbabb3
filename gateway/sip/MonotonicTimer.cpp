#include "sip/MonotonicTimer.h"

#include <sys/timerfd.h>
#include <unistd.h>

#include "sip/MonotonicClock.h"

MonotonicTimer::~MonotonicTimer() {
  cancel();
  if (m_fd < 0)
    return;
  fd_close(m_fd);
  close(m_fd);
}

bool MonotonicTimer::pollable() {
  if (m_fd >= 0)
    return true;
  if (m_noDescriptor)
    return false;
  m_noDescriptor = true;
  int const fd = timerfd_create(MonotonicClock::kClock, TFD_NONBLOCK | TFD_CLOEXEC);
  if (fd < 0)
    return false;
  if (fd_listen(fd, FD_READ, onReadable, this) != 0) {
    close(fd);
    return false;
  }
  m_fd = fd;
  return true;
}

void MonotonicTimer::start(uint64_t delayMs, Handler handler, void* argument) {
  cancel();
  m_handler = handler;
  m_argument = argument;
  if (!pollable())
    return tmr_start(&m_fallback, delayMs, onFallback, this);
  itimerspec due{};
  due.it_value.tv_sec = static_cast<time_t>(delayMs / 1000);
  // A zero time would disarm the timer rather than fire it at once.
  due.it_value.tv_nsec = delayMs == 0 ? 1 : static_cast<long>(delayMs % 1000) * 1000000;
  if (timerfd_settime(m_fd, 0, &due, nullptr) != 0)
    tmr_start(&m_fallback, delayMs, onFallback, this);
}

void MonotonicTimer::cancel() {
  m_handler = nullptr;
  tmr_cancel(&m_fallback);
  // Disarming also clears an expiry not read yet.
  itimerspec const disarmed{};
  if (m_fd >= 0)
    timerfd_settime(m_fd, 0, &disarmed, nullptr);
}

void MonotonicTimer::fire() {
  Handler const handler = m_handler;
  if (!handler)
    return;
  m_handler = nullptr;
  // Last: the handler may destroy the timer.
  handler(m_argument);
}

void MonotonicTimer::onReadable(int, void* argument) {
  MonotonicTimer& timer = *static_cast<MonotonicTimer*>(argument);
  uint64_t expirations = 0;
  // Nothing to read after a cancel that came first: then there is no handler either.
  [[maybe_unused]] ssize_t const got = read(timer.m_fd, &expirations, sizeof expirations);
  timer.fire();
}

void MonotonicTimer::onFallback(void* argument) {
  static_cast<MonotonicTimer*>(argument)->fire();
}
