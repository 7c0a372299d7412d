// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <optional>
#include <string>
#include <vector>

#include "velt-peer/FileDescriptor.h"
#include "velt-peer/FrameCutter.h"
#include "velt-peer/ServiceContext.h"

namespace veltpeer {

// Serves one accepted TCP client: cuts what arrives into frames, echoes and
// emits, and ends the connection the way the options ask (the client leaves,
// a reset after N frames or M ms, or the simulator's own end).
class TcpConnection {
 public:
  enum class Outcome {
    kNextClient,  // the connection is over; accept the next client
    kEnd,         // the simulator is done (stopped, expired or exit limit)
  };

  TcpConnection(ServiceContext& context, FileDescriptor socket);

  // Runs until the connection is over; the socket is closed on return and the
  // matching kClosed or kReset event has been reported.
  Outcome Serve();

 private:
  using Clock = StopSignal::Clock;
  using Step = std::optional<Outcome>;

  Clock::time_point NextDeadline() const;
  Step ReadOnce();
  Step HandleFrames(const std::vector<std::string>& frames);
  Step EmitOne();
  Step Write(const std::string& frame);
  Step AfterFrame();
  Clock::time_point GapEnd() const;

  // The three ways the socket is closed: the client is gone or failed; an
  // orderly close by the simulator; an abortive close (reset).
  Outcome Lost();
  Outcome Finish();
  Outcome Abort(Outcome outcome);

  ServiceContext& context_;
  FileDescriptor socket_;
  FrameCutter cutter_;
  std::vector<char> buffer_;
  std::uint64_t frames_ = 0;
  Clock::time_point closeAt_ = Clock::time_point::max();
  Clock::time_point lastReceipt_{};
};

}  // namespace veltpeer
