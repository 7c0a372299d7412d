// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The plug-in's TCP channel against a peer that refuses connections, with the
// reference host pacing the attempts: the driver keeps asking every 10 ms,
// the host makes few real attempts, a returning peer is connected within the
// back-off ceiling, and Stop and a write of 0 to connect act at once.
#include <sys/socket.h>

#include <chrono>
#include <iostream>
#include <string>
#include <thread>

#include "HostedChannel.h"
#include "LoopbackIo.h"

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

namespace {

long long Milliseconds(Clock::duration duration) {
  return std::chrono::duration_cast<std::chrono::milliseconds>(duration).count();
}

class ConnectPacingOnHost : public HostedChannel {
 protected:
  // The host again, with the given back-off ceiling.
  void LoadWithCeiling(std::chrono::milliseconds ceiling) {
    Unload();
    host = std::make_unique<HostInterfaceFactory>(folder.File("storage.ini"),
                                                  HostSocket::Timeouts{3000ms, 3000ms, ceiling});
    plugin = std::make_unique<PluginLoader>(VELT_PLUGIN_PATH, *host);
  }

  // A channel to a port that refuses, asked to connect; returns once the
  // driver has been refused for the given time.
  void RefusedFor(std::chrono::milliseconds time) {
    closed_ = LoopbackIo::ClosedTcpPort(port_);
    Open("CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
         std::to_string(port_));
    ASSERT_TRUE(WriteBool("?connect?boolean", true));
    std::this_thread::sleep_for(time);
    ASSERT_FALSE(ReadBool("?conn_stat?boolean"));
  }

  std::uint64_t Attempts() { return host->SocketFactory().ConnectAttempts(); }

  FileDescriptor closed_;
  std::uint16_t port_ = 0;
};

}  // namespace

TEST_F(ConnectPacingOnHost, TheDriverKeepsAskingButFewAttemptsReachTheNetwork) {
  LoadWithCeiling(100ms);
  RefusedFor(600ms);
  // The driver asks about every 10 ms, 60 times in all; with windows of 10,
  // 20, 40, 80 and then 100 ms the host makes about 9 attempts.
  EXPECT_GE(Attempts(), 5U);
  EXPECT_LE(Attempts(), 15U);
  EXPECT_EQ(host->SocketFactory().LiveSockets(), 1U);
}

TEST_F(ConnectPacingOnHost, APeerThatStartsListeningIsConnectedWithinTheCeiling) {
  LoadWithCeiling(100ms);
  // Long enough for windows that kept doubling to reach 640 ms.
  RefusedFor(700ms);
  ASSERT_EQ(::listen(closed_.Get(), 4), 0);
  const auto start = Clock::now();
  const FileDescriptor peer = LoopbackIo::Accept(closed_.Get(), 5000ms);
  const auto took = Clock::now() - start;
  ASSERT_TRUE(peer.Valid());
  EXPECT_TRUE(WaitFor([&] { return ReadBool("?conn_stat?boolean"); }));
  std::cout << "reconnected " << Milliseconds(took) << " ms after the peer started listening\n";
  // The ceiling and a pass of the driver; loose for slow builds, and below
  // the 640 ms window of a back-off without ceiling.
  EXPECT_LT(took, 500ms);
}

TEST_F(ConnectPacingOnHost, StopInsideABackoffWindowReturnsPromptly) {
  // The default ceiling; by now the windows last 160 or 320 ms.
  RefusedFor(400ms);
  const auto start = Clock::now();
  EXPECT_TRUE(channel->Stop());
  const auto took = Clock::now() - start;
  std::cout << "Stop took " << std::chrono::duration_cast<std::chrono::microseconds>(took).count()
            << " us inside a back-off window\n";
  EXPECT_LT(took, 500ms);
}

TEST_F(ConnectPacingOnHost, WritingZeroToConnectEndsTheAttempts) {
  LoadWithCeiling(100ms);
  RefusedFor(300ms);
  ASSERT_TRUE(WriteBool("?connect?boolean", false));
  // One pass may still be under way; after it nothing more is attempted,
  // and a peer that comes back is left alone.
  std::this_thread::sleep_for(50ms);
  const std::uint64_t attempts = Attempts();
  ASSERT_EQ(::listen(closed_.Get(), 4), 0);
  EXPECT_FALSE(LoopbackIo::Accept(closed_.Get(), 400ms).Valid());
  EXPECT_EQ(Attempts(), attempts);
  EXPECT_FALSE(ReadBool("?conn_stat?boolean"));
  // Asked again, it connects at once: the peer is there and the window of
  // the last refusal has long ended.
  const auto start = Clock::now();
  ASSERT_TRUE(WriteBool("?connect?boolean", true));
  EXPECT_TRUE(LoopbackIo::Accept(closed_.Get(), 5000ms).Valid());
  EXPECT_LT(Clock::now() - start, 500ms);
}
