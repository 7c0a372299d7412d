// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/PeerActivity.h"

#include <utility>

namespace veltpeer {

PeerActivity::PeerActivity(std::function<void(const PeerEvent&)> onEvent, std::size_t keepFrames)
    : onEvent_(std::move(onEvent)), keepFrames_(keepFrames) {}

void PeerActivity::Announce(PeerEvent::Kind kind, const std::string& address) {
  if (kind == PeerEvent::Kind::kConnected) {
    ++connections_;
  }
  Notify(kind, address, std::string());
}

void PeerActivity::FrameReceived(const std::string& frame) {
  ++framesReceived_;
  if (keepFrames_ > 0) {
    {
      const std::lock_guard<std::mutex> hold(keptLock_);
      if (kept_.size() >= keepFrames_) {
        kept_.pop_front();
      }
      kept_.push_back(frame);
    }
    keptArrived_.notify_all();
  }
  Notify(PeerEvent::Kind::kReceived, std::string(), frame);
}

void PeerActivity::FrameSent(const std::string& frame) {
  ++framesSent_;
  bytesSent_ += frame.size();
  Notify(PeerEvent::Kind::kSent, std::string(), frame);
}

PeerTotals PeerActivity::Totals() const {
  PeerTotals totals;
  totals.framesReceived = framesReceived_.load();
  totals.bytesReceived = bytesReceived_.load();
  totals.framesSent = framesSent_.load();
  totals.bytesSent = bytesSent_.load();
  totals.connections = connections_.load();
  return totals;
}

bool PeerActivity::NextFrame(std::string& frame, std::chrono::milliseconds timeout) {
  std::unique_lock<std::mutex> hold(keptLock_);
  if (!keptArrived_.wait_for(hold, timeout, [this] { return !kept_.empty(); })) {
    return false;
  }
  frame = std::move(kept_.front());
  kept_.pop_front();
  return true;
}

void PeerActivity::Notify(PeerEvent::Kind kind, const std::string& address,
                          const std::string& bytes) const {
  if (onEvent_) {
    onEvent_(PeerEvent{kind, address, bytes});
  }
}

}  // namespace veltpeer
