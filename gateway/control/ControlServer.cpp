#include "control/ControlServer.h"

#include <fcntl.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "ControlAnswer.h"
#include "ModelWatcher.h"
#include "ScriptLine.h"
#include "ScriptRunner.h"

namespace {

// Bytes read per readiness event: a line larger than this arrives over
// several, with SIP requests served in between.
constexpr size_t kReadChunk = 16 * 1024;

bool unixAddress(std::string const& path, sockaddr_un& address, std::string& error) {
  address = sockaddr_un{};
  address.sun_family = AF_UNIX;
  if (path.empty() || path.size() >= sizeof address.sun_path) {
    error = "the control socket path must be 1 to " + std::to_string(sizeof address.sun_path - 1) + " bytes";
    return false;
  }
  std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
  return true;
}

}  // namespace

ControlServer::~ControlServer() {
  tmr_cancel(&m_reap);
  m_session.setWatchHost(nullptr);
  while (!m_clients.empty())
    drop(*m_clients.back());
  if (m_socket < 0)
    return;
  fd_close(m_socket);
  ::close(m_socket);
  ::unlink(m_path.c_str());
}

bool ControlServer::start(std::string const& path, std::string& error) {
  m_path = path;
  sockaddr_un address;
  if (!unixAddress(path, address, error) || !clearPath(error))
    return false;
  m_socket = ::socket(AF_UNIX, SOCK_STREAM | SOCK_NONBLOCK | SOCK_CLOEXEC, 0);
  if (m_socket < 0) {
    error = std::strerror(errno);
    return false;
  }
  mode_t const previous = ::umask(0177);
  int const bound = ::bind(m_socket, reinterpret_cast<sockaddr*>(&address), sizeof address);
  int const bindError = errno;
  ::umask(previous);
  if (bound != 0 || ::listen(m_socket, 8) != 0) {
    error = "cannot listen on " + path + ": " + std::strerror(bound != 0 ? bindError : errno);
    ::close(m_socket);
    m_socket = -1;
    return false;
  }
  int const result = fd_listen(m_socket, FD_READ, onListening, this);
  if (result != 0) {
    error = std::string("cannot watch the control socket: ") + std::strerror(result);
    return false;
  }
  m_session.setWatchHost(this);
  return true;
}

bool ControlServer::clearPath(std::string& error) {
  struct stat status;
  if (::lstat(m_path.c_str(), &status) != 0)
    return true;
  if (!S_ISSOCK(status.st_mode)) {
    error = m_path + " exists and is not a socket";
    return false;
  }
  sockaddr_un address;
  unixAddress(m_path, address, error);
  int const probe = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
  bool const live =
      probe >= 0 && ::connect(probe, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
  int const probeError = errno;
  if (probe >= 0)
    ::close(probe);
  if (live) {
    error = "a gateway already listens on " + m_path;
    return false;
  }
  if (probeError != ECONNREFUSED) {
    error = "cannot tell whether " + m_path + " is in use: " + std::strerror(probeError);
    return false;
  }
  if (::unlink(m_path.c_str()) != 0) {
    error = "cannot remove the stale socket " + m_path + ": " + std::strerror(errno);
    return false;
  }
  return true;
}

void ControlServer::onListening(int, void* server) {
  static_cast<ControlServer*>(server)->accept();
}

void ControlServer::accept() {
  int const socket = ::accept4(m_socket, nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC);
  if (socket < 0)
    return;
  if (m_clients.size() == kMaximumClients) {
    ::close(socket);
    return;
  }
  auto client = std::make_unique<Client>();
  client->owner = this;
  client->socket = socket;
  if (fd_listen(socket, FD_READ, onClient, client.get()) != 0) {
    ::close(socket);
    return;
  }
  m_clients.push_back(std::move(client));
}

void ControlServer::onClient(int flags, void* argument) {
  Client& client = *static_cast<Client*>(argument);
  ControlServer& server = *client.owner;
  if (client.closing)
    return;
  if ((flags & FD_WRITE) != 0 && !server.flush(client))
    return;
  if ((flags & (FD_READ | FD_EXCEPT)) != 0)
    server.read(client);
}

void ControlServer::read(Client& client) {
  char buffer[kReadChunk];
  ssize_t const received = ::recv(client.socket, buffer, sizeof buffer, 0);
  if (received < 0 && (errno == EAGAIN || errno == EINTR))
    return;
  if (received <= 0) {
    // Gone, or done writing: whatever part of a line is left never runs.
    drop(client);
    return;
  }
  int const socket = client.socket;
  char const* next = buffer;
  char const* const end = buffer + received;
  while (next != end) {
    char const* const feed = std::find(next, end, '\n');
    if (client.skipping) {
      client.skipping = feed == end;
      next = feed == end ? end : feed + 1;
      continue;
    }
    client.input.append(next, feed);
    if (client.input.size() > ScriptLine::kMaximumLength) {
      client.input.clear();
      client.skipping = feed == end;
      LineOutcome refused;
      refused.failure =
          CommandError(1, "the line is longer than " + std::to_string(ScriptLine::kMaximumLength) +
                              " bytes; none of it was applied");
      ++client.lines;
      if (!send(client, ControlAnswer::encode(refused, client.lines)))
        return;
      next = feed == end ? end : feed + 1;
      continue;
    }
    if (feed == end)
      break;
    next = feed + 1;
    std::string text;
    text.swap(client.input);
    runLine(client, text);
    // The line may have dropped its own client (a send that failed).
    bool const alive = std::any_of(m_clients.begin(), m_clients.end(),
                                   [&](std::unique_ptr<Client> const& c) { return c.get() == &client; });
    if (!alive || client.socket != socket || client.closing)
      return;
  }
}

void ControlServer::runLine(Client& client, std::string const& text) {
  ++client.lines;
  LineOutcome outcome;
  if (text.find('\0') != std::string::npos) {
    outcome.failure = CommandError(text.find('\0') + 1, "a line cannot hold a NUL byte");
  } else {
    // What the gateway printed between lines (debug lines of requests) is
    // not this line's.
    m_session.flushDebugLines();
    if (m_starting)
      m_starting();
    m_running = &client;
    outcome = runScriptLine(m_session, m_table, text);
    m_running = nullptr;
    if (m_finished)
      m_finished(!outcome.failure);
  }
  send(client, ControlAnswer::encode(outcome, client.lines));
}

bool ControlServer::send(Client& client, std::string const& bytes) {
  client.output += bytes;
  return flush(client);
}

bool ControlServer::flush(Client& client) {
  size_t sent = 0;
  while (sent < client.output.size()) {
    ssize_t const written =
        ::send(client.socket, client.output.data() + sent, client.output.size() - sent, MSG_NOSIGNAL);
    if (written > 0) {
      sent += static_cast<size_t>(written);
      continue;
    }
    if (written < 0 && errno == EINTR)
      continue;
    if (written < 0 && (errno == EAGAIN || errno == EWOULDBLOCK))
      break;
    drop(client);
    return false;
  }
  client.output.erase(0, sent);
  fd_listen(client.socket, FD_READ | (client.output.empty() ? 0 : FD_WRITE), onClient, &client);
  return true;
}

void ControlServer::drop(Client& client) {
  fd_close(client.socket);
  ::close(client.socket);
  bool const watched = client.watching;
  m_clients.erase(std::find_if(m_clients.begin(), m_clients.end(),
                               [&](std::unique_ptr<Client> const& c) { return c.get() == &client; }));
  if (watched)
    updateWatcher();
}

void ControlServer::onReap(void* argument) {
  ControlServer& server = *static_cast<ControlServer*>(argument);
  for (size_t i = server.m_clients.size(); i-- > 0;)
    if (server.m_clients[i]->closing)
      server.drop(*server.m_clients[i]);
}

void ControlServer::updateWatcher() {
  bool const wanted = std::any_of(m_clients.begin(), m_clients.end(), [](std::unique_ptr<Client> const& c) {
    return c->watching && !c->closing;
  });
  if (wanted)
    m_session.watcher().start();
  else
    m_session.watcher().stop();
}

void ControlServer::watch(bool on) {
  if (!m_running)
    return;
  m_running->watching = on;
  updateWatcher();
}

void ControlServer::event(std::string const& line) {
  for (std::unique_ptr<Client> const& client : m_clients) {
    if (!client->watching || client->closing)
      continue;
    if (client.get() == m_running) {
      m_session.output() << line;
      continue;
    }
    // Sending may fail, and dropping stops the watcher, which must not
    // happen inside the library's broadcast: a failed client is marked
    // and reaped once the broadcast is over.
    if (client->output.size() > kMaximumBacklog) {
      client->closing = true;
      tmr_start(&m_reap, 0, onReap, this);
      continue;
    }
    client->output += line;
    if (client->output.size() == line.size()) {
      ssize_t const written =
          ::send(client->socket, client->output.data(), client->output.size(), MSG_NOSIGNAL);
      if (written > 0)
        client->output.erase(0, static_cast<size_t>(written));
      else if (written < 0 && errno != EAGAIN && errno != EWOULDBLOCK && errno != EINTR) {
        client->closing = true;
        tmr_start(&m_reap, 0, onReap, this);
        continue;
      }
    }
    if (!client->output.empty())
      fd_listen(client->socket, FD_READ | FD_WRITE, onClient, client.get());
  }
}
