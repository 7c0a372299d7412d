// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <string>
#include <vector>

// Kills apply writers (the apply_writer program) at random instants and
// checks after each kill that the storage file holds a whole round or none.
struct WriterKills {
  struct Setup {
    std::string writer;  // the apply_writer program
    std::string plugin;
    std::string folder;  // where the storage file goes
    int count = 3;       // values per apply
    int kills = 30;
    unsigned seed = 1;
    // Each kill comes at a uniformly random delay up to this, after the
    // writer has applied its first round.
    std::chrono::microseconds longestDelay{20000};
  };

  int kills = 0;
  // Files that held values of two rounds, with what differed (the first 5).
  int mixed = 0;
  std::vector<std::string> mixes;
  // A kill left an older round than the last one the writer had applied
  // and reported, or than the file held before.
  int wentBack = 0;
  // Temporary files found before a load, and still there after it.
  int temporariesFound = 0;
  int temporariesLeft = 0;
  // Distinct rounds the file was found to hold.
  int roundsSeen = 0;
  int lastRound = -1;
  // Set when a writer could not be run.
  std::string error;

  static WriterKills Run(const Setup& setup);
};
