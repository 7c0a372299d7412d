// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/FileDescriptor.h"

#include <unistd.h>

namespace veltpeer {

FileDescriptor& FileDescriptor::operator=(FileDescriptor&& other) noexcept {
  if (this != &other) {
    Reset(other.Release());
  }
  return *this;
}

int FileDescriptor::Release() noexcept {
  const int fd = fd_;
  fd_ = -1;
  return fd;
}

void FileDescriptor::Reset(int fd) noexcept {
  if (fd_ >= 0) {
    // The descriptor is released even when close reports an error (Linux
    // frees it in every case), so a retry would close a stranger's descriptor.
    ::close(fd_);
  }
  fd_ = fd;
}

}  // namespace veltpeer
