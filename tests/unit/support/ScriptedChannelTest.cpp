// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "ScriptedChannel.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

const char kConfig[] = "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=5000";

std::string Command(Protocol_VELT& protocol, const std::string& command) {
  std::vector<char> output(256, '\0');
  protocol.DoCommand(command.c_str(), output.data(), static_cast<int>(output.size()) - 1);
  return output.data();
}

TEST(ScriptedChannel, BindsConfiguresAndStartsTheChannel) {
  ScriptedChannel channel(kConfig, true);
  EXPECT_TRUE(channel.Bound());
  EXPECT_TRUE(channel.Configured());
  ASSERT_NE(channel.Sockets().Last(), nullptr);
  EXPECT_EQ(channel.Sockets().Last()->Tcp(), 0);
  // Started: reads are served.
  unsigned char count[4] = {0xFF, 0xFF, 0xFF, 0xFF};
  ITag* const tag = channel.Protocol().CreateTag("?tokens_available?unsignedInt");
  ASSERT_NE(tag, nullptr);
  EXPECT_TRUE(channel.Protocol().Read(tag, count));
  EXPECT_EQ(count[0], 0);
}

TEST(ScriptedChannel, LeavesTheChannelStoppedWhenAsked) {
  ScriptedChannel channel(kConfig, false);
  EXPECT_TRUE(channel.Configured());
  EXPECT_EQ(channel.Sockets().Last(), nullptr);
  unsigned char count[4] = {};
  ITag* const tag = channel.Protocol().CreateTag("?tokens_available?unsignedInt");
  ASSERT_NE(tag, nullptr);
  EXPECT_FALSE(channel.Protocol().Read(tag, count));
  EXPECT_EQ(channel.Protocol().GetLastError(), -3);
}

TEST(ScriptedChannel, ReportsARefusedConfiguration) {
  ScriptedChannel channel("CfgVer=1 socketType=UDP", true);
  EXPECT_TRUE(channel.Bound());
  EXPECT_FALSE(channel.Configured());
  EXPECT_EQ(channel.Sockets().Last(), nullptr);
}

TEST(ScriptedChannel, QueuesReceivedTokensAsTheWorkerDoes) {
  ScriptedChannel channel(kConfig + std::string(" hex_tokens=true token_queue_size=2"), true);
  channel.Receive("\x0A\xFF");
  channel.Receive("B");
  channel.Receive("C");
  EXPECT_EQ(Command(channel.Protocol(), "tokens_available"), "2");
  // The oldest was dropped at the bound; tokens are kept as hex text.
  EXPECT_EQ(Command(channel.Protocol(), "get"), "42");
}

}  // namespace

TEST(ScriptedChannel, ConnectRunsThePassesThatConnectTheChannel) {
  ScriptedChannel channel(kConfig, true);
  ScriptedSocket& socket = channel.Connect();
  EXPECT_EQ(&socket, channel.Sockets().Last());
  EXPECT_TRUE(channel.Protocol().isConnected());
  EXPECT_EQ(socket.Connects().size(), 1U);
  // From then on the socket keeps no records.
  const std::size_t receives = socket.Receives().size();
  channel.Protocol().Task();
  EXPECT_EQ(socket.Receives().size(), receives);
}
