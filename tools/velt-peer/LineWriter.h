// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <mutex>
#include <string>

#include "velt-peer/StopSignal.h"

namespace veltpeer {

// Writes whole lines to a descriptor (velt-peer's standard output) without
// blocking past a stop signal or a deadline: when the reader of a pipe falls
// behind, the writer waits for room in a way that SIGTERM handling can cut
// short, so that a stuck reader never keeps velt-peer from ending. Lines from
// several threads never interleave.
class LineWriter {
 public:
  explicit LineWriter(int fd) : fd_(fd) {}

  // Writes line and a newline. False when the stop signal was raised or the
  // deadline passed before all of it was written, or on a write error.
  bool Write(const std::string& line, const StopSignal& stop,
             StopSignal::Clock::time_point until = StopSignal::Clock::time_point::max());

 private:
  std::mutex lock_;
  const int fd_;
};

}  // namespace veltpeer
