// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

// Owns one open POSIX file descriptor and closes it when it goes out of scope.
class FileDescriptor {
 public:
  explicit FileDescriptor(int descriptor) noexcept : fd(descriptor) {}
  FileDescriptor(const FileDescriptor&) = delete;
  FileDescriptor& operator=(const FileDescriptor&) = delete;
  FileDescriptor(FileDescriptor&&) = delete;
  FileDescriptor& operator=(FileDescriptor&&) = delete;
  ~FileDescriptor();

  [[nodiscard]] int get() const noexcept { return fd; }
  [[nodiscard]] bool valid() const noexcept { return fd >= 0; }
  // Closes now and returns 0 or the errno of close: on some file systems a
  // failed write only shows up here, so a writer must not ignore it.
  int close() noexcept;

 private:
  int fd;
};
