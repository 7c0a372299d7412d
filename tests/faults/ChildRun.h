// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <vector>

// A program run to its end by the fault suite, with what it printed, how
// long it took and the most memory it held. Every run is bounded in time:
// a program still running at the limit is killed.
//
// The kernel counts into a child's peak memory the memory of the process it
// was forked from, so a run that measures memory goes through a measurer: a
// small process (the fault suite run as "--measure PROGRAM ARGS...") that
// runs the program, waits for it and adds "velt-faults: peak resident N
// KiB" to its standard error, which Run and OnTerminal take off again.
struct ChildRun {
  std::optional<int> status;  // the exit status; none when killed or not started
  std::string out;
  std::string err;  // empty for a run on a terminal, whose output is all in out
  long peakResidentKiB = 0;
  double seconds = 0;

  // Runs argv (argv[0] is the program's path) with input written to its
  // standard input, which is then closed.
  // peakResidentKiB is set only with a measurer (the fault suite's path).
  static ChildRun Run(const std::vector<std::string>& argv, const std::string& input,
                      std::chrono::milliseconds limit, const std::string& measurer = "");
  // Runs argv on a pseudo-terminal through the measurer: once the program
  // prints prompt, input is typed in.
  static ChildRun OnTerminal(const std::vector<std::string>& argv, const std::string& prompt,
                             const std::string& input, std::chrono::milliseconds limit,
                             const std::string& measurer);
  // Starts argv in the background with its standard output thrown away; the
  // process id, or -1. The caller ends and reaps it.
  static int Start(const std::vector<std::string>& argv);
  // The measurer's part: runs argv, then reports its peak memory on standard
  // error. Returns the program's exit status (128 + the signal when killed).
  static int Measure(const std::vector<std::string>& argv);
};
