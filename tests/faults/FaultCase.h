// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <functional>
#include <string>
#include <vector>

// The programs the fault suite runs.
struct FaultPrograms {
  std::string plugin;
  std::string veltHost;
  std::string veltPeer;
  std::string applyWriter;
  // The fault suite itself, for the parts of a case that run in a network
  // namespace.
  std::string self;
};

// What one case found: its figures, printed as they come, and its verdict.
class FaultCase {
 public:
  enum class Verdict { kPass, kFail, kSkip };

  explicit FaultCase(std::string name);

  const std::string& Name() const { return name_; }
  // Prints "figure NAME: TEXT".
  void Figure(const std::string& text) const;
  // Notes a failed expectation; the verdict becomes FAIL with every reason.
  void Expect(bool holds, const std::string& reason);
  // The case cannot run here (no privilege, no tool); the verdict is SKIP
  // unless something failed.
  void Skip(const std::string& reason);
  // Prints "verdict NAME: PASS", "verdict NAME: FAIL: REASONS" or
  // "verdict NAME: SKIP: REASON" and returns the verdict.
  Verdict Finish() const;

 private:
  std::string name_;
  std::vector<std::string> failures_;
  std::string skipped_;
};

// One case of the suite: its name, a line saying what it does, and its run.
struct FaultCaseEntry {
  const char* name;
  const char* what;
  std::function<void(FaultCase&, const FaultPrograms&)> run;
};

// Resident memory of this process, in KiB: now, and the peak since the last
// ResetPeakMemory.
long ResidentKiB();
long PeakResidentKiB();
void ResetPeakMemory();
