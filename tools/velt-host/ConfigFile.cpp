// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/ConfigFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <system_error>

#include "FileDescriptor.h"

namespace velthost {

namespace {

// A configuration string is one line of text; a file far larger is not one.
constexpr std::size_t kMaxBytes = 16U << 20U;

}  // namespace

bool ConfigFile::Read(const std::string& path, std::string& text, std::string& error) {
  const std::string what = "cannot read the configuration file " + path + ": ";
  const FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
  if (!file.Valid()) {
    error = what + std::generic_category().message(errno);
    return false;
  }
  std::string content;
  std::array<char, 16384> buffer{};
  for (;;) {
    const ssize_t received = ::read(file.Get(), buffer.data(), buffer.size());
    if (received < 0 && errno == EINTR) {
      continue;
    }
    if (received < 0) {
      error = what + std::generic_category().message(errno);
      return false;
    }
    if (received == 0) {
      break;
    }
    content.append(buffer.data(), static_cast<std::size_t>(received));
    if (content.size() > kMaxBytes) {
      error = what + "larger than " + std::to_string(kMaxBytes) + " bytes";
      return false;
    }
  }
  std::replace_if(
      content.begin(), content.end(), [](char c) { return c == '\n' || c == '\r'; }, ' ');
  text.swap(content);
  return true;
}

}  // namespace velthost
