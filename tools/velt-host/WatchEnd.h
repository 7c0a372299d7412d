// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>

namespace velthost {

// What may end a running .watch besides its count: a key on the terminal,
// the end of scripted input, or a stop signal. An object lives for one
// watch (a terminal is switched to single keys for that long).
class WatchEnd {
 public:
  enum class Event { kNone, kKey, kInputEnded, kSignal };

  virtual ~WatchEnd() = default;
  // Waits up to timeout for one of the events. Once the input has ended,
  // every call waits for a signal only and then reports kInputEnded again.
  virtual Event Wait(std::chrono::milliseconds timeout) = 0;

 protected:
  WatchEnd() = default;
  WatchEnd(const WatchEnd&) = default;
  WatchEnd& operator=(const WatchEnd&) = default;
  WatchEnd(WatchEnd&&) = default;
  WatchEnd& operator=(WatchEnd&&) = default;
};

}  // namespace velthost
