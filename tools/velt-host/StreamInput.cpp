// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/StreamInput.h"

#include <unistd.h>

#include <array>
#include <cerrno>

namespace velthost {

namespace {

constexpr std::size_t kReadBytes = 16384;

// Ends a .watch at the end of the stream; input that arrives meanwhile is
// kept for the lines after the watch.
class StreamWatchEnd final : public WatchEnd {
 public:
  StreamWatchEnd(StreamInput& input, StopSignals& signals) : input_(input), signals_(signals) {}

  Event Wait(std::chrono::milliseconds timeout) override {
    if (input_.Ended()) {
      return signals_.Wait(-1, timeout) == StopSignals::Event::kSignal ? Event::kSignal
                                                                       : Event::kInputEnded;
    }
    const StopSignals::Event event = input_.Fill(timeout);
    if (event == StopSignals::Event::kSignal) {
      return Event::kSignal;
    }
    return input_.Ended() ? Event::kInputEnded : Event::kNone;
  }

 private:
  StreamInput& input_;
  StopSignals& signals_;
};

}  // namespace

StopSignals::Event StreamInput::Fill(std::chrono::milliseconds timeout) {
  const StopSignals::Event event = signals_.Wait(fd_, timeout);
  if (event != StopSignals::Event::kInput) {
    return event;
  }
  std::array<char, kReadBytes> buffer{};
  const ssize_t received = ::read(fd_, buffer.data(), buffer.size());
  if (received > 0) {
    pending_.append(buffer.data(), static_cast<std::size_t>(received));
  } else if (received == 0 || (errno != EINTR && errno != EAGAIN)) {
    ended_ = true;
  }
  return event;
}

bool StreamInput::Next(std::string& line) {
  for (;;) {
    if (signals_.Raised()) {
      return false;
    }
    const std::size_t newline = pending_.find('\n');
    if (newline != std::string::npos) {
      line.assign(pending_, 0, newline);
      pending_.erase(0, newline + 1);
      break;
    }
    if (ended_) {
      if (pending_.empty()) {
        return false;
      }
      line.swap(pending_);
      pending_.clear();
      break;
    }
    Fill(std::chrono::milliseconds(-1));
  }
  if (!line.empty() && line.back() == '\r') {
    line.pop_back();
  }
  return true;
}

std::unique_ptr<WatchEnd> StreamInput::BeginWatch() {
  return std::make_unique<StreamWatchEnd>(*this, signals_);
}

}  // namespace velthost
