// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <sys/types.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "velt-peer/FileDescriptor.h"

// The built velt-peer program run as a child process with its stdout and
// stderr on pipes. The destructor kills and reaps a child still running.
class PeerProcess {
 public:
  explicit PeerProcess(const std::vector<std::string>& arguments);
  PeerProcess(const PeerProcess&) = delete;
  PeerProcess& operator=(const PeerProcess&) = delete;
  PeerProcess(PeerProcess&&) = delete;
  PeerProcess& operator=(PeerProcess&&) = delete;
  ~PeerProcess();

  bool Running() const { return pid_ > 0; }
  // The next stdout line without its newline, or nothing after the time-out
  // or at the end of the output.
  std::optional<std::string> ReadLine(std::chrono::milliseconds timeout);
  // Everything the child writes to stderr until it closes it (or the
  // time-out passes).
  std::string ReadStderr(std::chrono::milliseconds timeout);
  void Signal(int signal);
  // The exit status, or nothing when the child has not exited (normally)
  // within the time-out.
  std::optional<int> Wait(std::chrono::milliseconds timeout);

 private:
  pid_t pid_ = -1;
  veltpeer::FileDescriptor stdout_;
  veltpeer::FileDescriptor stderr_;
  std::string pending_;
};
