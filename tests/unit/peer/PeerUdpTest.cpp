// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <chrono>
#include <optional>
#include <string>

#include "LoopbackUdpSocket.h"
#include "velt-peer/Peer.h"

using std::chrono::milliseconds;
using veltpeer::Peer;
using veltpeer::PeerOptions;
using veltpeer::Transport;

namespace {

constexpr milliseconds kTimeout{5000};
constexpr milliseconds kQuiet{150};

PeerOptions UdpOptions() {
  PeerOptions options;
  options.transport = Transport::kUdp;
  options.keepFrames = 100;
  return options;
}

}  // namespace

TEST(PeerUdp, EchoPreservesDatagramBoundaries) {
  PeerOptions options = UdpOptions();
  options.echo = true;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackUdpSocket client;
  ASSERT_TRUE(client.Bound());
  for (const std::string datagram : {"A", "BC", "", "DEF"}) {
    ASSERT_TRUE(client.SendTo(started.port, datagram));
  }
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("A"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("BC"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>(""));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("DEF"));
  EXPECT_EQ(client.Receive(kQuiet), std::nullopt);
  EXPECT_EQ(peer.Totals().framesReceived, 4U);
  EXPECT_EQ(peer.Totals().bytesReceived, 6U);
}

TEST(PeerUdp, EchoesEachFrameOfADatagramAsADatagramOfItsOwn) {
  PeerOptions options = UdpOptions();
  options.echo = true;
  options.rxPrefix = "\x02";
  options.rxSuffix = "\x03";
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackUdpSocket client;
  ASSERT_TRUE(client.SendTo(started.port, "\x02\x41\x03\x02\x42\x03"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("\x02\x41\x03"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("\x02\x42\x03"));
  ASSERT_TRUE(client.SendTo(started.port, "\x02\x41"));
  ASSERT_TRUE(client.SendTo(started.port, "\x03"));
  EXPECT_EQ(client.Receive(kQuiet), std::nullopt);
  EXPECT_EQ(peer.Totals().framesReceived, 2U);
  EXPECT_EQ(peer.Totals().bytesReceived, 9U);
}

TEST(PeerUdp, EmitsToTheFixedDestinationWithoutHearingFromIt) {
  LoopbackUdpSocket listener;
  ASSERT_TRUE(listener.Bound());
  PeerOptions options = UdpOptions();
  options.to = "127.0.0.1:" + std::to_string(listener.Port());
  options.emitCount = 3;
  options.rate = 0;
  options.txPrefix = "\x02";
  options.txSuffix = "\x03";
  options.payload = "T{n}";
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  EXPECT_EQ(listener.Receive(kTimeout), std::optional<std::string>("\x02T1\x03"));
  EXPECT_EQ(listener.Receive(kTimeout), std::optional<std::string>("\x02T2\x03"));
  EXPECT_EQ(listener.Receive(kTimeout), std::optional<std::string>("\x02T3\x03"));
  EXPECT_EQ(listener.Receive(kQuiet), std::nullopt);
  EXPECT_EQ(peer.Totals().framesSent, 3U);
  EXPECT_EQ(peer.Totals().bytesSent, 12U);
}

TEST(PeerUdp, WithoutDestinationEmitsToTheLastSenderOnceOneIsKnown) {
  PeerOptions options = UdpOptions();
  options.emitCount = 2;
  options.rate = 0;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackUdpSocket client;
  EXPECT_EQ(client.Receive(kQuiet), std::nullopt);
  ASSERT_TRUE(client.SendTo(started.port, "go"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("token 1"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("token 2"));
  std::string frame;
  ASSERT_TRUE(peer.NextFrame(frame, kTimeout));
  EXPECT_EQ(frame, "go");
}

TEST(PeerUdp, ChunkingSplitsAFrameIntoSeveralDatagrams) {
  PeerOptions options = UdpOptions();
  options.echo = true;
  options.chunkBytes = 2;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackUdpSocket client;
  ASSERT_TRUE(client.SendTo(started.port, "ABCDE"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("AB"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("CD"));
  EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>("E"));
  EXPECT_EQ(client.Receive(kQuiet), std::nullopt);
}

TEST(PeerUdp, ExitAfterStopsTakingDatagrams) {
  PeerOptions options = UdpOptions();
  options.exitAfterFrames = 2;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackUdpSocket client;
  for (const char* datagram : {"1", "2", "3"}) {
    ASSERT_TRUE(client.SendTo(started.port, datagram));
  }
  EXPECT_TRUE(peer.WaitFinished(kTimeout));
  EXPECT_EQ(peer.Totals().framesReceived, 2U);
  EXPECT_EQ(peer.Failure(), "");
}

TEST(PeerUdp, LargeDatagramsEchoWhole) {
  PeerOptions options = UdpOptions();
  options.echo = true;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackUdpSocket client;
  for (const std::size_t size : {std::size_t{1536}, std::size_t{60000}}) {
    std::string datagram(size, '\0');
    for (std::size_t i = 0; i < size; ++i) {
      datagram[i] = static_cast<char>(i % 251);
    }
    ASSERT_TRUE(client.SendTo(started.port, datagram));
    EXPECT_EQ(client.Receive(kTimeout), std::optional<std::string>(datagram)) << size;
  }
}
