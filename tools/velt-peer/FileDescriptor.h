// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

namespace veltpeer {

// Sole owner of one open file descriptor (socket or pipe end); closes it on
// destruction. Movable, not copyable.
class FileDescriptor {
 public:
  FileDescriptor() = default;
  explicit FileDescriptor(int fd) noexcept : fd_(fd) {}
  FileDescriptor(const FileDescriptor&) = delete;
  FileDescriptor& operator=(const FileDescriptor&) = delete;
  FileDescriptor(FileDescriptor&& other) noexcept : fd_(other.Release()) {}
  FileDescriptor& operator=(FileDescriptor&& other) noexcept;
  ~FileDescriptor() { Reset(); }

  int Get() const noexcept { return fd_; }
  bool Valid() const noexcept { return fd_ >= 0; }
  // Gives up ownership without closing; the descriptor becomes -1.
  int Release() noexcept;
  // Closes the current descriptor, if any, and takes ownership of fd.
  void Reset(int fd = -1) noexcept;

 private:
  int fd_ = -1;
};

}  // namespace veltpeer
