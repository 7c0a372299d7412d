// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>

#include "FileDescriptor.h"

namespace velthost {

// SIGINT and SIGTERM as events instead of handlers: the constructor blocks
// both in the calling thread, so every thread started afterwards (the
// plug-in's workers, the demo's peer) inherits the mask and no handler ever
// interrupts them, and opens a signalfd through which the main thread sees
// them while it waits for input. Construct it in main before any thread
// starts; the signals stay blocked for the rest of the process, so that one
// arriving during shutdown cannot kill it half-way.
class StopSignals {
 public:
  enum class Event { kTimeout, kInput, kSignal };

  // Throws std::runtime_error when the signalfd cannot be opened.
  StopSignals();
  StopSignals(const StopSignals&) = delete;
  StopSignals& operator=(const StopSignals&) = delete;
  StopSignals(StopSignals&&) = delete;
  StopSignals& operator=(StopSignals&&) = delete;
  ~StopSignals() = default;

  // Takes a pending signal, if any; true once SIGINT or SIGTERM arrived.
  bool Raised();
  // The first signal that arrived; 0 before any.
  int Signal() const { return signal_; }
  // Waits up to timeout (negative: no limit) until fd (ignored when
  // negative) is readable or a signal arrives; a signal wins over input.
  Event Wait(int fd, std::chrono::milliseconds timeout);

 private:
  FileDescriptor fd_;
  int signal_ = 0;
};

}  // namespace velthost
