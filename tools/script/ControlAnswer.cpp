#include "ControlAnswer.h"

#include <cstdlib>

namespace ControlAnswer {

namespace {

char const kOk[] = "ok";
char const kFailed[] = "failed";

// The column and the message of "control:LINE:COLUMN: message"; a line
// that does not read so is the message itself, at column 1.
CommandError failureOf(std::string const& line) {
  std::string const prefix = std::string(kName) + ":";
  size_t const lineEnd =
      line.compare(0, prefix.size(), prefix) == 0 ? line.find(':', prefix.size()) : std::string::npos;
  size_t const columnEnd = lineEnd == std::string::npos ? std::string::npos : line.find(": ", lineEnd + 1);
  if (columnEnd == std::string::npos)
    return CommandError(1, line);
  size_t const column = std::strtoul(line.c_str() + lineEnd + 1, nullptr, 10);
  return CommandError(column, line.substr(columnEnd + 2));
}

}  // namespace

std::string encode(LineOutcome const& outcome, size_t lineNumber) {
  std::string answer = outcome.printed;
  for (char& c : answer)
    if (c == '\0')
      c = '?';
  if (!answer.empty() && answer.back() != '\n')
    answer += '\n';
  if (outcome.failure)
    answer += std::string(kName) + ":" + std::to_string(lineNumber) + ":" +
              std::to_string(outcome.failure->column()) + ": " + outcome.failure->what() + "\n";
  answer += '\0';
  answer += outcome.failure ? kFailed : kOk;
  answer += '\n';
  return answer;
}

bool Reader::next(LineOutcome& outcome) {
  // The terminator is the first NUL that begins a line.
  size_t start = 0;
  while ((start = m_received.find('\0', start)) != std::string::npos && start != 0 &&
         m_received[start - 1] != '\n')
    ++start;
  if (start == std::string::npos)
    return false;
  size_t const end = m_received.find('\n', start);
  if (end == std::string::npos)
    return false;
  bool const failed = m_received.compare(start + 1, end - start - 1, kOk) != 0;
  std::string printed = m_received.substr(0, start);
  m_received.erase(0, end + 1);
  outcome.failure.reset();
  if (failed) {
    // The error line is the answer's last.
    size_t const previous = printed.size() < 2 ? std::string::npos : printed.rfind('\n', printed.size() - 2);
    size_t const from = previous == std::string::npos ? 0 : previous + 1;
    std::string errorLine = printed.substr(from);
    if (!errorLine.empty() && errorLine.back() == '\n')
      errorLine.pop_back();
    printed.erase(from);
    outcome.failure = failureOf(errorLine);
  }
  outcome.printed = std::move(printed);
  return true;
}

std::string Reader::takeLines() {
  size_t const end = m_received.rfind('\n');
  if (end == std::string::npos)
    return std::string();
  std::string lines = m_received.substr(0, end + 1);
  m_received.erase(0, end + 1);
  return lines;
}

}  // namespace ControlAnswer
