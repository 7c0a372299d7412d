// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <condition_variable>
#include <functional>
#include <mutex>
#include <string>
#include <vector>

#include "velt-peer/PeerEvent.h"

// Records the simulator's events (as the lines velt-peer would print, in hex)
// for tests that check what happened and in which order.
class EventLog {
 public:
  // The callback to put into PeerOptions::onEvent; the log must outlive the
  // simulator.
  std::function<void(const veltpeer::PeerEvent&)> Sink();
  // Waits until at least count events are recorded.
  bool WaitFor(std::size_t count, std::chrono::milliseconds timeout);
  std::vector<std::string> Lines() const;

 private:
  mutable std::mutex lock_;
  std::condition_variable changed_;
  std::vector<std::string> lines_;
};

// Polls a condition until it holds or the time-out passes.
bool Eventually(const std::function<bool()>& condition,
                std::chrono::milliseconds timeout = std::chrono::milliseconds(5000));
