// ControlServer: the gateway's control socket (--control PATH), through which
// an operator changes and questions the model while the gateway serves. A
// client writes lines of the script language; each line runs through the
// command table on libre's thread, between two SIP requests, so the model
// stays serialised, and the client gets the answer ControlAnswer frames.
//
// Decisions, with their reasons:
// - The socket file is made with mode 0600 (the umask is narrowed around
//   bind, so there is no moment at which another user could connect): a
//   line can change passwords, so only the gateway's own user may write one.
// - A socket file left by a dead gateway (nobody accepts on it) is replaced;
//   one a live gateway accepts on is refused, as is any other kind of file:
//   the server never deletes what is not its own stale socket.
// - A line runs only once its line feed has come, so a client that vanishes
//   mid-line changes nothing. A line longer than the script language takes
//   is answered as failed without being kept: the rest of it up to its line
//   feed is skipped. A line holding a NUL byte is refused before it runs.
// - At most kMaximumClients at once; a further one is closed at once.
// - An answer is queued whole when the client does not read it at once; an
//   event is dropped together with its client when that client already has
//   kMaximumBacklog bytes unread, so that a watcher that stops reading
//   cannot grow the gateway's memory.
// - Watching is per client: the session's single watcher runs while any
//   client watches, and each event goes to every client watching (to the
//   client whose line caused it inside that line's answer).
//
// Owned by the Gateway, after the front-end it serves; everything runs on
// libre's thread. Dying closes every connection and removes the socket file.
#pragma once

#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "CommandTable.h"
#include "ScriptSession.h"
#include "sip/Libre.h"

class ControlServer : private ScriptSession::WatchHost {
 public:
  static constexpr size_t kMaximumClients = 16;
  static constexpr size_t kMaximumBacklog = 4 * 1024 * 1024;

  ControlServer(ScriptSession& session, CommandTable const& table) : m_session(session), m_table(table) {
    tmr_init(&m_reap);
  }
  ~ControlServer();
  ControlServer(ControlServer const&) = delete;
  ControlServer& operator=(ControlServer const&) = delete;

  // Called before each line runs and after it ran, with whether it was
  // applied: the parts that follow the model look at what it changed.
  void onLine(std::function<void()> starting, std::function<void(bool applied)> finished) {
    m_starting = std::move(starting);
    m_finished = std::move(finished);
  }

  // false with the reason in error.
  bool start(std::string const& path, std::string& error);

 private:
  struct Client {
    ControlServer* owner;
    int socket;
    std::string input;
    bool skipping = false;  // the rest of an overlong line, up to its line feed
    size_t lines = 0;
    bool watching = false;
    std::string output;    // unsent
    bool closing = false;  // dropped inside a broadcast; reaped after it
  };

  // Refuses a live socket, removes a stale one.
  bool clearPath(std::string& error);
  void accept();
  void read(Client& client);
  void runLine(Client& client, std::string const& text);
  // Sends or queues; false when the client was dropped.
  bool send(Client& client, std::string const& bytes);
  bool flush(Client& client);
  void drop(Client& client);
  // Drops the clients marked closing.
  static void onReap(void* server);
  // Runs the session's watcher while any client watches.
  void updateWatcher();

  void watch(bool on) override;
  void event(std::string const& line) override;

  static void onListening(int flags, void* server);
  static void onClient(int flags, void* client);

  ScriptSession& m_session;
  CommandTable const& m_table;
  std::function<void()> m_starting;
  std::function<void(bool)> m_finished;
  std::string m_path;
  int m_socket = -1;
  std::vector<std::unique_ptr<Client>> m_clients;
  Client* m_running = nullptr;  // whose line runs now
  tmr m_reap;
};
