// ControlAnswer: how the gateway's control socket answers a line, shared by
// the gateway, which writes answers, and the console, which reads them as a
// client. The client sends lines of the script language, each ended by a
// line feed; the answer to one line is what an interactive console prints
// for it (its output, then for a line that failed the error line
// "control:LINE:COLUMN: message", LINE counting the connection's lines from
// 1), then one terminating line: a NUL byte, then "ok" or "failed". A
// client that reads up to that line knows where the answer ends; a person
// at a socket tool sees "ok" or "failed".
//
// Decision: the terminator begins with NUL because no output can: the
// gateway refuses a line holding one before it runs, and replaces any NUL
// that reaches an answer otherwise (from a start script) by '?'. Every
// other byte may occur in output, an echoed word among them, so no
// printable marker would be unambiguous.
//
// Event lines of a watching client come between answers, unframed; one
// that happens while the client's own line runs is part of that answer, in
// the order the console would print it.
#pragma once

#include <cstddef>
#include <string>

#include "LineOutcome.h"

namespace ControlAnswer {

// The name the error line gives the connection.
constexpr char kName[] = "control";

std::string encode(LineOutcome const& outcome, size_t lineNumber);

// Reassembles answers from the bytes a client receives.
class Reader {
 public:
  void feed(char const* bytes, size_t size) { m_received.append(bytes, size); }
  // The next complete answer, its error line turned back into a failure;
  // false while none is complete.
  bool next(LineOutcome& outcome);
  // The complete lines received that belong to no answer yet: events, when
  // the client has no line outstanding.
  std::string takeLines();

 private:
  std::string m_received;
};

}  // namespace ControlAnswer
