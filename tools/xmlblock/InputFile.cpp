// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "xmlblock/InputFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <stdexcept>
#include <system_error>

#include "xmlblock/FileDescriptor.h"

namespace {

[[noreturn]] void Fail(const std::string& path, int error) {
  throw std::runtime_error("cannot read '" + path + "': " + std::generic_category().message(error));
}

}  // namespace

std::string InputFile::Read(const std::string& path) {
  FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  if (!file.valid()) {
    Fail(path, errno);
  }
  std::string content;
  std::array<char, 65536> chunk{};
  for (;;) {
    const ssize_t got = ::read(file.get(), chunk.data(), chunk.size());
    if (got < 0) {
      if (errno == EINTR) {
        continue;
      }
      Fail(path, errno);
    }
    if (got == 0) {
      break;
    }
    content.append(chunk.data(), static_cast<std::size_t>(got));
  }
  return content;
}
