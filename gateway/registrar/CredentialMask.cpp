#include "registrar/CredentialMask.h"

namespace {

char const kMask[] = "****";

// The line with everything from position from to the end of its text
// (before the line break) masked.
std::string maskFrom(std::string const& line, size_t from) {
  size_t end = line.size();
  while (end > from && (line[end - 1] == '\n' || line[end - 1] == '\r'))
    --end;
  if (end <= from)
    return line;
  return line.substr(0, from) + kMask + line.substr(end);
}

}  // namespace

std::string maskCredentials(std::string const& line) {
  size_t position = line.find("credentials set ");
  if (position != std::string::npos) {
    // Past the user name, which may be quoted.
    size_t user = line.find_first_not_of(' ', position + 16);
    if (user == std::string::npos)
      return line;
    size_t const userEnd = line[user] == '"' ? line.find('"', user + 1) : line.find(' ', user);
    if (userEnd == std::string::npos)
      return line;
    size_t const password = line.find(' ', userEnd);
    return password == std::string::npos ? line : maskFrom(line, password + 1);
  }
  position = line.find("::createCredentials(");
  if (position != std::string::npos) {
    size_t const comma = line.find(", ", position);
    return comma == std::string::npos ? maskFrom(line, position + 20) : maskFrom(line, comma + 2);
  }
  position = line.find("Authorization:");
  if (position != std::string::npos)
    return maskFrom(line, position + 14);
  return line;
}

CredentialMask::~CredentialMask() {
  emit(true);
  m_target->pubsync();
  m_stream.rdbuf(m_target);
}

CredentialMask::int_type CredentialMask::overflow(int_type c) {
  if (traits_type::eq_int_type(c, traits_type::eof()))
    return traits_type::not_eof(c);
  m_line += traits_type::to_char_type(c);
  if (m_line.back() == '\n' && !emit(false))
    return traits_type::eof();
  return c;
}

int CredentialMask::sync() {
  return emit(false) && m_target->pubsync() == 0 ? 0 : -1;
}

bool CredentialMask::emit(bool whole) {
  size_t start = 0;
  bool ok = true;
  for (;;) {
    size_t end = m_line.find('\n', start);
    if (end == std::string::npos) {
      if (!whole || start == m_line.size())
        break;
      end = m_line.size() - 1;
    }
    std::string const masked = maskCredentials(m_line.substr(start, end + 1 - start));
    ok = ok && m_target->sputn(masked.data(), static_cast<std::streamsize>(masked.size())) ==
                   static_cast<std::streamsize>(masked.size());
    start = end + 1;
  }
  m_line.erase(0, start);
  return ok;
}
