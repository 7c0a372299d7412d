// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <vector>

// Runs a program to its end with its standard output and standard error
// collected, killing it if it outlives a time limit.
class ChildProcess {
 public:
  struct Result {
    // The exit status; empty when the program did not exit normally in time
    // (it was then killed) or could not be started.
    std::optional<int> status;
    std::string out;
    std::string err;
  };

  // argv[0] is the program's path.
  static Result Run(const std::vector<std::string>& argv, std::chrono::milliseconds limit);
};
