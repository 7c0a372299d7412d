// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <string>

#include "velt-peer/ServiceContext.h"

namespace veltpeer {

// The TCP side of the simulator: accepts clients on the listening socket one
// after another and serves each until it leaves, then waits for the next.
class TcpService {
 public:
  TcpService(ServiceContext& context, int listener);

  // Runs until the simulator is stopped, expires or reaches its exit limit
  // (empty result), or accepting fails for good (the reason).
  std::string Run();

 private:
  ServiceContext& context_;
  const int listener_;
};

}  // namespace veltpeer
