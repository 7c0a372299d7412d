// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/KeyWatchEnd.h"

#include <unistd.h>

#include <array>

namespace velthost {

KeyWatchEnd::KeyWatchEnd(int fd, StopSignals& signals) : fd_(fd), signals_(signals), keys_(fd) {}

WatchEnd::Event KeyWatchEnd::Wait(std::chrono::milliseconds timeout) {
  if (ended_) {
    return signals_.Wait(-1, timeout) == StopSignals::Event::kSignal ? Event::kSignal
                                                                     : Event::kInputEnded;
  }
  const StopSignals::Event event = signals_.Wait(fd_, timeout);
  if (event == StopSignals::Event::kSignal) {
    return Event::kSignal;
  }
  if (event == StopSignals::Event::kTimeout) {
    return Event::kNone;
  }
  std::array<char, 64> keys{};
  const ssize_t received = ::read(fd_, keys.data(), keys.size());
  if (received == 0) {
    // The terminal hung up: no key can come any more.
    ended_ = true;
    return Event::kInputEnded;
  }
  return received > 0 ? Event::kKey : Event::kNone;
}

}  // namespace velthost
