// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// A peer that accepts, sends three frames in separate writes and ends the
// connection, a hundred times in a row, alternating an orderly close (FIN)
// and a reset (RST): every frame of every connection must become a token.
// The channel reconnects at once after each end, so a peer often accepts,
// sends and ends before the host's connect has even seen the handshake
// complete; the whole run shares one CPU to make that order common.
#include <pthread.h>
#include <sched.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <string>
#include <thread>
#include <vector>

#include "HostedChannel.h"
#include "LoopbackIo.h"

using namespace std::chrono_literals;

namespace {

constexpr int kCuts = 100;
constexpr int kFramesPerConnection = 3;

std::string Body(int cut, int frame) {
  char text[16];
  std::snprintf(text, sizeof text, "c%03df%d", cut, frame);
  return text;
}

// Keeps the calling thread, and the threads it starts meanwhile, on the
// first CPU it may use; restores the previous set when it goes.
class OneCpu {
 public:
  OneCpu() {
    pinned_ = ::pthread_getaffinity_np(::pthread_self(), sizeof before_, &before_) == 0;
    if (!pinned_) {
      return;
    }
    cpu_set_t one;
    CPU_ZERO(&one);
    for (int cpu = 0; cpu < CPU_SETSIZE; ++cpu) {
      if (CPU_ISSET(cpu, &before_)) {
        CPU_SET(cpu, &one);
        break;
      }
    }
    pinned_ = ::pthread_setaffinity_np(::pthread_self(), sizeof one, &one) == 0;
  }
  OneCpu(const OneCpu&) = delete;
  OneCpu& operator=(const OneCpu&) = delete;
  OneCpu(OneCpu&&) = delete;
  OneCpu& operator=(OneCpu&&) = delete;
  ~OneCpu() {
    if (pinned_) {
      ::pthread_setaffinity_np(::pthread_self(), sizeof before_, &before_);
    }
  }

 private:
  cpu_set_t before_{};
  bool pinned_ = false;
};

// The campaign's peer: serves kCuts connections on a listener, each with
// three frames and then a close (even cuts) or a reset (odd cuts).
class CuttingPeer {
 public:
  explicit CuttingPeer(int listener) : listener_(listener), thread_([this] { Run(); }) {}
  CuttingPeer(const CuttingPeer&) = delete;
  CuttingPeer& operator=(const CuttingPeer&) = delete;
  CuttingPeer(CuttingPeer&&) = delete;
  CuttingPeer& operator=(CuttingPeer&&) = delete;
  ~CuttingPeer() { thread_.join(); }

  int Served() const { return served_.load(); }

 private:
  void Run() {
    for (int cut = 0; cut < kCuts; ++cut) {
      FileDescriptor peer = LoopbackIo::Accept(listener_, 10000ms);
      if (!peer.Valid()) {
        return;
      }
      try {
        for (int frame = 1; frame <= kFramesPerConnection; ++frame) {
          LoopbackIo::SendAll(peer.Get(), LoopbackIo::FromText("\x02" + Body(cut, frame) + "\x03"));
        }
      } catch (const std::exception&) {
        return;
      }
      if (cut % 2 == 1) {
        LoopbackIo::Reset(peer);
      }
      served_ = cut + 1;
    }
  }

  const int listener_;
  std::atomic<int> served_{0};
  std::thread thread_;
};

}  // namespace

class ReconnectWithoutLoss : public HostedChannel {};

TEST_F(ReconnectWithoutLoss, EveryFrameOfAHundredCutConnectionsBecomesAToken) {
  const OneCpu oneCpu;
  std::uint16_t port = 0;
  const FileDescriptor listener = LoopbackIo::Listen(8, port);
  Open("CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
       std::to_string(port) + " rx_prefix=02 rx_suffix=03 token_queue_size=1000");
  std::vector<std::string> tokens;
  {
    const CuttingPeer peer(listener.Get());
    ASSERT_TRUE(WriteBool("?connect?boolean", true));
    // Bounded: at most a minute in all, and two seconds without a token
    // once the peer has served every connection.
    const auto deadline = std::chrono::steady_clock::now() + 60s;
    auto lastToken = std::chrono::steady_clock::now();
    std::string token;
    while (tokens.size() < kCuts * kFramesPerConnection) {
      const auto now = std::chrono::steady_clock::now();
      if (now >= deadline || (peer.Served() == kCuts && now - lastToken > 2s)) {
        break;
      }
      if (TakeToken(token)) {
        tokens.push_back(token);
        lastToken = now;
      } else {
        std::this_thread::sleep_for(1ms);
      }
    }
    EXPECT_EQ(peer.Served(), kCuts);
  }
  std::vector<std::string> expected;
  for (int cut = 0; cut < kCuts; ++cut) {
    for (int frame = 1; frame <= kFramesPerConnection; ++frame) {
      expected.push_back(Body(cut, frame));
    }
  }
  EXPECT_EQ(tokens, expected);
}
