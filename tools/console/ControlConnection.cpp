#include "ControlConnection.h"

#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

ControlConnection::~ControlConnection() {
  if (m_socket >= 0)
    ::close(m_socket);
}

bool ControlConnection::connect(std::string const& path, std::string& error) {
  sockaddr_un address{};
  address.sun_family = AF_UNIX;
  if (path.size() >= sizeof address.sun_path) {
    error = "the socket path is longer than " + std::to_string(sizeof address.sun_path - 1) + " bytes";
    return false;
  }
  std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
  m_socket = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
  if (m_socket < 0 || ::connect(m_socket, reinterpret_cast<sockaddr*>(&address), sizeof address) != 0) {
    error = std::strerror(errno);
    return false;
  }
  return true;
}

LineOutcome ControlConnection::run(std::string const& text) {
  std::string const line = text + "\n";
  size_t sent = 0;
  while (sent < line.size()) {
    ssize_t const written = ::send(m_socket, line.data() + sent, line.size() - sent, MSG_NOSIGNAL);
    if (written < 0 && errno == EINTR)
      continue;
    if (written <= 0)
      throw std::runtime_error(std::string("the gateway closed the connection: ") + std::strerror(errno));
    sent += static_cast<size_t>(written);
  }
  LineOutcome outcome;
  while (!m_reader.next(outcome))
    receive();
  return outcome;
}

void ControlConnection::showEventsUntilInput(std::ostream& out, char const* prompt) {
  pollfd watched[2] = {{STDIN_FILENO, POLLIN, 0}, {m_socket, POLLIN, 0}};
  for (;;) {
    watched[0].revents = watched[1].revents = 0;
    if (::poll(watched, 2, -1) < 0 && errno != EINTR)
      return;
    if (watched[0].revents != 0)
      return;
    if (watched[1].revents == 0)
      continue;
    receive();
    std::string const events = m_reader.takeLines();
    if (!events.empty())
      out << "\n" << events << prompt << std::flush;
  }
}

void ControlConnection::receive() {
  char buffer[4096];
  for (;;) {
    ssize_t const received = ::recv(m_socket, buffer, sizeof buffer, 0);
    if (received > 0)
      return m_reader.feed(buffer, static_cast<size_t>(received));
    if (received < 0 && errno == EINTR)
      continue;
    throw std::runtime_error(received == 0
                                 ? std::string("the gateway closed the connection")
                                 : std::string("cannot read from the gateway: ") + std::strerror(errno));
  }
}
