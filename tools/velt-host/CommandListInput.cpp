// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/CommandListInput.h"

#include <utility>

namespace velthost {

CommandListInput::CommandListInput(std::vector<std::string> commands, StopSignals& signals,
                                   std::unique_ptr<LineInput> standardInput)
    : commands_(std::move(commands)), signals_(signals), standardInput_(std::move(standardInput)) {}

LineInput::Read CommandListInput::Next(std::string& line) {
  if (signals_.Raised() || next_ == commands_.size()) {
    return Read::kEnded;
  }
  const std::string& command = commands_[next_++];
  if (command.size() > kLongestLine) {
    return Read::kTooLong;
  }
  line = command;
  return Read::kLine;
}

}  // namespace velthost
