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
// At most kLongestLine bytes of a line are held: a longer line is read on to
// its end and dropped. Input that arrives during a .watch is kept for the
// lines after it, up to that much; beyond it the watch stops reading.
class StreamInput final : public LineInput {
 public:
  StreamInput(int fd, StopSignals& signals) : fd_(fd), signals_(signals) {}

  Read Next(std::string& line) override;
  std::unique_ptr<WatchEnd> BeginWatch() override;
  bool KeyEndsWatch() const override { return false; }

  // Reads what is there (waiting up to timeout for it) into the buffer of
  // lines not yet taken.
  StopSignals::Event Fill(std::chrono::milliseconds timeout);
  bool Ended() const { return ended_; }
  // True when the lines not yet taken fill what this input holds, so that
  // nothing more is read until they are taken.
  bool Full() const { return pending_.size() > kLongestLine + 1; }

 private:
  int fd_;
  StopSignals& signals_;
  std::string pending_;
  // How much of pending_ is known to hold no line feed.
  std::size_t scanned_ = 0;
  // The line being read is too long; its bytes are dropped up to its end.
  bool dropping_ = false;
  bool ended_ = false;
};

}  // namespace velthost
