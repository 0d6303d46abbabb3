#include "control/Autosave.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <stdexcept>

#include "ModelSaver.h"
#include "sip/MonotonicClock.h"

namespace {

// Writes all of text to a fresh temporary file next to file, then renames
// it over file; the reason in error when it cannot.
bool replaceAtomically(std::string const& file, std::string const& text, std::string& error) {
  std::string temporary = file + ".XXXXXX";
  int const fd = ::mkstemp(&temporary[0]);
  if (fd < 0) {
    error = "cannot create a temporary file next to " + file + ": " + std::strerror(errno);
    return false;
  }
  size_t written = 0;
  while (written < text.size()) {
    ssize_t const result = ::write(fd, text.data() + written, text.size() - written);
    if (result < 0 && errno == EINTR)
      continue;
    if (result <= 0)
      break;
    written += static_cast<size_t>(result);
  }
  bool const complete = written == text.size() && ::fsync(fd) == 0;
  int const writeError = errno;
  ::close(fd);
  if (!complete || ::rename(temporary.c_str(), file.c_str()) != 0) {
    error = "cannot write " + file + ": " + std::strerror(complete ? errno : writeError);
    ::unlink(temporary.c_str());
    return false;
  }
  return true;
}

}  // namespace

Autosave::Autosave(ScriptSession& session, std::string file) : m_session(session), m_file(std::move(file)) {
  tmr_init(&m_timer);
}

Autosave::~Autosave() {
  tmr_cancel(&m_timer);
  if (m_pending)
    write();
}

void Autosave::changed() {
  m_pending = true;
  if (tmr_isrunning(&m_timer))
    return;
  uint64_t const now = MonotonicClock::nowMs();
  uint64_t const due = m_lastWriteMs == 0 ? now : m_lastWriteMs + kIntervalMs;
  tmr_start(&m_timer, due > now ? due - now : 0, onTimer, this);
}

void Autosave::onTimer(void* autosave) {
  static_cast<Autosave*>(autosave)->write();
}

void Autosave::write() {
  m_pending = false;
  m_lastWriteMs = MonotonicClock::nowMs();
  std::string script;
  try {
    script = ModelSaver(m_session).script();
  } catch (std::runtime_error const& error) {
    std::cerr << "location-gateway: not saved to " << m_file << ": " << error.what() << std::endl;
    return;
  }
  if (script == m_written)
    return;
  std::string error;
  if (!replaceAtomically(m_file, script, error)) {
    std::cerr << "location-gateway: " << error << std::endl;
    return;
  }
  m_written = std::move(script);
}
