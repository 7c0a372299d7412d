// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>

#include "velt-host/WatchEnd.h"

namespace velthost {

// Where the console's command lines come from: a terminal with line editing,
// scripted standard input, or the -c commands.
class LineInput {
 public:
  virtual ~LineInput() = default;
  // The next line without its line feed; false at the end of the input or
  // once a stop signal has arrived.
  virtual bool Next(std::string& line) = 0;
  // What ends a .watch that runs while this input is in use.
  virtual std::unique_ptr<WatchEnd> BeginWatch() = 0;
  // True when a .watch is ended by a key press (standard input is a
  // terminal).
  virtual bool KeyEndsWatch() const = 0;

 protected:
  LineInput() = default;
  LineInput(const LineInput&) = default;
  LineInput& operator=(const LineInput&) = default;
  LineInput(LineInput&&) = default;
  LineInput& operator=(LineInput&&) = default;
};

}  // namespace velthost
