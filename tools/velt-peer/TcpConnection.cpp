// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/TcpConnection.h"

#include <poll.h>
#include <sys/ioctl.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <utility>

#ifdef __linux__
#include <linux/sockios.h>
#endif

namespace veltpeer {

namespace {

constexpr std::size_t kReadSize = 65536;
// How long an abortive close waits for the frames sent so far to be taken by
// the client, so that the reset follows them instead of discarding them.
constexpr int kAbortFlushMs = 1000;
// Bound on the reads that drain unread input before an orderly close.
constexpr int kDrainReads = 64;

}  // namespace

TcpConnection::TcpConnection(ServiceContext& context, FileDescriptor socket)
    : context_(context),
      socket_(std::move(socket)),
      cutter_(context.options.rxPrefix, context.options.rxSuffix),
      buffer_(kReadSize) {}

TcpConnection::Outcome TcpConnection::Serve() {
  const Clock::time_point accepted = Clock::now();
  lastReceipt_ = accepted;
  if (context_.options.closeAfterMs > 0) {
    closeAt_ = accepted + std::chrono::milliseconds(context_.options.closeAfterMs);
  }
  if (context_.emitter.Active()) {
    context_.emitter.Begin(accepted);
  }
  for (;;) {
    const WaitResult waited = context_.stop.Wait(socket_.Get(), POLLIN, NextDeadline());
    if (waited == WaitResult::kStopped) {
      return Finish();
    }
    if (waited == WaitResult::kReady) {
      if (const Step step = ReadOnce()) {
        return *step;
      }
    }
    const Clock::time_point now = Clock::now();
    if (cutter_.HasOpenFrame() && now >= GapEnd()) {
      std::vector<std::string> frames;
      cutter_.Flush(frames);
      if (const Step step = HandleFrames(frames)) {
        return *step;
      }
    }
    if (now >= context_.emitter.Due()) {
      if (const Step step = EmitOne()) {
        return *step;
      }
    }
    if (now >= closeAt_) {
      return Abort(Outcome::kNextClient);
    }
  }
}

TcpConnection::Clock::time_point TcpConnection::NextDeadline() const {
  Clock::time_point deadline = std::min(closeAt_, context_.emitter.Due());
  if (cutter_.HasOpenFrame()) {
    deadline = std::min(deadline, GapEnd());
  }
  return deadline;
}

TcpConnection::Clock::time_point TcpConnection::GapEnd() const {
  return lastReceipt_ + std::chrono::milliseconds(context_.options.gapMs);
}

TcpConnection::Step TcpConnection::ReadOnce() {
  const ssize_t received = ::recv(socket_.Get(), buffer_.data(), buffer_.size(), 0);
  std::vector<std::string> frames;
  if (received > 0) {
    lastReceipt_ = Clock::now();
    context_.activity.BytesReceived(static_cast<std::size_t>(received));
    cutter_.Feed(buffer_.data(), static_cast<std::size_t>(received), frames);
    return HandleFrames(frames);
  }
  if (received == 0) {
    // The client will send no more; a frame that only silence would end is
    // complete now. The client may still read, so it still gets its echo.
    cutter_.Flush(frames);
    if (const Step step = HandleFrames(frames)) {
      return step;
    }
    return Lost();
  }
  if (errno == EAGAIN || errno == EWOULDBLOCK || errno == EINTR) {
    return std::nullopt;
  }
  return Lost();
}

TcpConnection::Step TcpConnection::HandleFrames(const std::vector<std::string>& frames) {
  for (const std::string& frame : frames) {
    context_.activity.FrameReceived(frame);
    if (context_.options.echo) {
      if (const Step step = Write(frame)) {
        return step;
      }
    }
    if (const Step step = AfterFrame()) {
      return step;
    }
  }
  return std::nullopt;
}

TcpConnection::Step TcpConnection::EmitOne() {
  const std::string token = context_.emitter.Next();
  if (const Step step = Write(token)) {
    return step;
  }
  return AfterFrame();
}

TcpConnection::Step TcpConnection::Write(const std::string& frame) {
  switch (context_.writer.WriteStream(socket_.Get(), frame)) {
    case FrameWriter::Result::kWritten:
      context_.activity.FrameSent(frame);
      return std::nullopt;
    case FrameWriter::Result::kStopped:
      return Finish();
    case FrameWriter::Result::kFailed:
      break;
  }
  return Lost();
}

TcpConnection::Step TcpConnection::AfterFrame() {
  ++frames_;
  const bool exit = context_.CountHandled();
  const std::uint64_t limit = context_.options.closeAfterFrames;
  if (limit != 0 && frames_ >= limit) {
    return Abort(exit ? Outcome::kEnd : Outcome::kNextClient);
  }
  if (exit) {
    return Finish();
  }
  return std::nullopt;
}

TcpConnection::Outcome TcpConnection::Lost() {
  socket_.Reset();
  context_.activity.Announce(PeerEvent::Kind::kClosed);
  return Outcome::kNextClient;
}

TcpConnection::Outcome TcpConnection::Finish() {
  const int fd = socket_.Get();
  ::shutdown(fd, SHUT_WR);
  // Unread input would turn the close into a reset, which may cost the client
  // the last frames sent; read and discard what is already there.
  for (int i = 0; i < kDrainReads; ++i) {
    const ssize_t received = ::recv(fd, buffer_.data(), buffer_.size(), MSG_DONTWAIT);
    if (received <= 0) {
      break;
    }
    context_.activity.BytesReceived(static_cast<std::size_t>(received));
  }
  socket_.Reset();
  context_.activity.Announce(PeerEvent::Kind::kClosed);
  return Outcome::kEnd;
}

TcpConnection::Outcome TcpConnection::Abort(Outcome outcome) {
  const int fd = socket_.Get();
#ifdef SIOCOUTQ
  for (int waited = 0; waited < kAbortFlushMs; ++waited) {
    int unsent = 0;
    if (::ioctl(fd, SIOCOUTQ, &unsent) != 0 || unsent == 0) {
      break;
    }
    if (!context_.stop.SleepFor(std::chrono::milliseconds(1))) {
      break;
    }
  }
#endif
  // A zero linger time makes close send a reset instead of an orderly end.
  const linger abortive{1, 0};
  ::setsockopt(fd, SOL_SOCKET, SO_LINGER, &abortive, sizeof abortive);
  socket_.Reset();
  context_.activity.Announce(PeerEvent::Kind::kReset);
  return outcome;
}

}  // namespace veltpeer
