// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Token throughput of the plug-in on the reference host over loopback, with
// 16-byte payloads (15 for the allocation figure):
// - the worker alone filling the queue from a continuous TCP stream, framed
//   by STX/ETX or by a prefix alone, nobody reading;
// - the same stream read and acknowledged by a host thread as a panel does;
// - a burst of UDP datagrams, one framed token each, read and acknowledged,
//   against a plain recv loop fed the same burst.
// The clock is manual: each iteration times the tokens' way only. Every
// wait is bounded.

#include <benchmark/benchmark.h>
#include <poll.h>
#include <sys/socket.h>

#include <atomic>
#include <chrono>
#include <memory>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "AllocationCounter.h"
#include "BenchStreams.h"
#include "LoopbackChannel.h"
#include "LoopbackIo.h"
#include "TokenReader.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::size_t kPayload = 16;
constexpr std::size_t kStreamTokens = 50000;
constexpr std::size_t kBurstDatagrams = 2000;
constexpr std::uint32_t kLoopback = 0x7F000001U;
constexpr auto kConnectTimeout = std::chrono::seconds(5);
constexpr auto kTokenTimeout = std::chrono::seconds(10);
// A burst has ended when nothing arrived for this long after the last send.
constexpr auto kBurstIdle = std::chrono::milliseconds(20);
// Large enough that no benchmark's tokens are dropped by the queue.
constexpr int kQueueBound = 1000000;

double Seconds(Clock::duration duration) { return std::chrono::duration<double>(duration).count(); }

// A channel connected over TCP to a listener of the benchmark's, and the
// listener's end of the connection.
class TcpChannel {
 public:
  explicit TcpChannel(const std::string& markers)
      : listener_(LoopbackIo::Listen(1, port_)),
        channel_(LoopbackChannel::PluginPath(),
                 "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
                     std::to_string(port_) + " " + markers) {
    if (!channel_.Connect(kConnectTimeout)) {
      throw std::runtime_error("the channel did not connect");
    }
    peer_ = LoopbackIo::Accept(listener_.Get(), kConnectTimeout);
    if (!peer_.Valid() || !channel_.SetQueueBound(kQueueBound)) {
      throw std::runtime_error("the channel's connection was not accepted");
    }
  }

  LoopbackChannel& Channel() { return channel_; }
  int Peer() const { return peer_.Get(); }

 private:
  std::uint16_t port_ = 0;
  FileDescriptor listener_;
  LoopbackChannel channel_;
  FileDescriptor peer_;
};

bool WaitForCount(LoopbackChannel& channel, ITag* available, int count) {
  const auto deadline = Clock::now() + kTokenTimeout;
  while (channel.ReadInt(available) < count) {
    if (Clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(std::chrono::microseconds(100));
  }
  return true;
}

// The worker alone: a continuous stream of range(0)-byte payloads, queued
// with nobody reading; the queue is emptied (by an apply) between
// iterations.
void BM_TcpIngestNoReader(benchmark::State& state, bool prefixOnly) {
  const auto payload = static_cast<std::size_t>(state.range(0));
  std::uint64_t allocations = 0;
  try {
    TcpChannel tcp(prefixOnly ? "rx_prefix=02" : "rx_prefix=02 rx_suffix=03");
    LoopbackChannel& channel = tcp.Channel();
    ITag* const available = channel.Tag("?tokens_available?unsignedInt");
    ITag* const done = channel.Tag("?SP_Done?boolean");
    const std::vector<std::string> payloads = BenchStreams::Payloads(kStreamTokens, payload);
    // With a prefix alone each token is closed by the next prefix: one is
    // sent ahead, and every payload is followed by the prefix of the next.
    const LoopbackIo::Bytes frames = prefixOnly ? BenchStreams::Framed(payloads, "", "\x02")
                                                : BenchStreams::Framed(payloads, "\x02", "\x03");
    if (prefixOnly) {
      LoopbackIo::SendAll(tcp.Peer(), {0x02});
    }
    for (auto _ : state) {
      const std::uint64_t before = AllocationCounter::processCount();
      const auto start = Clock::now();
      JoiningThread sender([&tcp, &frames] { LoopbackIo::SendAll(tcp.Peer(), frames); });
      const bool arrived = WaitForCount(channel, available, static_cast<int>(kStreamTokens));
      state.SetIterationTime(Seconds(Clock::now() - start));
      allocations += AllocationCounter::processCount() - before;
      sender.Join();
      if (!arrived) {
        state.SkipWithError("the tokens did not arrive in time");
        break;
      }
      channel.WriteBool(done, true);
    }
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  const auto tokens = state.iterations() * static_cast<std::int64_t>(kStreamTokens);
  state.SetItemsProcessed(tokens);
  state.counters["allocs/token"] =
      tokens == 0 ? 0.0 : static_cast<double>(allocations) / static_cast<double>(tokens);
}

// The same stream (STX/ETX), read and acknowledged token by token by the
// benchmark's thread as a panel does. While the queue is empty the reader
// yields and asks again at once (range(0) 0), or polls every range(0)
// microseconds.
void BM_TcpStreamReadAndAcknowledged(benchmark::State& state) {
  try {
    TcpChannel tcp("rx_prefix=02 rx_suffix=03");
    TokenReader reader(tcp.Channel(), std::chrono::microseconds(state.range(0)));
    const std::vector<std::string> payloads = BenchStreams::Payloads(kStreamTokens, kPayload);
    const LoopbackIo::Bytes frames = BenchStreams::Framed(payloads, "\x02", "\x03");
    std::string error;
    for (auto _ : state) {
      const auto start = Clock::now();
      JoiningThread sender([&tcp, &frames] { LoopbackIo::SendAll(tcp.Peer(), frames); });
      const bool taken = reader.Take(payloads, kTokenTimeout, error);
      state.SetIterationTime(Seconds(Clock::now() - start));
      sender.Join();
      if (!taken) {
        state.SkipWithError(error.c_str());
        break;
      }
    }
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(kStreamTokens));
}

// Receives what a burst delivers: counts tokens (or datagrams) until the
// sender is done and nothing more came for kBurstIdle. Answers the time of
// the last arrival.
class BurstReceiver {
 public:
  virtual ~BurstReceiver() = default;
  // Takes what has arrived; the count taken.
  virtual std::size_t Take() = 0;

  Clock::time_point Run(const std::atomic<bool>& sending, std::size_t& received) {
    auto last = Clock::now();
    for (;;) {
      const std::size_t taken = Take();
      if (taken != 0) {
        received += taken;
        last = Clock::now();
      } else if (!sending.load() && Clock::now() - last > kBurstIdle) {
        return last;
      }
    }
  }
};

// The plug-in's tokens, read and acknowledged as a panel does.
class ChannelBurstReceiver final : public BurstReceiver {
 public:
  explicit ChannelBurstReceiver(LoopbackChannel& channel)
      : channel_(channel),
        available_(channel.Tag("?tokens_available?unsignedInt")),
        rx_(channel.Tag("?rx_token?string-64")),
        ack_(channel.Tag("?token_ack?boolean")) {}

  std::size_t Take() override {
    const int waiting = channel_.ReadInt(available_);
    for (int i = 0; i < waiting; ++i) {
      unsigned char token[64] = {};
      channel_.Protocol().Read(rx_, token);
      channel_.WriteBool(ack_, true);
    }
    if (waiting == 0) {
      std::this_thread::yield();
    }
    return static_cast<std::size_t>(waiting);
  }

 private:
  LoopbackChannel& channel_;
  ITag* available_;
  ITag* rx_;
  ITag* ack_;
};

// A plain recv loop on a UDP socket.
class PlainBurstReceiver final : public BurstReceiver {
 public:
  explicit PlainBurstReceiver(int fd) : fd_(fd) {}

  std::size_t Take() override {
    pollfd entry{fd_, POLLIN, 0};
    if (::poll(&entry, 1, 1) <= 0) {
      return 0;
    }
    unsigned char datagram[1536];
    return ::recv(fd_, datagram, sizeof datagram, 0) > 0 ? 1 : 0;
  }

 private:
  int fd_;
};

// A burst of kBurstDatagrams datagrams, one STX/ETX token each, sent to the
// plug-in's channel or to a plain recv loop: as fast as the sender goes
// (range(0) 0), or range(0) datagrams per second.
void BM_UdpBurst(benchmark::State& state, bool plain) {
  const auto rate = static_cast<int>(state.range(0));
  const Clock::duration spacing =
      rate == 0 ? Clock::duration::zero()
                : std::chrono::duration_cast<Clock::duration>(std::chrono::seconds(1)) / rate;
  std::size_t received = 0;
  try {
    std::uint16_t senderPort = 0;
    const FileDescriptor sender = LoopbackIo::BindUdp(kLoopback, senderPort);
    const std::uint16_t local = LoopbackIo::FreeUdpPort();
    // The datagrams go to the channel's local port, or to the plain socket's.
    std::uint16_t target = local;
    const FileDescriptor plainSocket =
        plain ? LoopbackIo::BindUdp(kLoopback, target) : FileDescriptor();
    std::unique_ptr<LoopbackChannel> channel;
    std::unique_ptr<BurstReceiver> receiver;
    if (plain) {
      receiver = std::make_unique<PlainBurstReceiver>(plainSocket.Get());
    } else {
      channel = std::make_unique<LoopbackChannel>(
          LoopbackChannel::PluginPath(),
          "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=" +
              std::to_string(senderPort) + " localPort=" + std::to_string(local) +
              " rx_prefix=02 rx_suffix=03");
      if (!channel->Connect(kConnectTimeout) || !channel->SetQueueBound(kQueueBound)) {
        state.SkipWithError("the channel did not connect");
        return;
      }
      receiver = std::make_unique<ChannelBurstReceiver>(*channel);
    }
    std::vector<LoopbackIo::Bytes> datagrams;
    for (std::size_t i = 0; i < kBurstDatagrams; ++i) {
      datagrams.push_back(
          BenchStreams::Framed({BenchStreams::Payload(i, kPayload)}, "\x02", "\x03"));
    }
    for (auto _ : state) {
      std::atomic<bool> sending{true};
      const auto start = Clock::now();
      JoiningThread burst([&] {
        for (std::size_t i = 0; i < datagrams.size(); ++i) {
          if (rate != 0) {
            std::this_thread::sleep_until(start + static_cast<int>(i) * spacing);
          }
          LoopbackIo::SendTo(sender.Get(), target, datagrams[i]);
        }
        sending = false;
      });
      const Clock::time_point last = receiver->Run(sending, received);
      state.SetIterationTime(Seconds(last - start));
    }
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  state.SetItemsProcessed(static_cast<std::int64_t>(received));
  state.counters["delivered"] =
      static_cast<double>(received) / static_cast<double>(kBurstDatagrams * state.iterations());
}

}  // namespace

BENCHMARK_CAPTURE(BM_TcpIngestNoReader, stx_etx, false)
    ->Arg(16)
    ->Arg(15)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_TcpIngestNoReader, prefix_only, true)
    ->Arg(16)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_TcpStreamReadAndAcknowledged)
    ->ArgName("idle_wait_us")
    ->Arg(0)
    ->Arg(50)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_UdpBurst, channel, false)
    ->ArgName("per_second")
    ->Arg(0)
    ->Arg(50000)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_UdpBurst, plain_recv, true)
    ->ArgName("per_second")
    ->Arg(0)
    ->Arg(50000)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
