// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "FileDescriptor.h"

#include <unistd.h>

#include <cerrno>
#include <utility>

FileDescriptor::FileDescriptor(FileDescriptor&& other) noexcept : fd_(other.Release()) {}

FileDescriptor& FileDescriptor::operator=(FileDescriptor&& other) noexcept {
  if (this != &other) {
    Close();
    fd_ = other.Release();
  }
  return *this;
}

FileDescriptor::~FileDescriptor() { Close(); }

int FileDescriptor::Release() { return std::exchange(fd_, -1); }

int FileDescriptor::Close() {
  if (fd_ < 0) {
    return 0;
  }
  // Linux releases the descriptor even when close fails, so it is never
  // retried (a retry could close a descriptor another thread just opened).
  const int rc = ::close(std::exchange(fd_, -1));
  return rc == 0 ? 0 : errno;
}
