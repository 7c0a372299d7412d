// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <vector>

namespace velthost {

// What one run of velt-host does.
enum class Action {
  kConsole,  // the console, interactive or scripted (stdin or -c)
  kXml,      // print the plug-in's inflated description
  kInfo,     // print the information text of a new instance
  kDemo,     // run the self-contained demo
  kHelp,
  kVersion,
};

// One driver instance to create: its configuration string given on the
// command line, or the file that holds it.
struct ChannelSource {
  std::string text;  // the configuration string, or the file's path
  bool fromFile = false;
};

// The command line, checked. Empty paths mean the defaults.
struct HostOptions {
  Action action = Action::kConsole;
  std::string pluginPath;
  std::string storagePath;
  // In command-line order; names[i] is the identity of channels[i].
  std::vector<ChannelSource> channels;
  std::vector<std::string> names;
  // -c commands in order; run instead of reading standard input when any.
  std::vector<std::string> commands;
  bool quiet = false;
  // The longest back-off between connect attempts to a refusing peer; none
  // keeps the host's default.
  std::optional<std::chrono::milliseconds> connectBackoff;
};

}  // namespace velthost
