// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "FaultCase.h"

#include <cstdio>
#include <fstream>
#include <string>
#include <utility>

FaultCase::FaultCase(std::string name) : name_(std::move(name)) {}

void FaultCase::Figure(const std::string& text) const {
  std::printf("figure %s: %s\n", name_.c_str(), text.c_str());
  std::fflush(stdout);
}

void FaultCase::Expect(bool holds, const std::string& reason) {
  if (!holds) {
    failures_.push_back(reason);
  }
}

void FaultCase::Skip(const std::string& reason) { skipped_ = reason; }

FaultCase::Verdict FaultCase::Finish() const {
  if (!failures_.empty()) {
    std::string reasons;
    for (const std::string& failure : failures_) {
      reasons += (reasons.empty() ? "" : "; ") + failure;
    }
    std::printf("verdict %s: FAIL: %s\n", name_.c_str(), reasons.c_str());
  } else if (!skipped_.empty()) {
    std::printf("verdict %s: SKIP: %s\n", name_.c_str(), skipped_.c_str());
  } else {
    std::printf("verdict %s: PASS\n", name_.c_str());
  }
  std::fflush(stdout);
  if (!failures_.empty()) {
    return Verdict::kFail;
  }
  return skipped_.empty() ? Verdict::kPass : Verdict::kSkip;
}

namespace {

long StatusKiB(const std::string& field) {
  std::ifstream status("/proc/self/status");
  std::string line;
  while (std::getline(status, line)) {
    if (line.rfind(field + ":", 0) == 0) {
      return std::stol(line.substr(field.size() + 1));
    }
  }
  return -1;
}

}  // namespace

long ResidentKiB() { return StatusKiB("VmRSS"); }

long PeakResidentKiB() { return StatusKiB("VmHWM"); }

void ResetPeakMemory() { std::ofstream("/proc/self/clear_refs") << "5"; }
