// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host's own commands: typed .read and .write, .list, .use and .watch,
// through scripted standard input and through -c.

#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "HostProcess.h"
#include "LoopbackPeer.h"
#include "ScratchFolder.h"

namespace {

using Line = std::optional<std::string>;

LoopbackPeer::Setup Emitting(std::uint64_t tokens) {
  LoopbackPeer::Setup setup;
  setup.emit = tokens;
  return setup;
}

// A UDP channel to the discard port: it starts and answers, nothing more.
const std::string kUdpConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";

}  // namespace

TEST(DotCommands, ReadAndWriteAreTypedAsTheirTags) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kUdpConfig},
                       ".read ?SP_RemoteIP?string-16\n"
                       ".read ?SP_RemotePort?unsignedShort\n"
                       ".write ?SP_RemotePort?unsignedShort 0x1F90\n"
                       ".read ?SP_RemotePort?unsignedShort\n"
                       ".write ?SP_RxPrefix?string-8 0d0A\n"
                       ".read ?SP_RxPrefix?string-8\n"
                       ".read ?SP_HexTokens?boolean\n"
                       ".write ?SP_HexTokens?boolean true\n"
                       ".read ?SP_HexTokens?boolean\n"
                       ".write ?SP_TokenQueueSize?unsignedInt 20000\n"
                       ".read ?SP_TokenQueueSize?unsignedInt\n"
                       ".read ?conn_stat?boolean\n"
                       ".read ?tokens_available?unsignedInt\n");
  EXPECT_EQ(result.out, "127.0.0.1\n9\n8080\n0d0A\n0\n1\n20000\n0\n0\n");
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(DotCommands, WriteErrorsAreReportedAndFailTheRun) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kUdpConfig},
                       ".write ?SP_SocketType?string-8 udp\n"
                       ".write ?SP_Gap?unsignedInt ten\n"
                       ".write ?tokens_available?unsignedInt 1\n"
                       ".write ?SP_Gap?unsignedInt\n"
                       ".read ?SP_Gap?float\n"
                       ".read ?SP_Gap?unsignedInt\n");
  EXPECT_EQ(result.out, "0\n");
  EXPECT_EQ(result.err,
            "velt-host: cannot write ?SP_SocketType?string-8: illegal socket type\n"
            "velt-host: bad unsignedInt value 'ten' (a decimal or 0x hex number from 0 to "
            "4294967295 expected)\n"
            "velt-host: cannot write ?tokens_available?unsignedInt: writing to read_only type\n"
            "velt-host: usage: .write URI VALUE\n"
            "velt-host: Tag URI error: ?SP_Gap?float - not allowed tavu type\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(DotCommands, ListShowsTheInstancesAndUseSwitches) {
  ScratchFolder scratch;
  LoopbackPeer peer(LoopbackPeer::Setup{});
  ASSERT_TRUE(peer.Ok()) << peer.StartError();
  const std::string tcp = "TCP 127.0.0.1:" + std::to_string(peer.Port());
  HostProcess host({"--storage", scratch.File("storage.ini"), "--config", peer.Config(), "--ident",
                    "Line1", "--config", kUdpConfig});
  host.Send(".list\n");
  EXPECT_EQ(host.ReadLine(), Line("* Line1 " + tcp + " disconnected"));
  EXPECT_EQ(host.ReadLine(), Line("  VELT2 UDP 127.0.0.1:9 disconnected"));
  host.Send(".write ?connect?boolean 1\n");
  EXPECT_TRUE(host.AskUntil(".read ?conn_stat?boolean", "1"));
  host.Send(".use VELT2\n.list\n");
  EXPECT_EQ(host.ReadLine(), Line("  Line1 " + tcp + " connected"));
  EXPECT_EQ(host.ReadLine(), Line("* VELT2 UDP 127.0.0.1:9 disconnected"));
  EXPECT_EQ(host.Ask(".read ?SP_SocketType?string-8"), Line("UDP"));
  EXPECT_EQ(host.Ask("get_stat"), Line("Disconnected"));
  host.Send(".use  Line1 \n");
  EXPECT_EQ(host.Ask("get_stat"), Line("Connected"));
  host.CloseInput();
  EXPECT_EQ(host.ReadOutput(), "");
  EXPECT_EQ(host.ReadErrors(), "");
  EXPECT_EQ(host.Wait(), std::optional<int>(0));
}

TEST(DotCommands, WatchPrintsEachTokenAndAcknowledgesIt) {
  ScratchFolder scratch;
  LoopbackPeer peer(Emitting(3));
  ASSERT_TRUE(peer.Ok()) << peer.StartError();
  HostProcess host({"--storage", scratch.File("storage.ini"), "--config", peer.Config()});
  host.Send("connect ON\n");
  EXPECT_EQ(host.ReadLine(), Line("OK"));
  host.Send(".watch 3\n");
  EXPECT_EQ(host.ReadLine(), Line("tok 1"));
  EXPECT_EQ(host.ReadLine(), Line("tok 2"));
  EXPECT_EQ(host.ReadLine(), Line("tok 3"));
  EXPECT_EQ(host.Ask(".read ?tokens_available?unsignedInt"), Line("0"));
  host.Send(".write ?tx_token?string-20 back  again\n.watch 1\n");
  EXPECT_EQ(host.ReadLine(), Line("back  again"));
  EXPECT_EQ(host.Ask("tokens_available"), Line("0"));
  host.CloseInput();
  EXPECT_EQ(host.ReadErrors(), "");
  EXPECT_EQ(host.Wait(), std::optional<int>(0));
}

TEST(DotCommands, WatchEscapesBytesThatAreNotPrintable) {
  ScratchFolder scratch;
  LoopbackPeer::Setup setup = Emitting(1);
  setup.payload = "a\\b\x01\x7f";
  setup.numbered = false;
  LoopbackPeer peer(setup);
  ASSERT_TRUE(peer.Ok()) << peer.StartError();
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", peer.Config(), "-c",
                        "connect ON", "-c", ".watch 1", "-c", "tokens_available"});
  EXPECT_EQ(result.out, "OK\na\\\\b\\x01\\x7F\n0\n");
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(DotCommands, WatchWithoutCountEndsAtTheEndOfInput) {
  ScratchFolder scratch;
  LoopbackPeer peer(Emitting(2));
  ASSERT_TRUE(peer.Ok()) << peer.StartError();
  HostProcess host({"--storage", scratch.File("storage.ini"), "--config", peer.Config()});
  host.Send("connect ON\n.watch\n");
  EXPECT_EQ(host.ReadLine(), Line("OK"));
  EXPECT_EQ(host.ReadLine(), Line("tok 1"));
  EXPECT_EQ(host.ReadLine(), Line("tok 2"));
  // Lines typed during the watch wait for it to end.
  host.Send("get_stat\n");
  EXPECT_EQ(host.ReadLine(std::chrono::milliseconds(300)), std::nullopt);
  host.CloseInput();
  EXPECT_EQ(host.ReadOutput(), "Connected\n");
  EXPECT_EQ(host.ReadErrors(), "");
  EXPECT_EQ(host.Wait(), std::optional<int>(0));
}

TEST(DotCommands, CommandsFromTheCommandLineRunInOrder) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kUdpConfig, "-q",
                        "-c", ".write ?SP_Gap?unsignedInt 12", "-c", ".read ?SP_Gap?unsignedInt",
                        "-c", "", "-c", "get_stat", "-c", ".quit", "-c", "tokens_available"},
                       "get_stat\n");
  EXPECT_EQ(result.out, "12\nDisconnected\n");
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(DotCommands, HelpListsTheHostCommands) {
  const HostProcess::Result result = HostProcess::Run({"-c", ".help"});
  EXPECT_EQ(result.out.rfind(".help                 list these commands\n"
                             ".list                 the instances: name, socket type, remote "
                             "address:port, connection state; the current one marked with *\n",
                             0),
            0U);
  EXPECT_NE(result.out.find("\n.quit                 stop everything and exit\n"),
            std::string::npos);
  EXPECT_EQ(result.status, std::optional<int>(0));
}
