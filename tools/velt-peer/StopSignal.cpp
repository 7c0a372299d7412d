// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/StopSignal.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <system_error>

namespace veltpeer {

namespace {

// Milliseconds from now until the deadline, rounded up so that a wait never
// ends before its deadline; -1 for "no deadline".
int PollTimeout(StopSignal::Clock::time_point deadline) {
  if (deadline == StopSignal::Clock::time_point::max()) {
    return -1;
  }
  const auto now = StopSignal::Clock::now();
  if (deadline <= now) {
    return 0;
  }
  const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - now).count();
  return static_cast<int>(std::min<long long>(left, INT_MAX));
}

}  // namespace

bool StopSignal::Open(std::string& error) {
  std::array<int, 2> ends = {-1, -1};
  if (::pipe2(ends.data(), O_CLOEXEC | O_NONBLOCK) != 0) {
    error = std::string("cannot create the stop pipe: ") + std::generic_category().message(errno);
    return false;
  }
  readEnd_.Reset(ends[0]);
  writeEnd_.Reset(ends[1]);
  return true;
}

void StopSignal::Raise() noexcept {
  if (raised_.exchange(true)) {
    return;
  }
  if (writeEnd_.Valid()) {
    // One byte is enough: nobody drains the pipe, so it stays readable and
    // every later poll sees it at once.
    const char wake = 1;
    while (::write(writeEnd_.Get(), &wake, 1) < 0 && errno == EINTR) {
    }
  }
}

bool StopSignal::Raised() const noexcept { return raised_.load() || Expired(); }

bool StopSignal::Expired() const noexcept {
  return end_ != Clock::time_point::max() && Clock::now() >= end_;
}

WaitResult StopSignal::Wait(int fd, short events, Clock::time_point until) const {
  const Clock::time_point deadline = std::min(until, end_);
  for (;;) {
    if (Raised()) {
      return WaitResult::kStopped;
    }
    std::array<pollfd, 2> fds = {{{readEnd_.Get(), POLLIN, 0}, {fd, events, 0}}};
    const nfds_t count = fd >= 0 ? 2 : 1;
    const int ready = ::poll(fds.data(), count, PollTimeout(deadline));
    if (ready < 0) {
      if (errno == EINTR) {
        continue;
      }
      // Poll only fails on bad arguments or lack of memory; report the
      // descriptor as ready so that its own I/O call reports the error.
      return WaitResult::kReady;
    }
    if (fds[0].revents != 0 || raised_.load()) {
      return WaitResult::kStopped;
    }
    if (count == 2 && fds[1].revents != 0) {
      return WaitResult::kReady;
    }
    if (Clock::now() >= deadline) {
      return Expired() ? WaitResult::kStopped : WaitResult::kTimedOut;
    }
  }
}

bool StopSignal::SleepFor(std::chrono::milliseconds duration) const {
  if (duration.count() <= 0) {
    return !Raised();
  }
  return Wait(-1, 0, Clock::now() + duration) == WaitResult::kTimedOut;
}

}  // namespace veltpeer
