// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "xmlblock/AtomicFile.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <stdexcept>
#include <system_error>
#include <vector>

namespace {

// mkstemp fills in the X's of the name it is given.
int CreateTemporary(const std::string& target, std::string& name) {
  const std::string pattern = target + ".tmpXXXXXX";
  std::vector<char> buffer(pattern.begin(), pattern.end());
  buffer.push_back('\0');
  const int fd = ::mkstemp(buffer.data());
  if (fd >= 0) {
    name = buffer.data();
  }
  return fd;
}

}  // namespace

AtomicFile::AtomicFile(const std::string& path)
    : target(path), file(CreateTemporary(path, temporary)) {
  if (!file.valid()) {
    fail("create temporary file", errno);
  }
  // mkstemp makes the file private to its owner; a generated source is an
  // ordinary, world-readable build file.
  if (::fchmod(file.get(), 0644) != 0) {
    const int error = errno;
    // The destructor does not run for an object whose constructor throws.
    ::unlink(temporary.c_str());
    fail("fchmod", error);
  }
}

AtomicFile::~AtomicFile() {
  if (!committed && !temporary.empty()) {
    ::unlink(temporary.c_str());
  }
}

void AtomicFile::write(const std::string& content) {
  std::size_t done = 0;
  while (done < content.size()) {
    const ssize_t wrote = ::write(file.get(), content.data() + done, content.size() - done);
    if (wrote < 0) {
      if (errno == EINTR) {
        continue;
      }
      fail("write", errno);
    }
    done += static_cast<std::size_t>(wrote);
  }
}

void AtomicFile::commit() {
  if (::fsync(file.get()) != 0) {
    fail("fsync", errno);
  }
  const int closeError = file.close();
  if (closeError != 0) {
    fail("close", closeError);
  }
  if (std::rename(temporary.c_str(), target.c_str()) != 0) {
    fail("rename", errno);
  }
  committed = true;
}

void AtomicFile::Write(const std::string& path, const std::string& content) {
  AtomicFile file(path);
  file.write(content);
  file.commit();
}

void AtomicFile::fail(const char* step, int error) const {
  throw std::runtime_error("cannot write '" + target + "': " + step + ": " +
                           std::generic_category().message(error));
}
