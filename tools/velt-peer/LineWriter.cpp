// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/LineWriter.h"

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <climits>

namespace veltpeer {

bool LineWriter::Write(const std::string& line, const StopSignal& stop,
                       StopSignal::Clock::time_point until) {
  const std::string text = line + '\n';
  const std::lock_guard<std::mutex> hold(lock_);
  std::size_t offset = 0;
  while (offset < text.size()) {
    if (stop.Wait(fd_, POLLOUT, until) != WaitResult::kReady) {
      return false;
    }
    // A pipe that reports room takes PIPE_BUF bytes without blocking.
    const std::size_t piece = std::min<std::size_t>(text.size() - offset, PIPE_BUF);
    const ssize_t written = ::write(fd_, text.data() + offset, piece);
    if (written > 0) {
      offset += static_cast<std::size_t>(written);
    } else if (written < 0 && errno != EINTR && errno != EAGAIN && errno != EWOULDBLOCK) {
      return false;
    }
  }
  return true;
}

}  // namespace veltpeer
