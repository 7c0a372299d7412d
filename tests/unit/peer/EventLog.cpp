// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "EventLog.h"

#include <thread>

#include "velt-peer/PeerOutput.h"

std::function<void(const veltpeer::PeerEvent&)> EventLog::Sink() {
  return [this](const veltpeer::PeerEvent& event) {
    const veltpeer::PeerOutput output(veltpeer::Transport::kTcp, false, false);
    const std::string line = event.kind == veltpeer::PeerEvent::Kind::kListening
                                 ? "listening " + event.address
                                 : output.Line(event);
    {
      const std::lock_guard<std::mutex> hold(lock_);
      lines_.push_back(line);
    }
    changed_.notify_all();
  };
}

bool EventLog::WaitFor(std::size_t count, std::chrono::milliseconds timeout) {
  std::unique_lock<std::mutex> hold(lock_);
  return changed_.wait_for(hold, timeout, [&] { return lines_.size() >= count; });
}

std::vector<std::string> EventLog::Lines() const {
  const std::lock_guard<std::mutex> hold(lock_);
  return lines_;
}

bool Eventually(const std::function<bool()>& condition, std::chrono::milliseconds timeout) {
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  while (!condition()) {
    if (std::chrono::steady_clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(2));
  }
  return true;
}
