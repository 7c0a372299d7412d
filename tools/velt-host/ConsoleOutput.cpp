// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/ConsoleOutput.h"

namespace velthost {

// A console whose output is gone (a reader that went away, a full disk) has
// nowhere left to report that; the session goes on until its input ends.
void ConsoleOutput::Write(std::FILE* file, const std::string& text) {
  (void)std::fwrite(text.data(), 1, text.size(), file);
  (void)std::fflush(file);
}

void ConsoleOutput::Reply(const std::string& text) {
  Write(out_, !text.empty() && text.back() == '\n' ? text : text + "\n");
}

void ConsoleOutput::Line(const std::string& text) { Write(out_, text + "\n"); }

void ConsoleOutput::Error(const std::string& text) { Write(err_, "velt-host: " + text + "\n"); }

void ConsoleOutput::Message(const std::string& text) {
  if (!quiet_) {
    Line(text);
  }
}

}  // namespace velthost
