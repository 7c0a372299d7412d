// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include "velt-host/SingleKeys.h"
#include "velt-host/StopSignals.h"
#include "velt-host/WatchEnd.h"

namespace velthost {

// Ends a .watch when a key is pressed on the terminal at fd: for its life
// the terminal delivers single keys without echo (signals such as Ctrl-C
// still work); the previous settings come back when it goes. The key itself
// is taken and dropped.
class KeyWatchEnd final : public WatchEnd {
 public:
  KeyWatchEnd(int fd, StopSignals& signals);
  Event Wait(std::chrono::milliseconds timeout) override;

 private:
  int fd_;
  StopSignals& signals_;
  SingleKeys keys_;
  bool ended_ = false;
};

}  // namespace velthost
