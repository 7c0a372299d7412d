// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <sys/types.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "ScratchFolder.h"
#include "velt-peer/FileDescriptor.h"

// The built velt-host run in a pseudo-terminal (forkpty), as a person at a
// terminal runs it: standard input, output and error are the terminal, TERM
// is xterm and the window 80 by 24. Everything the program shows is kept, so
// a test can wait for a text to appear. A child still running when the
// object goes, or one that overruns Wait, is killed.
class TerminalProcess {
 public:
  static constexpr std::chrono::milliseconds kTimeout{10000};

  explicit TerminalProcess(const std::vector<std::string>& arguments);
  TerminalProcess(const TerminalProcess&) = delete;
  TerminalProcess& operator=(const TerminalProcess&) = delete;
  TerminalProcess(TerminalProcess&&) = delete;
  TerminalProcess& operator=(TerminalProcess&&) = delete;
  ~TerminalProcess();

  bool Started() const { return pid_ > 0; }
  // Types text as keys.
  void Type(const std::string& text);
  // Waits until text appears in what the terminal showed after the last
  // text waited for; true when it did. The search goes on after it.
  bool WaitFor(const std::string& text, std::chrono::milliseconds timeout = kTimeout);
  // Everything the terminal showed so far.
  const std::string& Screen() const { return shown_; }
  std::optional<int> Wait(std::chrono::milliseconds timeout = kTimeout);

 private:
  bool ReadSome(std::chrono::steady_clock::time_point deadline);
  void Kill();

  ScratchFolder state_;
  pid_t pid_ = -1;
  veltpeer::FileDescriptor terminal_;
  std::string shown_;
  std::size_t searched_ = 0;
};
