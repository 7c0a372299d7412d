// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <mutex>
#include <string>

#include "velt-peer/PeerEvent.h"
#include "velt-peer/PeerTotals.h"

namespace veltpeer {

// What the simulator has done so far: the counters, the received frames kept
// for readers on other threads, and the event callback. The worker records;
// any thread may read the totals and take kept frames.
class PeerActivity {
 public:
  PeerActivity(std::function<void(const PeerEvent&)> onEvent, std::size_t keepFrames);

  // Events that carry an address (kListening, kConnected) or nothing
  // (kClosed, kReset). kConnected also counts a connection.
  void Announce(PeerEvent::Kind kind, const std::string& address = std::string());
  // Bytes that arrived on the wire, framed or not.
  void BytesReceived(std::size_t count) { bytesReceived_ += count; }
  // A whole frame was cut out of what arrived.
  void FrameReceived(const std::string& frame);
  // A whole frame went out.
  void FrameSent(const std::string& frame);

  PeerTotals Totals() const;
  // Takes the oldest kept frame, waiting up to timeout for one.
  bool NextFrame(std::string& frame, std::chrono::milliseconds timeout);

 private:
  void Notify(PeerEvent::Kind kind, const std::string& address, const std::string& bytes) const;

  const std::function<void(const PeerEvent&)> onEvent_;
  const std::size_t keepFrames_;
  std::atomic<std::uint64_t> framesReceived_{0};
  std::atomic<std::uint64_t> bytesReceived_{0};
  std::atomic<std::uint64_t> framesSent_{0};
  std::atomic<std::uint64_t> bytesSent_{0};
  std::atomic<std::uint64_t> connections_{0};
  std::mutex keptLock_;
  std::condition_variable keptArrived_;
  std::deque<std::string> kept_;
};

}  // namespace veltpeer
