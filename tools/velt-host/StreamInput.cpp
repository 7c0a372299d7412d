// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/StreamInput.h"

#include <unistd.h>

#include <array>
#include <cerrno>
#include <utility>

namespace velthost {

namespace {

constexpr std::size_t kReadBytes = 16384;

// Ends a .watch at the end of the stream; input that arrives meanwhile is
// kept for the lines after the watch, as much as the input holds.
class StreamWatchEnd final : public WatchEnd {
 public:
  StreamWatchEnd(StreamInput& input, StopSignals& signals) : input_(input), signals_(signals) {}

  Event Wait(std::chrono::milliseconds timeout) override {
    if (input_.Ended() || input_.Full()) {
      // Nothing more is read while a full buffer waits for the console.
      if (signals_.Wait(-1, timeout) == StopSignals::Event::kSignal) {
        return Event::kSignal;
      }
      return input_.Ended() ? Event::kInputEnded : Event::kNone;
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

LineInput::Read StreamInput::Next(std::string& line) {
  for (;;) {
    if (signals_.Raised()) {
      return Read::kEnded;
    }
    const std::size_t newline = pending_.find('\n', scanned_);
    if (newline != std::string::npos) {
      line.assign(pending_, 0, newline);
      pending_.erase(0, newline + 1);
      scanned_ = 0;
      break;
    }
    scanned_ = pending_.size();
    if (Full()) {
      // Longer than any line taken, even with a carriage return.
      dropping_ = true;
      pending_.clear();
      scanned_ = 0;
    }
    if (ended_) {
      if (pending_.empty() && !dropping_) {
        return Read::kEnded;
      }
      line.swap(pending_);
      pending_.clear();
      scanned_ = 0;
      break;
    }
    Fill(std::chrono::milliseconds(-1));
  }
  if (!line.empty() && line.back() == '\r') {
    line.pop_back();
  }
  if (std::exchange(dropping_, false) || line.size() > kLongestLine) {
    line.clear();
    return Read::kTooLong;
  }
  return Read::kLine;
}

std::unique_ptr<WatchEnd> StreamInput::BeginWatch() {
  return std::make_unique<StreamWatchEnd>(*this, signals_);
}

}  // namespace velthost
