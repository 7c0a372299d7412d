// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/DemoInput.h"

namespace velthost {

namespace {

class SignalWatchEnd final : public WatchEnd {
 public:
  explicit SignalWatchEnd(StopSignals& signals) : signals_(signals) {}

  Event Wait(std::chrono::milliseconds timeout) override {
    return signals_.Wait(-1, timeout) == StopSignals::Event::kSignal ? Event::kSignal
                                                                     : Event::kNone;
  }

 private:
  StopSignals& signals_;
};

}  // namespace

std::unique_ptr<WatchEnd> DemoInput::BeginWatch() {
  return std::make_unique<SignalWatchEnd>(signals_);
}

}  // namespace velthost
