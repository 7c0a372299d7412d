// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <chrono>
#include <string>

#include "velt-peer/FileDescriptor.h"

namespace veltpeer {

// What a wait of StopSignal ended with.
enum class WaitResult {
  kReady,     // the descriptor reported one of the awaited events (or an error)
  kTimedOut,  // the wait's own deadline passed
  kStopped,   // the signal was raised or the end of life was reached
};

// Wakes the simulator's worker out of any blocking wait: every wait polls the
// awaited socket together with a pipe that Raise writes to. An optional end of
// life (a bounded run) counts as a raised signal once it has passed.
class StopSignal {
 public:
  using Clock = std::chrono::steady_clock;

  StopSignal() = default;
  StopSignal(const StopSignal&) = delete;
  StopSignal& operator=(const StopSignal&) = delete;
  StopSignal(StopSignal&&) = delete;
  StopSignal& operator=(StopSignal&&) = delete;
  ~StopSignal() = default;

  // Creates the wake-up pipe; false with a reason in error when that fails.
  // A signal that was never opened still honours Raise and the deadlines, but
  // a Raise from another thread does not wake a wait already in progress.
  bool Open(std::string& error);
  // Sets the end of life; call before any other thread waits.
  void EndAt(Clock::time_point end) { end_ = end; }
  // Thread-safe and idempotent; wakes every current and later wait.
  void Raise() noexcept;
  // True once raised or once the end of life has passed.
  bool Raised() const noexcept;
  // True once the end of life has passed (as opposed to an explicit Raise).
  bool Expired() const noexcept;

  // Waits until fd reports one of events, until passes, or the signal is
  // raised. An fd of -1 waits for the deadline or the signal only.
  WaitResult Wait(int fd, short events, Clock::time_point until) const;
  // Sleeps for the given time; false when the signal cut the sleep short.
  bool SleepFor(std::chrono::milliseconds duration) const;

 private:
  FileDescriptor readEnd_;
  FileDescriptor writeEnd_;
  std::atomic<bool> raised_{false};
  Clock::time_point end_ = Clock::time_point::max();
};

}  // namespace veltpeer
