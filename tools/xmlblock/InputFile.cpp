#include "xmlblock/InputFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>

#include "xmlblock/FileDescriptor.h"

namespace {

[[noreturn]] void Fail(const std::string& path, int error) {
  throw std::runtime_error("cannot read '" + path + "': " + std::strerror(error));
}

}  // namespace

std::string InputFile::Read(const std::string& path) {
  FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  if (!file.valid()) {
    Fail(path, errno);
  }
  std::string content;
  char chunk[65536];
  for (;;) {
    const ssize_t got = ::read(file.get(), chunk, sizeof chunk);
    if (got < 0) {
      if (errno == EINTR) {
        continue;
      }
      Fail(path, errno);
    }
    if (got == 0) {
      break;
    }
    content.append(chunk, static_cast<std::size_t>(got));
  }
  return content;
}
