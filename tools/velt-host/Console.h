// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <memory>
#include <string>
#include <vector>

#include "velt-host/ConsoleOutput.h"
#include "velt-host/Instance.h"
#include "velt-host/LineInput.h"

namespace velthost {

// The console: passes every line that does not start with "." to the current
// instance's own console (DoCommand) and prints the reply; answers the
// host's dot commands itself:
//   .help  .list  .use NAME  .read URI  .write URI VALUE  .watch [N]  .quit
// Any failure (a driver command that returns false, a failed .read or
// .write, an unknown dot command or instance) is reported on standard error
// and remembered, so the run ends with status 1.
class Console {
 public:
  // The help of the dot commands, one line each.
  static const char* HelpText();

  // The first instance, if any, is the current one.
  Console(const std::vector<std::unique_ptr<Instance>>& instances, ConsoleOutput& output,
          LineInput& input);

  // Runs lines from the input until it ends, a stop signal arrives or
  // .quit.
  void RunAll();
  // Runs one line; false when it failed.
  bool Run(const std::string& line);

  // "NAME> " for the current instance, "velt-host> " without one.
  std::string Prompt() const;
  Instance* Current() const { return current_; }
  bool Failed() const { return failed_; }
  bool QuitRequested() const { return quit_; }

 private:
  bool RunDriverCommand(const std::string& line);
  bool RunDotCommand(const std::string& line);
  bool Help(const std::string& argument);
  bool List(const std::string& argument);
  bool Use(const std::string& argument);
  bool Read(const std::string& argument);
  bool Write(const std::string& argument);
  bool Watch(const std::string& argument);
  bool Quit(const std::string& argument);
  bool NeedInstance();
  bool Fail(const std::string& text);
  std::string ListLine(Instance& instance, std::size_t nameWidth);

  const std::vector<std::unique_ptr<Instance>>& instances_;
  ConsoleOutput& output_;
  LineInput& input_;
  Instance* current_ = nullptr;
  bool failed_ = false;
  bool quit_ = false;
};

}  // namespace velthost
