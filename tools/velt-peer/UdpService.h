// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>
#include <vector>

#include "velt-peer/Endpoint.h"
#include "velt-peer/FrameCutter.h"
#include "velt-peer/ServiceContext.h"

namespace veltpeer {

// The UDP side of the simulator: every datagram is cut into frames on its
// own; echoes go back to the datagram's sender; emitted tokens go to the
// fixed destination or, without one, to the sender of the last datagram.
class UdpService {
 public:
  UdpService(ServiceContext& context, int socket, const Endpoint& fixedDestination);

  // Runs until the simulator is stopped, expires or reaches its exit limit.
  void Run();

 private:
  // Each returns false when the simulator is done.
  bool ReceiveOne();
  bool HandleFrame(const std::string& frame);
  bool Echo(const std::string& frame);
  bool EmitOne();
  const Endpoint& Destination() const;

  ServiceContext& context_;
  const int socket_;
  const Endpoint fixedDestination_;
  Endpoint lastSender_;
  FrameCutter cutter_;
  std::vector<char> buffer_;
};

}  // namespace veltpeer
