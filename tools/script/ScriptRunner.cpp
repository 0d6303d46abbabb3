#include "ScriptRunner.h"

#include <optional>

bool ScriptRunner::run(std::istream& input, std::string const& name, bool interactive) {
  std::string text;
  size_t number = 0;
  for (;;) {
    if (interactive)
      m_out << "ls> " << std::flush;
    if (!std::getline(input, text))
      break;
    ++number;
    std::optional<CommandError> failure;
    try {
      m_table.run(m_session, ScriptLine(text));
    } catch (CommandError const& error) {
      failure = error;
    }
    // What a failed line printed is shown too: its events and debug lines
    // happened, even though the line changed nothing.
    std::string const printed = m_session.takeOutput();
    if (!printed.empty() && !interactive)
      m_out << "> " << text << "\n";
    m_out << printed << std::flush;
    if (!failure)
      continue;
    m_errors << name << ":" << number << ":" << failure->column() << ": " << failure->what() << std::endl;
    m_anyLineFailed = true;
    if (!interactive && !m_keepGoing)
      return false;
  }
  if (interactive)
    m_out << "\n";
  return true;
}
