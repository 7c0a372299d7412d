// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <chrono>
#include <string>
#include <vector>

#include "EventLog.h"
#include "LoopbackTcpClient.h"
#include "velt-peer/Peer.h"

using veltpeer::Peer;
using veltpeer::PeerOptions;
using veltpeer::PeerTotals;
using Lines = std::vector<std::string>;
using std::chrono::milliseconds;

namespace {

constexpr milliseconds kTimeout{5000};
// Long enough to show that nothing more arrives.
constexpr milliseconds kQuiet{150};

PeerOptions TcpOptions() {
  PeerOptions options;
  options.keepFrames = 100;
  return options;
}

std::vector<std::string> TakeFrames(Peer& peer, std::size_t count) {
  std::vector<std::string> frames;
  std::string frame;
  while (frames.size() < count && peer.NextFrame(frame, kTimeout)) {
    frames.push_back(frame);
  }
  return frames;
}

// The simulator has started and the test client is connected to it.
struct Session {
  explicit Session(const PeerOptions& options) : peer(options), started(peer.Start()) {
    connected = started.Ok() && client.Connect(started.port);
  }
  Peer peer;
  Peer::Started started;
  LoopbackTcpClient client;
  bool connected = false;
};

}  // namespace

TEST(PeerTcp, EchoesFramedDataWholeAndSkipsBytesOutsideFrames) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  options.rxPrefix = "\x02";
  options.rxSuffix = "\x03";
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  ASSERT_TRUE(s.client.Send("\x55\x02\x41"));
  ASSERT_TRUE(s.client.Send("\x42\x03\x66\x02"));
  ASSERT_TRUE(s.client.Send("\x43\x03"));
  EXPECT_EQ(s.client.Read(7, kTimeout), "\x02\x41\x42\x03\x02\x43\x03");
  EXPECT_EQ(TakeFrames(s.peer, 2), Lines({"\x02\x41\x42\x03", "\x02\x43\x03"}));
  EXPECT_TRUE(Eventually([&] { return s.peer.Totals().framesSent == 2; }));
  const PeerTotals totals = s.peer.Totals();
  EXPECT_EQ(totals.framesReceived, 2U);
  EXPECT_EQ(totals.bytesReceived, 9U);
  EXPECT_EQ(totals.bytesSent, 7U);
}

TEST(PeerTcp, EchoesUnframedDataAsItArrivesByteForByte) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  std::string sent;
  for (int i = 0; i < 3000; ++i) {
    sent += static_cast<char>(i * 7 % 256);
  }
  for (std::size_t offset = 0, piece = 1; offset < sent.size(); offset += piece, piece += 97) {
    ASSERT_TRUE(s.client.Send(sent.substr(offset, piece)));
  }
  EXPECT_EQ(s.client.Read(sent.size(), kTimeout), sent);
  EXPECT_EQ(s.client.Read(1, kQuiet), "");
  EXPECT_TRUE(Eventually([&] { return s.peer.Totals().bytesSent == 3000; }));
  EXPECT_EQ(s.peer.Totals().bytesReceived, 3000U);
}

TEST(PeerTcp, EmitsExactlyNFramedTokens) {
  PeerOptions options = TcpOptions();
  options.emitCount = 5;
  options.rate = 0;
  options.txPrefix = "\x02";
  options.txSuffix = "\x03";
  options.payload = "T{n}";
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  const std::string expected = "\x02T1\x03\x02T2\x03\x02T3\x03\x02T4\x03\x02T5\x03";
  EXPECT_EQ(s.client.Read(expected.size(), kTimeout), expected);
  EXPECT_EQ(s.client.Read(1, kQuiet), "");
  EXPECT_TRUE(Eventually([&] { return s.peer.Totals().framesSent == 5; }));
  EXPECT_EQ(s.peer.Totals().bytesSent, expected.size());
}

TEST(PeerTcp, EmitsAtTheGivenRate) {
  PeerOptions options = TcpOptions();
  options.emitCount = 3;
  options.rate = 20;  // 50 ms apart, starting when the client is accepted
  options.payload = "{n}";
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  const auto begin = std::chrono::steady_clock::now();
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(started.port));
  EXPECT_EQ(client.Read(3, kTimeout), "123");
  EXPECT_GE(std::chrono::steady_clock::now() - begin, milliseconds(100));
  EXPECT_EQ(client.Read(1, kQuiet), "");
}

TEST(PeerTcp, SinkCountsFramesAndBytes) {
  PeerOptions options = TcpOptions();
  options.rxSuffix = "\n";
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  ASSERT_TRUE(s.client.Send("a\nbb\nccc\npartial"));
  EXPECT_EQ(TakeFrames(s.peer, 3), Lines({"a\n", "bb\n", "ccc\n"}));
  EXPECT_TRUE(Eventually([&] { return s.peer.Totals().bytesReceived == 16; }));
  const PeerTotals totals = s.peer.Totals();
  EXPECT_EQ(totals.framesReceived, 3U);
  EXPECT_EQ(totals.framesSent, 0U);
  EXPECT_EQ(totals.bytesSent, 0U);
  EXPECT_EQ(totals.connections, 1U);
  EXPECT_EQ(s.client.Read(1, kQuiet), "");
}

TEST(PeerTcp, ChunkedWritesArriveCompleteAndInOrderInSeveralPieces) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  options.rxSuffix = "\n";
  options.chunkBytes = 3;
  options.chunkDelayMs = 20;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  const std::string frame = "ABCDEFGHIJKLMNOPQRS\n";
  ASSERT_TRUE(s.client.Send(frame));
  int reads = 0;
  EXPECT_EQ(s.client.Read(frame.size(), kTimeout, &reads), frame);
  EXPECT_GE(reads, 2);
  EXPECT_TRUE(Eventually([&] { return s.peer.Totals().framesSent == 1; }));
}

TEST(PeerTcp, CloseAfterResetsTheConnectionAfterExactlyNFrames) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  options.rxSuffix = "\n";
  options.closeAfterFrames = 2;
  EventLog log;
  options.onEvent = log.Sink();
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  ASSERT_TRUE(s.client.Send("a\nb\nc\n"));
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  EXPECT_EQ(s.client.ReadToEnd(kTimeout, end), "a\nb\n");
  EXPECT_EQ(end, LoopbackTcpClient::End::kReset);
  ASSERT_TRUE(log.WaitFor(7, kTimeout));
  const Lines lines = log.Lines();
  EXPECT_EQ(Lines(lines.begin() + 2, lines.end()),
            Lines({"rx 610A", "tx 610A", "rx 620A", "tx 620A", "reset"}));
}

TEST(PeerTcp, CloseAfterMillisecondsResetsAnIdleConnection) {
  PeerOptions options = TcpOptions();
  options.closeAfterMs = 100;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  const auto begin = std::chrono::steady_clock::now();
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(started.port));
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  EXPECT_EQ(client.ReadToEnd(kTimeout, end), "");
  EXPECT_EQ(end, LoopbackTcpClient::End::kReset);
  EXPECT_GE(std::chrono::steady_clock::now() - begin, milliseconds(100));
}

TEST(PeerTcp, TokenNumbersRunOnAcrossConnections) {
  PeerOptions options = TcpOptions();
  options.emitCount = 4;
  options.rate = 0;
  options.payload = "T{n};";
  options.closeAfterFrames = 2;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  LoopbackTcpClient first;
  ASSERT_TRUE(first.Connect(started.port));
  EXPECT_EQ(first.ReadToEnd(kTimeout, end), "T1;T2;");
  EXPECT_EQ(end, LoopbackTcpClient::End::kReset);
  LoopbackTcpClient second;
  ASSERT_TRUE(second.Connect(started.port));
  EXPECT_EQ(second.ReadToEnd(kTimeout, end), "T3;T4;");
  EXPECT_EQ(end, LoopbackTcpClient::End::kReset);
}

TEST(PeerTcp, ServesTheNextClientAfterOneDisconnects) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  EventLog log;
  options.onEvent = log.Sink();
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackTcpClient first;
  ASSERT_TRUE(first.Connect(started.port));
  const std::uint16_t firstPort = first.LocalPort();
  ASSERT_TRUE(first.Send("one"));
  EXPECT_EQ(first.Read(3, kTimeout), "one");
  first.Close();
  LoopbackTcpClient second;
  ASSERT_TRUE(second.Connect(started.port));
  const std::uint16_t secondPort = second.LocalPort();
  ASSERT_TRUE(second.Send("two"));
  EXPECT_EQ(second.Read(3, kTimeout), "two");
  EXPECT_TRUE(Eventually([&] { return peer.Totals().connections == 2; }));
  ASSERT_TRUE(log.WaitFor(8, kTimeout));
  EXPECT_EQ(
      log.Lines(),
      Lines({"listening " + started.address, "connected 127.0.0.1:" + std::to_string(firstPort),
             "rx 6F6E65", "tx 6F6E65", "closed",
             "connected 127.0.0.1:" + std::to_string(secondPort), "rx 74776F", "tx 74776F"}));
}

TEST(PeerTcp, AWaitingClientIsServedOnlyWhenTheFirstLeaves) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackTcpClient first;
  ASSERT_TRUE(first.Connect(started.port));
  ASSERT_TRUE(first.Send("1"));
  EXPECT_EQ(first.Read(1, kTimeout), "1");
  LoopbackTcpClient second;
  ASSERT_TRUE(second.Connect(started.port));
  ASSERT_TRUE(second.Send("2"));
  EXPECT_EQ(second.Read(1, kQuiet), "");
  first.Close();
  EXPECT_EQ(second.Read(1, kTimeout), "2");
}

TEST(PeerTcp, PrefixOnlyFrameEndsAtTheNextPrefixOrAfterTheGap) {
  PeerOptions options = TcpOptions();
  options.rxPrefix = "\x02";
  options.gapMs = 60;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  const auto sent = std::chrono::steady_clock::now();
  ASSERT_TRUE(s.client.Send("\x02\x41\x02\x42"));
  EXPECT_EQ(TakeFrames(s.peer, 1), Lines({"\x02\x41"}));
  EXPECT_EQ(TakeFrames(s.peer, 1), Lines({"\x02\x42"}));
  EXPECT_GE(std::chrono::steady_clock::now() - sent, milliseconds(60));
}

TEST(PeerTcp, PrefixOnlyFrameEndsWhenTheClientCloses) {
  PeerOptions options = TcpOptions();
  options.rxPrefix = "\x02";
  options.gapMs = 60000;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  ASSERT_TRUE(s.client.Send("\x02\x41\x42"));
  s.client.ShutdownWrite();
  EXPECT_EQ(TakeFrames(s.peer, 1), Lines({"\x02\x41\x42"}));
}

TEST(PeerTcp, EchoGoesBackToAClientThatOnlyShutItsSendingSide) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  options.rxPrefix = "\x02";
  options.gapMs = 60000;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  ASSERT_TRUE(s.client.Send("\x02Z"));
  s.client.ShutdownWrite();
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  EXPECT_EQ(s.client.ReadToEnd(kTimeout, end), "\x02Z");
  EXPECT_EQ(end, LoopbackTcpClient::End::kEof);
}

TEST(PeerTcp, DelaysEachReply) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  options.delayMs = 150;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  const auto sent = std::chrono::steady_clock::now();
  ASSERT_TRUE(s.client.Send("x"));
  EXPECT_EQ(s.client.Read(1, kTimeout), "x");
  EXPECT_GE(std::chrono::steady_clock::now() - sent, milliseconds(150));
}

TEST(PeerTcp, ExitAfterEndsTheSimulatorWithAnOrderlyClose) {
  PeerOptions options = TcpOptions();
  options.echo = true;
  options.rxSuffix = "\n";
  options.exitAfterFrames = 2;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  ASSERT_TRUE(s.client.Send("a\nb\nc\n"));
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  EXPECT_EQ(s.client.ReadToEnd(kTimeout, end), "a\nb\n");
  EXPECT_EQ(end, LoopbackTcpClient::End::kEof);
  EXPECT_TRUE(s.peer.WaitFinished(kTimeout));
  EXPECT_EQ(s.peer.Failure(), "");
  EXPECT_EQ(s.peer.Totals().framesReceived, 2U);
}

TEST(PeerTcp, EmittedTokensCountTowardsTheExitLimit) {
  PeerOptions options = TcpOptions();
  options.emitCount = PeerOptions::kForever;
  options.rate = 0;
  options.payload = "{n},";
  options.exitAfterFrames = 3;
  Session s(options);
  ASSERT_TRUE(s.connected) << s.started.error;
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  EXPECT_EQ(s.client.ReadToEnd(kTimeout, end), "1,2,3,");
  EXPECT_EQ(end, LoopbackTcpClient::End::kEof);
  EXPECT_TRUE(s.peer.WaitFinished(kTimeout));
}
