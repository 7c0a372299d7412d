// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "xmlblock/FileDescriptor.h"

#include <unistd.h>

#include <cerrno>

FileDescriptor::~FileDescriptor() { close(); }

int FileDescriptor::close() noexcept {
  if (fd < 0) {
    return 0;
  }
  // The descriptor is gone after close even when it reports EINTR (Linux), so
  // it is never retried.
  const int result = ::close(fd);
  fd = -1;
  return result == 0 ? 0 : errno;
}
