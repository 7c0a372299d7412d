// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>

#include "velt-host/LineInput.h"
#include "velt-host/StopSignals.h"

namespace velthost {

// The console input of the demo, which runs its commands itself: there are
// no lines to read, and a .watch ends on its count or a stop signal only.
class DemoInput final : public LineInput {
 public:
  explicit DemoInput(StopSignals& signals) : signals_(signals) {}

  Read Next(std::string& /*line*/) override { return Read::kEnded; }
  std::unique_ptr<WatchEnd> BeginWatch() override;
  bool KeyEndsWatch() const override { return false; }

 private:
  StopSignals& signals_;
};

}  // namespace velthost
