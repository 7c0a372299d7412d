// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstddef>
#include <memory>
#include <string>

#include "velt-host/WatchEnd.h"

namespace velthost {

// Where the console's command lines come from: a terminal with line editing,
// scripted standard input, or the -c commands.
class LineInput {
 public:
  // The longest command line taken, in bytes, without its line ending.
  static constexpr std::size_t kLongestLine = std::size_t{1024} * 1024;

  enum class Read {
    kLine,     // a line
    kTooLong,  // a line longer than kLongestLine, dropped whole
    kEnded,    // the end of the input, or a stop signal
  };

  virtual ~LineInput() = default;
  // The next line without its line feed. A line longer than kLongestLine is
  // never kept in full: it is read to its end and dropped.
  virtual Read Next(std::string& line) = 0;
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
