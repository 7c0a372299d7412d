// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdio>
#include <string>
#include <vector>

#include "HostSocket.h"
#include "velt-host/ConsoleOutput.h"
#include "velt-host/HostOptions.h"
#include "velt-host/StopSignals.h"

namespace velthost {

class PluginSession;

// velt-host from its command line to its exit status: 0 when every command
// succeeded, 1 when one failed or start-up failed, 2 for a bad command line.
class HostProgram {
 public:
  static constexpr int kSucceeded = 0;
  static constexpr int kFailed = 1;
  static constexpr int kBadCommandLine = 2;

  HostProgram(std::FILE* out, std::FILE* err) : out_(out), err_(err) {}

  int Run(const std::vector<std::string>& arguments);

 private:
  static int RunAction(const HostOptions& options, StopSignals& signals, ConsoleOutput& output);
  static int RunConsole(const HostOptions& options, StopSignals& signals, ConsoleOutput& output);
  static void WarnOfStoredSettings(PluginSession& session, const HostOptions& options,
                                   std::size_t instances, ConsoleOutput& output);
  static bool RunCommands(const HostOptions& options, StopSignals& signals, ConsoleOutput& output,
                          PluginSession& session, bool terminal);
  static int PrintXml(const std::string& pluginPath, ConsoleOutput& output);
  static int PrintInfo(const std::string& pluginPath, ConsoleOutput& output);
  static std::string PluginPath(const HostOptions& options);
  static std::string StoragePath(const HostOptions& options);
  static std::vector<std::string> ConfigStrings(const HostOptions& options);
  static HostSocket::Timeouts SocketTimeouts(const HostOptions& options);

  std::FILE* out_;
  std::FILE* err_;
};

}  // namespace velthost
