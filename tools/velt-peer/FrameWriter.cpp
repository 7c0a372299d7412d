// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/FrameWriter.h"

#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <chrono>

namespace veltpeer {

namespace {

bool WouldBlock(int error) { return error == EAGAIN || error == EWOULDBLOCK; }

}  // namespace

FrameWriter::FrameWriter(const PeerOptions& options, const StopSignal& stop)
    : options_(options), stop_(stop) {}

FrameWriter::Result FrameWriter::WriteStream(int fd, const std::string& frame) const {
  if (!Delay()) {
    return Result::kStopped;
  }
  std::size_t offset = 0;
  while (offset < frame.size()) {
    if (offset > 0 && !PauseBetweenPieces()) {
      return Result::kStopped;
    }
    const std::size_t piece = PieceSize(frame.size() - offset);
    const Result result = SendAll(fd, frame.data() + offset, piece);
    if (result != Result::kWritten) {
      return result;
    }
    offset += piece;
  }
  return Result::kWritten;
}

FrameWriter::Result FrameWriter::WriteDatagram(int fd, const std::string& frame,
                                               const Endpoint& destination) const {
  if (!Delay()) {
    return Result::kStopped;
  }
  std::size_t offset = 0;
  do {
    if (offset > 0 && !PauseBetweenPieces()) {
      return Result::kStopped;
    }
    const std::size_t piece = PieceSize(frame.size() - offset);
    const Result result = SendDatagram(fd, frame.data() + offset, piece, destination);
    if (result != Result::kWritten) {
      return result;
    }
    offset += piece;
  } while (offset < frame.size());
  return Result::kWritten;
}

bool FrameWriter::Delay() const {
  return stop_.SleepFor(std::chrono::milliseconds(options_.delayMs));
}

bool FrameWriter::PauseBetweenPieces() const {
  return stop_.SleepFor(std::chrono::milliseconds(options_.chunkDelayMs));
}

std::size_t FrameWriter::PieceSize(std::size_t left) const {
  return options_.chunkBytes == 0 ? left : std::min(left, options_.chunkBytes);
}

FrameWriter::Result FrameWriter::SendAll(int fd, const char* data, std::size_t size) const {
  while (size > 0) {
    const ssize_t sent = ::send(fd, data, size, MSG_NOSIGNAL);
    if (sent >= 0) {
      data += sent;
      size -= static_cast<std::size_t>(sent);
      continue;
    }
    if (errno == EINTR) {
      continue;
    }
    if (!WouldBlock(errno)) {
      return Result::kFailed;
    }
    if (stop_.Wait(fd, POLLOUT, StopSignal::Clock::time_point::max()) == WaitResult::kStopped) {
      return Result::kStopped;
    }
  }
  return Result::kWritten;
}

FrameWriter::Result FrameWriter::SendDatagram(int fd, const char* data, std::size_t size,
                                              const Endpoint& destination) const {
  for (;;) {
    const ssize_t sent =
        ::sendto(fd, data, size, MSG_NOSIGNAL, destination.Address(), destination.Length());
    if (sent >= 0) {
      return Result::kWritten;
    }
    if (errno == EINTR) {
      continue;
    }
    if (!WouldBlock(errno)) {
      return Result::kFailed;
    }
    if (stop_.Wait(fd, POLLOUT, StopSignal::Clock::time_point::max()) == WaitResult::kStopped) {
      return Result::kStopped;
    }
  }
}

}  // namespace veltpeer
