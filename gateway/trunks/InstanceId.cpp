#include "trunks/InstanceId.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <fstream>

#include "sip/Libre.h"

namespace {

std::string randomUrn() {
  uint8_t bytes[16];
  rand_bytes(bytes, sizeof bytes);
  bytes[6] = static_cast<uint8_t>((bytes[6] & 0x0f) | 0x40);
  bytes[8] = static_cast<uint8_t>((bytes[8] & 0x3f) | 0x80);
  char text[64];
  re_snprintf(text, sizeof text, "urn:uuid:%w-%w-%w-%w-%w", bytes, size_t{4}, bytes + 4, size_t{2}, bytes + 6,
              size_t{2}, bytes + 8, size_t{2}, bytes + 10, size_t{6});
  return text;
}

bool create(std::string const& path, std::string& error) {
  int const fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL, 0600);
  if (fd < 0) {
    // Another gateway made it first: read that one.
    if (errno == EEXIST)
      return true;
    error = "cannot create the instance file " + path + ": " + std::strerror(errno);
    return false;
  }
  std::string const text = randomUrn() + "\n";
  bool const written = ::write(fd, text.data(), text.size()) == static_cast<ssize_t>(text.size());
  bool const closed = ::close(fd) == 0;
  if (written && closed)
    return true;
  ::unlink(path.c_str());
  error = "cannot write the instance file " + path;
  return false;
}

}  // namespace

bool InstanceId::load(std::string const& path, std::string& urn, std::string& error) {
  if (!create(path, error))
    return false;
  std::ifstream file(path);
  std::string line;
  if (!std::getline(file, line)) {
    error = "cannot read the instance file " + path;
    return false;
  }
  if (line.compare(0, 9, "urn:uuid:") != 0 || line.size() != 45) {
    error = "the instance file " + path + " holds no urn:uuid";
    return false;
  }
  urn = line;
  return true;
}
