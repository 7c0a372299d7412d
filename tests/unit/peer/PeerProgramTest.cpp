// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/socket.h>

#include <chrono>
#include <optional>
#include <regex>
#include <string>
#include <thread>

#include "LoopbackTcpClient.h"
#include "LoopbackUdpSocket.h"
#include "PeerProcess.h"
#include "velt-peer/Endpoint.h"
#include "velt-peer/FileDescriptor.h"

using std::chrono::milliseconds;

namespace {

constexpr milliseconds kTimeout{10000};

// Reads the first line and takes the port from it; 0 when it does not have
// the announced form.
std::uint16_t AnnouncedPort(PeerProcess& process, const std::string& lead) {
  const std::optional<std::string> line = process.ReadLine(kTimeout);
  if (!line) {
    ADD_FAILURE() << "no first line";
    return 0;
  }
  const std::regex form(lead + R"( 127\.0\.0\.1:([0-9]+))");
  std::smatch match;
  if (!std::regex_match(*line, match, form)) {
    ADD_FAILURE() << "unexpected first line: " << *line;
    return 0;
  }
  return static_cast<std::uint16_t>(std::stoi(match[1].str()));
}

}  // namespace

TEST(PeerProgram, EmitsThreeTokensToAClientAndEndsOnSigterm) {
  PeerProcess process({"tcp", "--port", "0", "--emit", "3", "--rate", "0", "--prefix", "02",
                       "--suffix", "03", "--payload", "T{n}"});
  ASSERT_TRUE(process.Running());
  const std::uint16_t port = AnnouncedPort(process, "velt-peer: listening tcp");
  ASSERT_NE(port, 0);
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(port));
  EXPECT_EQ(client.Read(12, kTimeout), "\x02T1\x03\x02T2\x03\x02T3\x03");
  EXPECT_EQ(
      process.ReadLine(kTimeout),
      std::optional<std::string>("connected 127.0.0.1:" + std::to_string(client.LocalPort())));
  EXPECT_EQ(process.ReadLine(kTimeout), std::optional<std::string>("tx 02543103"));
  EXPECT_EQ(process.ReadLine(kTimeout), std::optional<std::string>("tx 02543203"));
  EXPECT_EQ(process.ReadLine(kTimeout), std::optional<std::string>("tx 02543303"));
  process.Signal(SIGTERM);
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(0));
  EXPECT_EQ(process.ReadLine(kTimeout), std::optional<std::string>("closed"));
  EXPECT_EQ(process.ReadLine(kTimeout), std::nullopt);
  EXPECT_EQ(process.ReadStderr(kTimeout), "");
}

TEST(PeerProgram, BadOptionExitsWithUsageErrorOnStderr) {
  PeerProcess process({"tcp", "--bogus"});
  ASSERT_TRUE(process.Running());
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(2));
  EXPECT_EQ(process.ReadStderr(kTimeout),
            "velt-peer: unknown option '--bogus'\nTry 'velt-peer --help'.\n");
  EXPECT_EQ(process.ReadLine(kTimeout), std::nullopt);
}

TEST(PeerProgram, BadHexExitsWithUsageError) {
  PeerProcess process({"udp", "--rx-prefix", "ABC"});
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(2));
  EXPECT_EQ(process.ReadStderr(kTimeout),
            "velt-peer: bad hex for --rx-prefix: 'ABC' (pairs of hex digits, or none, "
            "expected)\nTry 'velt-peer --help'.\n");
}

TEST(PeerProgram, AddressInUseIsARuntimeError) {
  veltpeer::Endpoint local;
  std::string error;
  ASSERT_TRUE(veltpeer::Endpoint::Resolve("127.0.0.1", 0, SOCK_STREAM, local, error));
  const veltpeer::FileDescriptor taken(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
  ASSERT_EQ(::bind(taken.Get(), local.Address(), local.Length()), 0);
  ASSERT_EQ(::listen(taken.Get(), 1), 0);
  const std::string port = std::to_string(veltpeer::Endpoint::LocalOf(taken.Get()).Port());
  PeerProcess process({"tcp", "--port", port});
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(1));
  EXPECT_EQ(process.ReadStderr(kTimeout),
            "velt-peer: cannot bind tcp 127.0.0.1:" + port + ": Address already in use\n");
  EXPECT_EQ(process.ReadLine(kTimeout), std::nullopt);
}

TEST(PeerProgram, CountPrintsOnlyTheTotalsAtTheEnd) {
  PeerProcess process({"tcp", "--echo", "--count", "--rx-suffix", "0A"});
  const std::uint16_t port = AnnouncedPort(process, "velt-peer: listening tcp");
  ASSERT_NE(port, 0);
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(port));
  ASSERT_TRUE(client.Send("a\nbb\n"));
  EXPECT_EQ(client.Read(5, kTimeout), "a\nbb\n");
  process.Signal(SIGINT);
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(0));
  EXPECT_EQ(process.ReadLine(kTimeout),
            std::optional<std::string>(
                "totals rx_frames=2 rx_bytes=5 tx_frames=2 tx_bytes=5 connections=1"));
  EXPECT_EQ(process.ReadLine(kTimeout), std::nullopt);
}

TEST(PeerProgram, UdpEchoPrintsTextLinesAndEndsAtTheExitLimit) {
  PeerProcess process({"udp", "--echo", "--text", "--exit-after", "1"});
  const std::uint16_t port = AnnouncedPort(process, "velt-peer: bound udp");
  ASSERT_NE(port, 0);
  LoopbackUdpSocket client;
  ASSERT_TRUE(client.SendTo(port, "hi\x01"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("hi\x01"));
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(0));
  EXPECT_EQ(process.ReadLine(kTimeout), std::optional<std::string>("rx hi\\x01"));
  EXPECT_EQ(process.ReadLine(kTimeout), std::optional<std::string>("tx hi\\x01"));
  EXPECT_EQ(process.ReadLine(kTimeout), std::nullopt);
}

TEST(PeerProgram, SigtermEndsTheRunEvenWhenNobodyReadsTheOutput) {
  LoopbackUdpSocket sink;
  ASSERT_TRUE(sink.Bound());
  PeerProcess process({"udp", "--to", "127.0.0.1:" + std::to_string(sink.Port()), "--emit",
                       "forever", "--rate", "0"});
  ASSERT_NE(AnnouncedPort(process, "velt-peer: bound udp"), 0);
  // One tx line per datagram fills the unread output pipe within moments.
  std::this_thread::sleep_for(milliseconds(200));
  process.Signal(SIGTERM);
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(0));
}

TEST(PeerProgram, MaxSecondsEndsTheRun) {
  PeerProcess process({"tcp", "--max-seconds", "0.2"});
  ASSERT_NE(AnnouncedPort(process, "velt-peer: listening tcp"), 0);
  EXPECT_EQ(process.Wait(kTimeout), std::optional<int>(0));
}

TEST(PeerProgram, HelpAndVersion) {
  PeerProcess help({"--help"});
  EXPECT_EQ(help.ReadLine(kTimeout),
            std::optional<std::string>("Usage: velt-peer tcp|udp [options]"));
  EXPECT_EQ(help.Wait(kTimeout), std::optional<int>(0));
  PeerProcess version({"--version"});
  EXPECT_EQ(version.ReadLine(kTimeout), std::optional<std::string>("velt-peer " VELT_VERSION));
  EXPECT_EQ(version.Wait(kTimeout), std::optional<int>(0));
}
