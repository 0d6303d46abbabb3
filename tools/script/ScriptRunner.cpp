#include "ScriptRunner.h"

LineOutcome runScriptLine(ScriptSession& session, CommandTable const& table, std::string const& text) {
  LineOutcome outcome;
  try {
    table.run(session, ScriptLine(text));
  } catch (CommandError const& error) {
    outcome.failure = error;
  }
  outcome.printed = session.takeOutput();
  return outcome;
}

bool ScriptRunner::run(std::istream& input, std::string const& name, bool interactive) {
  std::string text;
  size_t number = 0;
  for (;;) {
    if (interactive) {
      m_out << "ls> " << std::flush;
      if (m_beforePrompt)
        m_beforePrompt();
    }
    if (!std::getline(input, text))
      break;
    ++number;
    LineOutcome const outcome = m_runLine(text);
    if (!outcome.printed.empty() && !interactive)
      m_out << "> " << text << "\n";
    m_out << outcome.printed << std::flush;
    if (!outcome.failure)
      continue;
    m_errors << name << ":" << number << ":" << outcome.failure->column() << ": " << outcome.failure->what()
             << std::endl;
    m_anyLineFailed = true;
    if (!interactive && !m_keepGoing)
      return false;
  }
  if (interactive)
    m_out << "\n";
  return true;
}
