// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "velt-peer/Endpoint.h"
#include "velt-peer/PeerOptions.h"
#include "velt-peer/StopSignal.h"

namespace veltpeer {

// Sends frames the way an awkward device would: after the reply delay and,
// when chunking is on, in pieces with a pause between them. Every wait gives
// way to the stop signal.
class FrameWriter {
 public:
  enum class Result { kWritten, kFailed, kStopped };

  FrameWriter(const PeerOptions& options, const StopSignal& stop);

  // Writes the whole frame on a connected, non-blocking stream socket.
  Result WriteStream(int fd, const std::string& frame) const;
  // Sends the frame to the destination, one datagram per piece (an empty
  // frame is one empty datagram).
  Result WriteDatagram(int fd, const std::string& frame, const Endpoint& destination) const;

 private:
  bool Delay() const;
  bool PauseBetweenPieces() const;
  std::size_t PieceSize(std::size_t left) const;
  Result SendAll(int fd, const char* data, std::size_t size) const;
  Result SendDatagram(int fd, const char* data, std::size_t size,
                      const Endpoint& destination) const;

  const PeerOptions& options_;
  const StopSignal& stop_;
};

}  // namespace veltpeer
