// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <sys/types.h>

#include <chrono>
#include <cstdint>
#include <string>
#include <vector>

#include "FileDescriptor.h"

// One velt-host process run for a measurement: its console is fed through a
// pipe that stays open until Finish, so the program idles as a panel's
// runtime does; its output goes to /dev/null.
class ChildHost {
 public:
  // Starts program with arguments (argv[0] excluded). Throws
  // std::runtime_error when it cannot be started.
  ChildHost(const std::string& program, const std::vector<std::string>& arguments);
  ChildHost(const ChildHost&) = delete;
  ChildHost& operator=(const ChildHost&) = delete;
  ChildHost(ChildHost&&) = delete;
  ChildHost& operator=(ChildHost&&) = delete;
  // Finishes the process if Finish was not called.
  ~ChildHost();

  // Writes console lines; false when the pipe broke (the process ended).
  bool Send(const std::vector<std::string>& lines);
  // CPU time of the whole process (all its threads, ended ones included).
  std::chrono::nanoseconds CpuTime() const;
  // Resident memory now and at its peak, in KiB (VmRSS, VmHWM).
  std::uint64_t ResidentKiB() const { return Status("VmRSS:"); }
  std::uint64_t PeakResidentKiB() const { return Status("VmHWM:"); }
  std::uint64_t Threads() const { return Status("Threads:"); }
  // Context switches of all its threads so far: each wake of a sleeping
  // thread is one.
  std::uint64_t ContextSwitches() const;
  // Ends the console input and waits up to limit for the process to leave;
  // kills it after that. True when it left by itself with status 0.
  bool Finish(std::chrono::milliseconds limit);

 private:
  static std::uint64_t Field(const std::string& path, const char* field);
  std::uint64_t Status(const char* field) const;

  pid_t pid_ = -1;
  clockid_t clock_{};
  FileDescriptor input_;
};
