// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The interactive console in a pseudo-terminal: banner, prompt, line
// editing with history, .watch ended by a key, and the ways out. Keys are
// typed once the prompt shows, as a person types them.

#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "ScratchFolder.h"
#include "TerminalProcess.h"

namespace {

const std::string kConfig =
    "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=9";
const std::string kUpArrow = "\x1b[A";

std::vector<std::string> Arguments(const ScratchFolder& scratch) {
  return {"--storage", scratch.File("storage.ini"), "--config", kConfig};
}

}  // namespace

TEST(Terminal, PromptCommandReplyAndHistoryRecall) {
  ScratchFolder scratch;
  TerminalProcess terminal(Arguments(scratch));
  ASSERT_TRUE(terminal.Started());
  ASSERT_TRUE(terminal.WaitFor("velt-host 1.0.0: plug-in ")) << terminal.Screen();
  ASSERT_TRUE(terminal.WaitFor("instances: VELT\r\n")) << terminal.Screen();
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type("get_stat\r");
  ASSERT_TRUE(terminal.WaitFor("Disconnected\r\n")) << terminal.Screen();
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type(kUpArrow);
  ASSERT_TRUE(terminal.WaitFor("get_stat")) << terminal.Screen();
  terminal.Type("\r");
  ASSERT_TRUE(terminal.WaitFor("Disconnected\r\n")) << terminal.Screen();
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type(".quit\r");
  EXPECT_EQ(terminal.Wait(), std::optional<int>(0)) << terminal.Screen();
}

TEST(Terminal, QuietLeavesOutTheBanner) {
  ScratchFolder scratch;
  std::vector<std::string> arguments = Arguments(scratch);
  arguments.emplace_back("-q");
  TerminalProcess terminal(arguments);
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  EXPECT_EQ(terminal.Screen().find("velt-host 1.0.0"), std::string::npos) << terminal.Screen();
  terminal.Type("\x04");
  EXPECT_EQ(terminal.Wait(), std::optional<int>(0)) << terminal.Screen();
}

TEST(Terminal, KeyEndsAWatch) {
  ScratchFolder scratch;
  TerminalProcess terminal(Arguments(scratch));
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type(".watch\r");
  ASSERT_TRUE(terminal.WaitFor("watching VELT: press a key to stop\r\n")) << terminal.Screen();
  terminal.Type("x");
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type("get_stat\r");
  ASSERT_TRUE(terminal.WaitFor("Disconnected\r\n")) << terminal.Screen();
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type("\x04");
  EXPECT_EQ(terminal.Wait(), std::optional<int>(0)) << terminal.Screen();
}

TEST(Terminal, ControlCEndsTheSession) {
  ScratchFolder scratch;
  TerminalProcess terminal(Arguments(scratch));
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type("get_st");
  terminal.Type("\x03");
  EXPECT_EQ(terminal.Wait(), std::optional<int>(0)) << terminal.Screen();
}

TEST(Terminal, FailedCommandEndsWithOne) {
  ScratchFolder scratch;
  TerminalProcess terminal(Arguments(scratch));
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type(".use Nobody\r");
  ASSERT_TRUE(terminal.WaitFor("velt-host: no instance named 'Nobody'\r\n")) << terminal.Screen();
  ASSERT_TRUE(terminal.WaitFor("VELT> ")) << terminal.Screen();
  terminal.Type("\x04");
  EXPECT_EQ(terminal.Wait(), std::optional<int>(1)) << terminal.Screen();
}
