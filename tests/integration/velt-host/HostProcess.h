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

// The built velt-host (or another built program, such as velt-peer) run as a
// child process, its standard input, output and error on pipes. Every wait
// has a deadline; a child that overruns one in Wait, or still runs when the
// object goes, is killed.
class HostProcess {
 public:
  static constexpr std::chrono::milliseconds kTimeout{10000};

  struct Result {
    std::optional<int> status;  // the exit status; none when killed or not exited
    std::string out;
    std::string err;
  };

  // environment: changes to this process's environment ("NAME=VALUE",
  // "-NAME"). XDG_STATE_HOME points into a scratch folder of the object's
  // own unless a change names it, so no run touches the real home.
  explicit HostProcess(const std::vector<std::string>& arguments,
                       const std::vector<std::string>& environment = {},
                       const char* program = VELT_HOST_PROGRAM);
  HostProcess(const HostProcess&) = delete;
  HostProcess& operator=(const HostProcess&) = delete;
  HostProcess(HostProcess&&) = delete;
  HostProcess& operator=(HostProcess&&) = delete;
  ~HostProcess();

  // Runs velt-host to its end with input on standard input (then closed).
  static Result Run(const std::vector<std::string>& arguments, const std::string& input = "",
                    const std::vector<std::string>& environment = {});

  bool Started() const { return pid_ > 0; }
  void Send(const std::string& text);
  void CloseInput();
  // The next line of standard output without its line feed; none at the end
  // of the output or after the time-out.
  std::optional<std::string> ReadLine(std::chrono::milliseconds timeout = kTimeout);
  // Sends command and a line feed and reads one reply line.
  std::optional<std::string> Ask(const std::string& command);
  // Asks command until the reply is expected, for up to timeout.
  bool AskUntil(const std::string& command, const std::string& expected,
                std::chrono::milliseconds timeout = kTimeout);
  // The rest of standard output and all of standard error, until the child
  // closes them (or the time-out passes).
  std::string ReadOutput(std::chrono::milliseconds timeout = kTimeout);
  std::string ReadErrors(std::chrono::milliseconds timeout = kTimeout);
  void Signal(int signal);
  // The exit status; none when the child did not exit normally within the
  // time-out, in which case it is killed.
  std::optional<int> Wait(std::chrono::milliseconds timeout = kTimeout);

 private:
  // Reads what is there on both output pipes until the deadline; stops early
  // once standard output has a line (when wantLine) or both pipes ended.
  void Drain(std::chrono::steady_clock::time_point deadline, bool wantLine);
  void Kill();

  ScratchFolder state_;
  pid_t pid_ = -1;
  veltpeer::FileDescriptor input_;
  veltpeer::FileDescriptor output_;
  veltpeer::FileDescriptor errors_;
  std::string out_;
  std::string err_;
  bool outEnded_ = false;
  bool errEnded_ = false;
};
