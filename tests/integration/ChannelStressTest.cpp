// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <sys/socket.h>

#include <atomic>
#include <chrono>
#include <cstring>
#include <string>
#include <thread>
#include <vector>

#include "HostedChannel.h"
#include "LoopbackIo.h"

using namespace std::chrono_literals;

namespace {

constexpr int kDatagrams = 1500;
constexpr int kSends = 300;
// Frames sent and not yet collected, at most: a peer socket's receive
// buffer (about 200 KiB by default, 1 KiB or more per datagram) holds them
// however late the collector runs, so the kernel never drops one.
constexpr int kFramesInFlight = 64;

// A worker receiving a stream of datagrams while one host thread reads and
// acknowledges tokens and another sends tokens, stages and applies runtime
// parameters and asks the console, all at once. Bounded in count and time;
// the race detector watches the whole run.
class ChannelStress : public HostedChannel {};

}  // namespace

TEST_F(ChannelStress, WorkerReadersWritersAndAppliesRunTogether) {
  std::uint16_t peerPort = 0;
  const FileDescriptor peer = LoopbackIo::BindUdp(0x7F000001U, peerPort);
  // Room for every frame the writer sends, so a collector held up by a busy
  // machine loses none of them to a full receive buffer.
  const int room = 1 << 20;
  ::setsockopt(peer.Get(), SOL_SOCKET, SO_RCVBUF, &room, sizeof room);
  std::uint16_t local = 0;
  { LoopbackIo::BindUdp(0x7F000001U, local); }
  Open("CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=" +
       std::to_string(peerPort) + " localPort=" + std::to_string(local) +
       " rx_suffix=0A tx_suffix=0A token_queue_size=50");
  ITag* const connect = Tag("?connect?boolean");
  ITag* const available = Tag("?tokens_available?unsignedInt");
  ITag* const rx = Tag("?rx_token?string-64");
  ITag* const ack = Tag("?token_ack?boolean");
  ITag* const tx = Tag("?tx_token?string-32");
  ITag* const gap = Tag("?SP_Gap?unsignedInt");
  ITag* const done = Tag("?SP_Done?boolean");
  const unsigned char on = 1;
  ASSERT_TRUE(channel->Write(connect, &on));
  ASSERT_TRUE(WaitFor([&] { return Console("get_stat") == "Connected"; }));

  std::atomic<bool> sending{true};
  std::atomic<int> read{0};
  std::atomic<int> sent{0};
  std::atomic<int> collected{0};
  // The frames the writer sends, collected while the run goes on so the
  // peer's receive buffer never overflows.
  std::vector<LoopbackIo::Bytes> frames;
  std::thread collector([&] {
    const auto deadline = std::chrono::steady_clock::now() + 20s;
    while (frames.size() < static_cast<std::size_t>(kSends) &&
           std::chrono::steady_clock::now() < deadline) {
      LoopbackIo::Bytes frame = LoopbackIo::ReceiveDatagram(peer.Get(), 100ms, nullptr);
      if (!frame.empty()) {
        frames.push_back(std::move(frame));
        ++collected;
      }
    }
  });
  // Each apply discards the queue, and on a busy machine the worker may
  // not run at all while the first datagrams go out: the source goes on
  // (for ten seconds at most) until the reader has seen a token, so the
  // reads always overlap with a stream that reaches the queue.
  std::thread source([&] {
    const auto deadline = std::chrono::steady_clock::now() + 10s;
    for (int i = 0;
         i < kDatagrams || (read.load() == 0 && std::chrono::steady_clock::now() < deadline); ++i) {
      LoopbackIo::SendTo(peer.Get(), local,
                         LoopbackIo::FromText("token " + std::to_string(i) + "\n"));
      if (i % 64 == 0) {
        std::this_thread::sleep_for(1ms);
      }
    }
    sending = false;
  });
  std::thread reader([&] {
    unsigned char count[4] = {};
    unsigned char token[64] = {};
    while (sending.load()) {
      if (channel->Read(available, count) && channel->Read(rx, token) &&
          std::strncmp(reinterpret_cast<char*>(token), "token ", 6) == 0) {
        ++read;
      }
      channel->Write(ack, &on);
    }
  });
  std::thread writer([&] {
    for (int i = 0; i < kSends; ++i) {
      const auto deadline = std::chrono::steady_clock::now() + 5s;
      while (i - collected.load() >= kFramesInFlight &&
             std::chrono::steady_clock::now() < deadline) {
        std::this_thread::sleep_for(100us);
      }
      unsigned char text[33] = {};
      const std::string payload = "out " + std::to_string(i);
      std::memcpy(text, payload.data(), payload.size());
      if (channel->Write(tx, text)) {
        ++sent;
      }
      const int value = 20 + i % 7;
      unsigned char number[4];
      std::memcpy(number, &value, sizeof number);
      channel->Write(gap, number);
      if (i % 10 == 0) {
        channel->Write(done, &on);
      }
      std::vector<char> reply(256, 0);
      channel->DoCommand(i % 2 == 0 ? "tokens_available" : "get", reply.data(), 255);
    }
  });
  source.join();
  reader.join();
  writer.join();
  collector.join();

  EXPECT_EQ(sent.load(), kSends);
  EXPECT_GT(read.load(), 0);
  // Every frame the writer sent reached the peer whole and in order.
  ASSERT_EQ(frames.size(), static_cast<std::size_t>(kSends));
  for (int i = 0; i < kSends; ++i) {
    EXPECT_EQ(frames[static_cast<std::size_t>(i)],
              LoopbackIo::FromText("out " + std::to_string(i) + "\n"))
        << i;
  }
  const int bound = ReadInt("?SP_TokenQueueSize?unsignedInt");
  EXPECT_EQ(bound, 50);
  EXPECT_LE(std::stoi(Console("tokens_available")), bound);
  EXPECT_EQ(ReadInt("?SP_Gap?unsignedInt"), 20 + (kSends - 1) % 7);
}

TEST_F(ChannelStress, SendsNeverReachASocketBeingReplaced) {
  // One thread sends without pause while another switches the connection
  // off and on, so the worker deletes and re-creates the socket again and
  // again; every send must either reach a live socket or find none.
  std::uint16_t peerPort = 0;
  const FileDescriptor peer = LoopbackIo::BindUdp(0x7F000001U, peerPort);
  Open("CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=" +
       std::to_string(peerPort));
  ITag* const connect = Tag("?connect?boolean");
  ITag* const tx = Tag("?tx_token?string-8");
  std::atomic<bool> running{true};
  std::atomic<int> failures{0};
  std::thread sender([&] {
    unsigned char text[9] = "ping";
    while (running.load()) {
      if (!channel->Write(tx, text)) {
        ++failures;
      }
    }
  });
  std::thread toggler([&] {
    for (int i = 0; i < 200; ++i) {
      const unsigned char state = i % 2 == 0 ? 1 : 0;
      channel->Write(connect, &state);
      std::this_thread::sleep_for(2ms);
    }
    running = false;
  });
  toggler.join();
  sender.join();
  EXPECT_EQ(failures.load(), 0);
}
