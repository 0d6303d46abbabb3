#include "sip/StopSignals.h"

#include <signal.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "sip/Libre.h"

namespace {

sigset_t stopSignals() {
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, SIGINT);
  sigaddset(&signals, SIGTERM);
  return signals;
}

}  // namespace

StopSignals::StopSignals() {
  sigset_t const signals = stopSignals();
  pthread_sigmask(SIG_BLOCK, &signals, nullptr);
}

StopSignals::~StopSignals() {
  close();
}

bool StopSignals::watch(std::string& error) {
  sigset_t const signals = stopSignals();
  m_descriptor = signalfd(-1, &signals, SFD_NONBLOCK | SFD_CLOEXEC);
  if (m_descriptor < 0) {
    error = std::string("cannot watch for SIGINT and SIGTERM: ") + std::strerror(errno);
    return false;
  }
  int const result = fd_listen(m_descriptor, FD_READ, onReadable, this);
  if (result != 0) {
    close();
    error = std::string("cannot watch for SIGINT and SIGTERM: ") + std::strerror(result);
    return false;
  }
  return true;
}

void StopSignals::onReadable(int, void* self) {
  StopSignals& watcher = *static_cast<StopSignals*>(self);
  signalfd_siginfo received;
  if (::read(watcher.m_descriptor, &received, sizeof received) != static_cast<ssize_t>(sizeof received))
    return;
  watcher.close();
  re_cancel();
}

void StopSignals::close() {
  if (m_descriptor < 0)
    return;
  fd_close(m_descriptor);
  ::close(m_descriptor);
  m_descriptor = -1;
}
