// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ConnectPacing.h"

#include <algorithm>
#include <iterator>

ConnectPacing::ConnectPacing(std::chrono::milliseconds ceiling)
    : ceiling_(std::max(ceiling, std::chrono::milliseconds(0))) {}

std::uint64_t ConnectPacing::Key(const Target& target) {
  return (static_cast<std::uint64_t>(target.address) << 32U) |
         (static_cast<std::uint64_t>(target.port) << 16U) | target.localPort;
}

bool ConnectPacing::MayAttempt(const Target& target, Clock::time_point now) const {
  return WindowLeft(target, now).count() == 0;
}

std::chrono::milliseconds ConnectPacing::WindowLeft(const Target& target,
                                                    Clock::time_point now) const {
  if (ceiling_.count() == 0) {
    return std::chrono::milliseconds(0);
  }
  const std::lock_guard<std::mutex> lock(mutex_);
  const auto found = windows_.find(Key(target));
  if (found == windows_.end() || now >= found->second.end) {
    return std::chrono::milliseconds(0);
  }
  return std::chrono::ceil<std::chrono::milliseconds>(found->second.end - now);
}

void ConnectPacing::Failed(const Target& target, Clock::time_point now) {
  if (ceiling_.count() == 0) {
    return;
  }
  const std::lock_guard<std::mutex> lock(mutex_);
  const auto [entry, added] = windows_.try_emplace(Key(target));
  Window& window = entry->second;
  // A target nobody tried for a whole ceiling after its window is taken as
  // new, so the table never has to remember a target for long.
  const bool fresh = added || now >= window.end + ceiling_;
  window.length = fresh ? std::min(kFirstWindow, ceiling_) : std::min(window.length * 2, ceiling_);
  window.end = now + window.length;
  if (windows_.size() >= sweepAt_) {
    DropExpired(now);
  }
}

void ConnectPacing::Succeeded(const Target& target) {
  if (ceiling_.count() == 0) {
    return;
  }
  const std::lock_guard<std::mutex> lock(mutex_);
  windows_.erase(Key(target));
}

std::size_t ConnectPacing::Remembered() const {
  const std::lock_guard<std::mutex> lock(mutex_);
  return windows_.size();
}

void ConnectPacing::DropExpired(Clock::time_point now) {
  for (auto entry = windows_.begin(); entry != windows_.end();) {
    entry = now >= entry->second.end + ceiling_ ? windows_.erase(entry) : std::next(entry);
  }
  sweepAt_ = std::max(kFirstSweep, windows_.size() * 2);
}
