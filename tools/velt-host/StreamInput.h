// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>

#include "velt-host/LineInput.h"
#include "velt-host/StopSignals.h"

namespace velthost {

// Command lines read from a file descriptor that is not a terminal (a pipe
// or a file): one line per line feed, without prompt or editing; a carriage
// return before the line feed is dropped, and a last line without a line
// feed still counts. A .watch without a count ends at the end of this input.
class StreamInput final : public LineInput {
 public:
  StreamInput(int fd, StopSignals& signals) : fd_(fd), signals_(signals) {}

  bool Next(std::string& line) override;
  std::unique_ptr<WatchEnd> BeginWatch() override;
  bool KeyEndsWatch() const override { return false; }

  // Reads what is there (waiting up to timeout for it) into the buffer of
  // lines not yet taken.
  StopSignals::Event Fill(std::chrono::milliseconds timeout);
  bool Ended() const { return ended_; }

 private:
  int fd_;
  StopSignals& signals_;
  std::string pending_;
  bool ended_ = false;
};

}  // namespace velthost
