// ControlConnection: the console as a client of a running gateway's control
// socket (location-console --connect). Each line goes to the gateway, which
// runs it on its own model and answers as ControlAnswer describes; the
// answer comes back as the line's outcome, so that the script runner prints
// and stops exactly as it does on a local session.
//
// Owned by main for the run; a lost connection throws, since no later line
// could be answered.
#pragma once

#include <ostream>
#include <stdexcept>
#include <string>

#include "ControlAnswer.h"
#include "ScriptRunner.h"

class ControlConnection {
 public:
  ControlConnection() = default;
  ~ControlConnection();
  ControlConnection(ControlConnection const&) = delete;
  ControlConnection& operator=(ControlConnection const&) = delete;

  // false with the reason in error.
  bool connect(std::string const& path, std::string& error);

  // Sends the line and waits for its answer; throws std::runtime_error when
  // the gateway is gone.
  LineOutcome run(std::string const& text);

  // Until standard input has something to read, shows the events that come
  // on out, each time followed by prompt.
  void showEventsUntilInput(std::ostream& out, char const* prompt);

 private:
  // Reads what is there, waiting for it; throws when the connection closed.
  void receive();

  int m_socket = -1;
  ControlAnswer::Reader m_reader;
};
