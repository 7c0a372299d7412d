// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>
#include <vector>

#include "velt-host/LineInput.h"
#include "velt-host/StopSignals.h"

namespace velthost {

// The -c commands, in order. Standard input is not read for commands; it
// still ends a .watch as it would in the console (a key on a terminal, the
// end of a pipe or file).
class CommandListInput final : public LineInput {
 public:
  CommandListInput(std::vector<std::string> commands, StopSignals& signals,
                   std::unique_ptr<LineInput> standardInput);

  Read Next(std::string& line) override;
  std::unique_ptr<WatchEnd> BeginWatch() override { return standardInput_->BeginWatch(); }
  bool KeyEndsWatch() const override { return standardInput_->KeyEndsWatch(); }

 private:
  std::vector<std::string> commands_;
  std::size_t next_ = 0;
  StopSignals& signals_;
  std::unique_ptr<LineInput> standardInput_;
};

}  // namespace velthost
