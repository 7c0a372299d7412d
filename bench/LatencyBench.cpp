// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// How long things take on the plug-in in the reference host over loopback:
// - a token's way from the peer's send to the host's read of it, at 10 000
//   tokens per second over TCP (percentiles over every token);
// - the reaction to connect being switched off while UDP datagrams arrive
//   every millisecond;
// - how long a tokens_available read waits while applies of 8 staged values
//   run, on a host whose permanent storage is a durable file (and, for
//   comparison, while nothing is applied).
// Every wait is bounded; a reaction that never comes is reported as the
// bound with acted=0.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdint>
#include <cstdlib>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "BenchStreams.h"
#include "LoopbackChannel.h"
#include "LoopbackIo.h"
#include "TempDirectory.h"

namespace {

using Clock = std::chrono::steady_clock;
using Microseconds = std::chrono::duration<double, std::micro>;

constexpr std::uint32_t kLoopback = 0x7F000001U;
constexpr auto kConnectTimeout = std::chrono::seconds(5);
constexpr int kLatencyTokens = 10000;
constexpr auto kTokenSpacing = std::chrono::microseconds(100);
constexpr auto kReactionBound = std::chrono::seconds(3);
constexpr auto kDatagramSpacing = std::chrono::milliseconds(1);
// The reads timed while applies run, at most.
constexpr std::size_t kMostReads = 4000000;

double Seconds(Clock::duration duration) { return std::chrono::duration<double>(duration).count(); }

// The value at fraction q of sorted samples.
double Percentile(std::vector<double>& samples, double q) {
  if (samples.empty()) {
    return 0.0;
  }
  std::sort(samples.begin(), samples.end());
  const auto at = static_cast<std::size_t>(q * static_cast<double>(samples.size() - 1));
  return samples[at];
}

std::string HexStamp(Clock::time_point at) {
  static const char kDigits[] = "0123456789ABCDEF";
  auto value = static_cast<std::uint64_t>(at.time_since_epoch().count());
  std::string text(16, '0');
  for (std::size_t i = 16; i-- > 0; value >>= 4U) {
    text[i] = kDigits[value & 0xFU];
  }
  return text;
}

Clock::time_point FromHexStamp(const char* text) {
  return Clock::time_point(Clock::duration(std::strtoll(text, nullptr, 16)));
}

// Tokens carrying their send time, 100 us apart, over TCP; the benchmark's
// thread reads each one as soon as tokens_available shows it.
void BM_TcpWireToRead(benchmark::State& state) {
  std::vector<double> latencies;
  try {
    std::uint16_t port = 0;
    const FileDescriptor listener = LoopbackIo::Listen(1, port);
    LoopbackChannel channel(LoopbackChannel::PluginPath(),
                            "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 "
                            "remotePort=" +
                                std::to_string(port) + " rx_prefix=02 rx_suffix=03");
    // A reader held up by the machine must not lose tokens to the bound.
    if (!channel.Connect(kConnectTimeout) || !channel.SetQueueBound(kLatencyTokens)) {
      throw std::runtime_error("the channel did not connect");
    }
    const FileDescriptor peer = LoopbackIo::Accept(listener.Get(), kConnectTimeout);
    ITag* const available = channel.Tag("?tokens_available?unsignedInt");
    ITag* const rx = channel.Tag("?rx_token?string-64");
    ITag* const ack = channel.Tag("?token_ack?boolean");
    for (auto _ : state) {
      const auto start = Clock::now();
      JoiningThread sender([&peer, start] {
        for (int i = 0; i < kLatencyTokens; ++i) {
          std::this_thread::sleep_until(start + i * kTokenSpacing);
          const std::string stamp = HexStamp(Clock::now());
          LoopbackIo::SendAll(peer.Get(), BenchStreams::Framed({stamp}, "\x02", "\x03"));
        }
      });
      const auto deadline = start + kLatencyTokens * kTokenSpacing + std::chrono::seconds(5);
      int taken = 0;
      while (taken < kLatencyTokens && Clock::now() < deadline) {
        const int waiting = channel.ReadInt(available);
        for (int i = 0; i < waiting; ++i, ++taken) {
          char token[64] = {};
          channel.Protocol().Read(rx, reinterpret_cast<unsigned char*>(token));
          latencies.push_back(Microseconds(Clock::now() - FromHexStamp(token)).count());
          channel.WriteBool(ack, true);
        }
        if (waiting == 0) {
          std::this_thread::yield();
        }
      }
      state.SetIterationTime(Seconds(Clock::now() - start));
      if (taken < kLatencyTokens) {
        state.SkipWithError("the tokens did not arrive in time");
        break;
      }
    }
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  state.counters["p50_us"] = Percentile(latencies, 0.50);
  state.counters["p99_us"] = Percentile(latencies, 0.99);
  state.counters["max_us"] = Percentile(latencies, 1.0);
}

// Datagrams every millisecond to a connected UDP channel; connect is written
// 0 and conn_stat watched until it reads 0.
void BM_ConnectOffUnderUdpTraffic(benchmark::State& state) {
  std::vector<double> reactions;
  int acted = 0;
  try {
    std::uint16_t senderPort = 0;
    const FileDescriptor sender = LoopbackIo::BindUdp(kLoopback, senderPort);
    const std::uint16_t local = LoopbackIo::FreeUdpPort();
    LoopbackChannel channel(LoopbackChannel::PluginPath(),
                            "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 "
                            "remotePort=" +
                                std::to_string(senderPort) + " localPort=" + std::to_string(local) +
                                " token_queue_size=10");
    ITag* const connect = channel.Tag("?connect?boolean");
    ITag* const status = channel.Tag("?conn_stat?boolean");
    std::atomic<bool> traffic{true};
    JoiningThread source([&] {
      const LoopbackIo::Bytes datagram = LoopbackIo::FromText("tick");
      for (auto next = Clock::now(); traffic.load(); next += kDatagramSpacing) {
        std::this_thread::sleep_until(next);
        LoopbackIo::SendTo(sender.Get(), local, datagram);
      }
    });
    for (auto _ : state) {
      if (!channel.Connect(kConnectTimeout)) {
        state.SkipWithError("the channel did not connect");
        break;
      }
      std::this_thread::sleep_for(std::chrono::milliseconds(50));
      const auto start = Clock::now();
      channel.WriteBool(connect, false);
      while (channel.ReadInt(status) != 0 && Clock::now() - start < kReactionBound) {
        std::this_thread::sleep_for(std::chrono::microseconds(50));
      }
      const auto reaction = Clock::now() - start;
      acted += channel.ReadInt(status) == 0 ? 1 : 0;
      reactions.push_back(std::chrono::duration<double, std::milli>(reaction).count());
      state.SetIterationTime(Seconds(reaction));
    }
    traffic = false;
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  state.counters["acted"] = reactions.empty() ? 0.0 : acted / static_cast<double>(reactions.size());
  state.counters["max_ms"] = Percentile(reactions, 1.0);
}

// The eight runtime parameters an apply writes, with values that change
// from one apply to the next (the remote address is written unchanged, so
// the socket is kept).
void StageEight(LoopbackChannel& channel, int round) {
  const bool odd = round % 2 != 0;
  channel.WriteInt(channel.Tag("?SP_Gap?unsignedInt"), 100 + round);
  channel.WriteText(channel.Tag("?SP_RxPrefix?string-8"), odd ? "02" : "0202");
  channel.WriteText(channel.Tag("?SP_RxSuffix?string-8"), odd ? "03" : "0303");
  channel.WriteText(channel.Tag("?SP_TxPrefix?string-8"), odd ? "02" : "0A");
  channel.WriteText(channel.Tag("?SP_TxSuffix?string-8"), odd ? "03" : "0D");
  channel.WriteInt(channel.Tag("?SP_TokenQueueSize?unsignedInt"), 100 + round);
  channel.WriteBool(channel.Tag("?SP_HexTokens?boolean"), odd);
  channel.WriteText(channel.Tag("?SP_RemoteIP?string-16"), "127.0.0.1");
}

// A host thread reads tokens_available without pause and times each read,
// while the benchmark's thread applies eight staged values per iteration
// (or, without applying, waits as long as an apply took).
void BM_ReadDuringApply(benchmark::State& state, bool applying) {
  std::vector<double> waits;
  try {
    const TempDirectory folder;
    LoopbackChannel channel(LoopbackChannel::PluginPath(),
                            "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 "
                            "remotePort=9",
                            folder.File("storage"));
    ITag* const available = channel.Tag("?tokens_available?unsignedInt");
    ITag* const done = channel.Tag("?SP_Done?boolean");
    std::atomic<bool> reading{true};
    waits.reserve(kMostReads);
    JoiningThread reader([&] {
      while (reading.load() && waits.size() < kMostReads) {
        const auto start = Clock::now();
        channel.ReadInt(available);
        waits.push_back(Microseconds(Clock::now() - start).count());
      }
    });
    int round = 0;
    for (auto _ : state) {
      StageEight(channel, round++);
      const auto start = Clock::now();
      if (applying) {
        channel.WriteBool(done, true);
      } else {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
      }
      state.SetIterationTime(Seconds(Clock::now() - start));
    }
    reading = false;
    reader.Join();
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  state.counters["reads"] = static_cast<double>(waits.size());
  state.counters["p99_read_us"] = Percentile(waits, 0.99);
  state.counters["p99.99_read_us"] = Percentile(waits, 0.9999);
  state.counters["longest_read_us"] = Percentile(waits, 1.0);
}

}  // namespace

BENCHMARK(BM_TcpWireToRead)->Iterations(1)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ConnectOffUnderUdpTraffic)
    ->Iterations(5)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_ReadDuringApply, applying, true)
    ->Iterations(20)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_ReadDuringApply, idle, false)
    ->Iterations(20)
    ->UseManualTime()
    ->Unit(benchmark::kMillisecond);
