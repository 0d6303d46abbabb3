// CredentialMask: keeps passwords out of what the gateway prints. The script
// lines echoed before their output and the library's debug lines (--debug)
// would show every password twice: "credentials set USER PASSWORD" and
// "createCredentials(USER, PASSWORD)". The mask is a stream buffer put in
// front of standard output and standard error for the gateway's life, so
// that no writer has to remember it; each line is masked as a whole when it
// ends, and a flush (standard error flushes after every insertion) passes
// on only the lines that have ended, so that no password leaves split in
// two. The request log writes through stdio and never prints a header, so
// it needs none.
//
// What is masked, to "****": the rest of a line after "credentials set USER",
// the arguments after the user of "createCredentials(", and the value of an
// Authorization header. A password is never shown in part.
#pragma once

#include <ostream>
#include <streambuf>
#include <string>

// line with its credentials masked; other lines as they are.
std::string maskCredentials(std::string const& line);

class CredentialMask : public std::streambuf {
 public:
  // Put in front of stream's buffer until this dies; stream outlives it.
  explicit CredentialMask(std::ostream& stream) : m_stream(stream), m_target(stream.rdbuf(this)) {}
  // Writes an unfinished line too, and gives stream its buffer back.
  ~CredentialMask() override;
  CredentialMask(CredentialMask const&) = delete;
  CredentialMask& operator=(CredentialMask const&) = delete;

 protected:
  int_type overflow(int_type c) override;
  int sync() override;

 private:
  // Writes the lines that have ended (all that is held when whole), masked.
  bool emit(bool whole);

  std::ostream& m_stream;
  std::streambuf* m_target;
  std::string m_line;
};
