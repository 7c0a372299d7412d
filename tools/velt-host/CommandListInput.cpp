// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/CommandListInput.h"

#include <utility>

namespace velthost {

CommandListInput::CommandListInput(std::vector<std::string> commands, StopSignals& signals,
                                   std::unique_ptr<LineInput> standardInput)
    : commands_(std::move(commands)), signals_(signals), standardInput_(std::move(standardInput)) {}

bool CommandListInput::Next(std::string& line) {
  if (signals_.Raised() || next_ == commands_.size()) {
    return false;
  }
  line = commands_[next_++];
  return true;
}

}  // namespace velthost
