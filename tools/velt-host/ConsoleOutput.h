// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cstdio>
#include <string>

namespace velthost {

// Where the console writes: replies and values to standard output, errors to
// standard error as "velt-host: TEXT", and the console's own messages
// (banner, hints) to standard output unless quiet. Every write is flushed at
// once, so a program driving velt-host through pipes sees each reply as soon
// as it is made.
class ConsoleOutput {
 public:
  ConsoleOutput(std::FILE* out, std::FILE* err, bool quiet) : out_(out), err_(err), quiet_(quiet) {}

  // A reply as it stands, followed by a line feed unless it ends with one.
  void Reply(const std::string& text);
  // One line: text and a line feed.
  void Line(const std::string& text);
  void Error(const std::string& text);
  // A line of the console's own, left out when quiet.
  void Message(const std::string& text);
  bool Quiet() const { return quiet_; }

 private:
  static void Write(std::FILE* file, const std::string& text);

  std::FILE* out_;
  std::FILE* err_;
  bool quiet_;
};

}  // namespace velthost
