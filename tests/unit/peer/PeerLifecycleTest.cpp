// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>
#include <netinet/in.h>
#include <sys/socket.h>

#include <chrono>
#include <string>
#include <thread>

#include "EventLog.h"
#include "LoopbackTcpClient.h"
#include "LoopbackUdpSocket.h"
#include "velt-peer/Endpoint.h"
#include "velt-peer/FileDescriptor.h"
#include "velt-peer/Peer.h"

using std::chrono::milliseconds;
using veltpeer::Endpoint;
using veltpeer::FileDescriptor;
using veltpeer::Peer;
using veltpeer::PeerOptions;
using veltpeer::Transport;
using Clock = std::chrono::steady_clock;

namespace {

constexpr milliseconds kTimeout{5000};
// A generous bound for "prompt": Stop normally takes well under 10 ms, but
// sanitizer builds on a loaded machine are slow.
constexpr milliseconds kPrompt{1000};

milliseconds TimeToStop(Peer& peer) {
  const Clock::time_point begin = Clock::now();
  peer.Stop();
  return std::chrono::duration_cast<milliseconds>(Clock::now() - begin);
}

// A socket of the given type bound to a free loopback port.
FileDescriptor BoundSocket(int type, std::uint16_t& port) {
  Endpoint local;
  std::string error;
  Endpoint::Resolve("127.0.0.1", 0, type, local, error);
  FileDescriptor socket(::socket(AF_INET, type | SOCK_CLOEXEC, 0));
  ::bind(socket.Get(), local.Address(), local.Length());
  port = Endpoint::LocalOf(socket.Get()).Port();
  return socket;
}

}  // namespace

TEST(PeerLifecycle, StartReportsTheBoundPortAndAddress) {
  EventLog log;
  PeerOptions options;
  options.onEvent = log.Sink();
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  EXPECT_NE(started.port, 0);
  EXPECT_EQ(started.address, "127.0.0.1:" + std::to_string(started.port));
  ASSERT_TRUE(log.WaitFor(1, kTimeout));
  EXPECT_EQ(log.Lines().front(), "listening " + started.address);
  EXPECT_FALSE(peer.Finished());
}

TEST(PeerLifecycle, StopIsPromptWhileWaitingForAClient) {
  Peer peer(PeerOptions{});
  ASSERT_TRUE(peer.Start().Ok());
  EXPECT_LT(TimeToStop(peer), kPrompt);
  EXPECT_TRUE(peer.Finished());
  EXPECT_EQ(peer.Failure(), "");
}

TEST(PeerLifecycle, StopIsPromptWhileWaitingForData) {
  Peer peer(PeerOptions{});
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(started.port));
  ASSERT_TRUE(Eventually([&] { return peer.Totals().connections == 1; }));
  EXPECT_LT(TimeToStop(peer), kPrompt);
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  EXPECT_EQ(client.ReadToEnd(kTimeout, end), "");
  EXPECT_EQ(end, LoopbackTcpClient::End::kEof);
}

TEST(PeerLifecycle, StopIsPromptWhileASendIsBlockedByAClientThatDoesNotRead) {
  PeerOptions options;
  options.emitCount = PeerOptions::kForever;
  options.rate = 0;
  options.payload = std::string(65536, 'x');
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(started.port));
  // The socket buffers fill up after a few tokens; then the sender waits.
  ASSERT_TRUE(Eventually([&] {
    const std::uint64_t before = peer.Totals().framesSent;
    std::this_thread::sleep_for(milliseconds(50));
    return before > 0 && peer.Totals().framesSent == before;
  }));
  EXPECT_LT(TimeToStop(peer), kPrompt);
}

TEST(PeerLifecycle, StopIsPromptDuringAReplyDelay) {
  PeerOptions options;
  options.echo = true;
  options.delayMs = 60000;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(started.port));
  ASSERT_TRUE(client.Send("x"));
  ASSERT_TRUE(Eventually([&] { return peer.Totals().framesReceived == 1; }));
  EXPECT_LT(TimeToStop(peer), kPrompt);
  EXPECT_EQ(peer.Totals().framesSent, 0U);
}

TEST(PeerLifecycle, StopIsPromptWhileWaitingForADatagram) {
  PeerOptions options;
  options.transport = Transport::kUdp;
  Peer peer(options);
  ASSERT_TRUE(peer.Start().Ok());
  EXPECT_LT(TimeToStop(peer), kPrompt);
}

TEST(PeerLifecycle, StopIsIdempotentAndTheDestructorStopsARunningSimulator) {
  const Clock::time_point begin = Clock::now();
  {
    Peer peer(PeerOptions{});
    ASSERT_TRUE(peer.Start().Ok());
    peer.Stop();
    peer.Stop();
    Peer running(PeerOptions{});
    ASSERT_TRUE(running.Start().Ok());
  }
  EXPECT_LT(Clock::now() - begin, kPrompt);
}

TEST(PeerLifecycle, MaxSecondsEndsTheRun) {
  PeerOptions options;
  options.maxSeconds = 0.2;
  Peer peer(options);
  const Clock::time_point begin = Clock::now();
  ASSERT_TRUE(peer.Start().Ok());
  EXPECT_TRUE(peer.WaitFinished(kTimeout));
  EXPECT_GE(Clock::now() - begin, milliseconds(200));
  EXPECT_EQ(peer.Failure(), "");
}

TEST(PeerLifecycle, MaxSecondsEndsARunBusyWithAClient) {
  PeerOptions options;
  options.maxSeconds = 0.2;
  options.emitCount = PeerOptions::kForever;
  options.rate = 0;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(started.port));
  EXPECT_TRUE(peer.WaitFinished(kTimeout));
  LoopbackTcpClient::End end = LoopbackTcpClient::End::kTimeout;
  client.ReadToEnd(kTimeout, end);
  EXPECT_EQ(end, LoopbackTcpClient::End::kEof);
}

TEST(PeerLifecycle, TcpAddressInUse) {
  std::uint16_t port = 0;
  const FileDescriptor taken = BoundSocket(SOCK_STREAM, port);
  ASSERT_EQ(::listen(taken.Get(), 1), 0);
  PeerOptions options;
  options.port = port;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  EXPECT_EQ(started.error,
            "cannot bind tcp 127.0.0.1:" + std::to_string(port) + ": Address already in use");
  EXPECT_EQ(started.port, 0);
  EXPECT_TRUE(peer.Finished());
}

TEST(PeerLifecycle, UdpAddressInUse) {
  std::uint16_t port = 0;
  const FileDescriptor taken = BoundSocket(SOCK_DGRAM, port);
  PeerOptions options;
  options.transport = Transport::kUdp;
  options.port = port;
  Peer peer(options);
  EXPECT_EQ(peer.Start().error,
            "cannot bind udp 127.0.0.1:" + std::to_string(port) + ": Address already in use");
}

TEST(PeerLifecycle, BadBindAddressFailsWithoutALookup) {
  PeerOptions options;
  options.bindAddress = "256.1.1.1";
  Peer peer(options);
  const std::string error = peer.Start().error;
  EXPECT_EQ(error.rfind("cannot bind tcp 256.1.1.1:0: cannot resolve '256.1.1.1': ", 0), 0U)
      << error;
}

TEST(PeerLifecycle, OnlyTheFirstStartCounts) {
  Peer peer(PeerOptions{});
  ASSERT_TRUE(peer.Start().Ok());
  EXPECT_EQ(peer.Start().error, "the simulator was already started or stopped");
  Peer stopped(PeerOptions{});
  stopped.Stop();
  EXPECT_EQ(stopped.Start().error, "the simulator was already started or stopped");
}

TEST(PeerLifecycle, OptionsThatDoNotFitTheTransportAreRefused) {
  PeerOptions tcp;
  tcp.to = "127.0.0.1:4000";
  EXPECT_EQ(Peer(tcp).Start().error, "a fixed destination applies to udp only");
  PeerOptions udp;
  udp.transport = Transport::kUdp;
  udp.closeAfterFrames = 1;
  EXPECT_EQ(Peer(udp).Start().error, "closing a connection applies to tcp only");
  PeerOptions rate;
  rate.rate = -1;
  EXPECT_EQ(Peer(rate).Start().error,
            "the rate must be 0 (unpaced) or 0.001..1000000 tokens per second");
  PeerOptions gap;
  gap.gapMs = 0;
  EXPECT_EQ(Peer(gap).Start().error, "the gap must be 1..3600000 ms");
  PeerOptions delay;
  delay.delayMs = -1;
  EXPECT_EQ(Peer(delay).Start().error, "delays must be 0..3600000 ms");
  PeerOptions empty;
  empty.emitCount = 1;
  empty.payload.clear();
  EXPECT_EQ(Peer(empty).Start().error, "an emitted token must not be empty on tcp");
}

TEST(PeerLifecycle, DestinationMustMatchTheBoundFamily) {
  PeerOptions options;
  options.transport = Transport::kUdp;
  options.to = "[::1]:4000";
  const std::string error = Peer(options).Start().error;
  EXPECT_EQ(error.rfind("the destination [::1]:4000 is not of the bound address's family", 0), 0U)
      << error;
}

TEST(PeerLifecycle, ServesIpv6Loopback) {
  PeerOptions options;
  options.bindAddress = "::1";
  options.echo = true;
  Peer peer(options);
  const Peer::Started started = peer.Start();
  if (started.error.find("Cannot assign requested address") != std::string::npos ||
      started.error.find("Address family not supported") != std::string::npos) {
    GTEST_SKIP() << "no IPv6 loopback here: " << started.error;
  }
  ASSERT_TRUE(started.Ok()) << started.error;
  EXPECT_EQ(started.address, "[::1]:" + std::to_string(started.port));
  LoopbackTcpClient client;
  ASSERT_TRUE(client.Connect(started.port, "::1"));
  ASSERT_TRUE(client.Send("v6"));
  EXPECT_EQ(client.Read(2, kTimeout), "v6");
}
