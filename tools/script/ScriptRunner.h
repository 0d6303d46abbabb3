// ScriptRunner: feeds the lines of a script, a file, standard input or the
// embedded default, one at a time, to whatever runs a line: the command
// table on a local session, or a running gateway through its control socket
// (see ControlAnswer), so that both print the same and stop alike. A line
// that cannot be applied is reported on the error stream as
// "name:line:column: what was expected" and has changed nothing; the runner
// then stops, or goes on when asked to keep going. Interactive input gets a
// prompt and always goes on.
//
// Outside interactive use, a line that prints anything is shown first as
// "> line", so that a session's output reads as a transcript.
#pragma once

#include <functional>
#include <istream>
#include <ostream>
#include <string>

#include "CommandTable.h"
#include "LineOutcome.h"
#include "ScriptSession.h"

// Runs one line on a local session.
LineOutcome runScriptLine(ScriptSession& session, CommandTable const& table, std::string const& text);

class ScriptRunner {
 public:
  using RunLine = std::function<LineOutcome(std::string const& text)>;

  ScriptRunner(ScriptSession& session, CommandTable const& table, std::ostream& out, std::ostream& errors)
      : ScriptRunner(
            [&session, &table](std::string const& text) { return runScriptLine(session, table, text); },
            out,
            errors) {}
  ScriptRunner(RunLine runLine, std::ostream& out, std::ostream& errors)
      : m_runLine(std::move(runLine)), m_out(out), m_errors(errors) {}

  void keepGoing(bool keepGoing) { m_keepGoing = keepGoing; }
  // Called before each interactive line is read: a remote session shows
  // there the events that come while the user types.
  void beforePrompt(std::function<void()> wait) { m_beforePrompt = std::move(wait); }

  // Runs input's lines under name; false when the runner stopped at a
  // failed line.
  bool run(std::istream& input, std::string const& name, bool interactive);

  bool anyLineFailed() const { return m_anyLineFailed; }

 private:
  RunLine m_runLine;
  std::ostream& m_out;
  std::ostream& m_errors;
  std::function<void()> m_beforePrompt;
  bool m_keepGoing = false;
  bool m_anyLineFailed = false;
};
