// ScriptRunner: feeds the lines of a script, a file, standard input or the
// embedded default, to the command table, one at a time, and shows what each
// printed. A line that cannot be applied is reported on the error stream as
// "name:line:column: what was expected" and has changed nothing; the runner
// then stops, or goes on when asked to keep going. Interactive input gets a
// prompt and always goes on.
//
// Outside interactive use, a line that prints anything is shown first as
// "> line", so that a session's output reads as a transcript.
#pragma once

#include <istream>
#include <ostream>
#include <string>

#include "CommandTable.h"
#include "ScriptSession.h"

class ScriptRunner {
 public:
  ScriptRunner(ScriptSession& session, CommandTable const& table, std::ostream& out, std::ostream& errors)
      : m_session(session), m_table(table), m_out(out), m_errors(errors) {}

  void keepGoing(bool keepGoing) { m_keepGoing = keepGoing; }

  // Runs input's lines under name; false when the runner stopped at a
  // failed line.
  bool run(std::istream& input, std::string const& name, bool interactive);

  bool anyLineFailed() const { return m_anyLineFailed; }

 private:
  ScriptSession& m_session;
  CommandTable const& m_table;
  std::ostream& m_out;
  std::ostream& m_errors;
  bool m_keepGoing = false;
  bool m_anyLineFailed = false;
};
