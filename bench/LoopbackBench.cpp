// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// End to end on the reference host over loopback: the built plug-in receives
// UDP datagrams and a TCP stream of framed tokens, which a host thread reads
// (tokens_available, rx_token) and acknowledges (token_ack) as a panel does;
// and it sends tokens written to tx_token to a peer. Every wait is bounded.

#include <benchmark/benchmark.h>

#include <chrono>
#include <cstring>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "BenchStreams.h"
#include "LoopbackChannel.h"
#include "LoopbackIo.h"
#include "PeerDrain.h"
#include "TokenReader.h"

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::size_t kPayload = 32;
constexpr auto kConnectTimeout = std::chrono::seconds(5);
// The longest wait for the tokens of one iteration.
constexpr auto kTokenTimeout = std::chrono::milliseconds(2000);
// The longest wait for sent frames to reach the peer after the loop.
constexpr auto kDeliveryTimeout = std::chrono::seconds(2);
constexpr std::uint32_t kLoopback = 0x7F000001U;

std::vector<std::string> Payloads(std::size_t count) {
  return BenchStreams::Payloads(count, kPayload);
}

LoopbackIo::Bytes Framed(const std::vector<std::string>& payloads) {
  return BenchStreams::Framed(payloads, "\x02", "\x03");
}

// A port nobody holds right now, for the channel's own socket.
std::uint16_t FreeUdpPort() {
  std::uint16_t port = 0;
  LoopbackIo::BindUdp(kLoopback, port);
  return port;
}

std::string Config(const std::string& socketType, std::uint16_t remotePort,
                   std::uint16_t localPort) {
  return "CfgVer=1 model=1 socketType=" + socketType +
         " remoteIpAddress=127.0.0.1 remotePort=" + std::to_string(remotePort) +
         " localPort=" + std::to_string(localPort) +
         " rx_prefix=02 rx_suffix=03 tx_prefix=02 tx_suffix=03 token_queue_size=10000";
}

void Finish(benchmark::State& state, std::size_t tokensPerIteration) {
  const auto tokens = state.iterations() * static_cast<std::int64_t>(tokensPerIteration);
  state.SetItemsProcessed(tokens);
  state.SetBytesProcessed(tokens * static_cast<std::int64_t>(kPayload));
}

// UDP datagrams of range(0) framed tokens each, one datagram per iteration.
void BM_UdpTokensReadAndAcknowledged(benchmark::State& state) {
  const auto perDatagram = static_cast<std::size_t>(state.range(0));
  try {
    std::uint16_t peerPort = 0;
    const FileDescriptor peer = LoopbackIo::BindUdp(kLoopback, peerPort);
    const std::uint16_t local = FreeUdpPort();
    LoopbackChannel channel(LoopbackChannel::PluginPath(), Config("UDP", peerPort, local));
    if (!channel.Connect(kConnectTimeout)) {
      state.SkipWithError("the channel did not connect");
      return;
    }
    TokenReader reader(channel);
    const std::vector<std::string> payloads = Payloads(perDatagram);
    const LoopbackIo::Bytes datagram = Framed(payloads);
    std::string error;
    for (auto _ : state) {
      LoopbackIo::SendTo(peer.Get(), local, datagram);
      if (!reader.Take(payloads, kTokenTimeout, error)) {
        state.SkipWithError(error.c_str());
        break;
      }
    }
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  Finish(state, perDatagram);
}

// A TCP stream carrying range(0) framed tokens per iteration in one write.
void BM_TcpTokensReadAndAcknowledged(benchmark::State& state) {
  const auto perWrite = static_cast<std::size_t>(state.range(0));
  try {
    std::uint16_t port = 0;
    const FileDescriptor listener = LoopbackIo::Listen(1, port);
    LoopbackChannel channel(LoopbackChannel::PluginPath(), Config("TCP", port, 0));
    if (!channel.Connect(kConnectTimeout)) {
      state.SkipWithError("the channel did not connect");
      return;
    }
    const FileDescriptor peer = LoopbackIo::Accept(listener.Get(), kConnectTimeout);
    if (!peer.Valid()) {
      state.SkipWithError("the channel's connection was not accepted");
      return;
    }
    TokenReader reader(channel);
    const std::vector<std::string> payloads = Payloads(perWrite);
    const LoopbackIo::Bytes frames = Framed(payloads);
    std::string error;
    for (auto _ : state) {
      LoopbackIo::SendAll(peer.Get(), frames);
      if (!reader.Take(payloads, kTokenTimeout, error)) {
        state.SkipWithError(error.c_str());
        break;
      }
    }
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  Finish(state, perWrite);
}

// Writes to tx_token, each sent to the peer as one framed token.
void BM_TxTokenSend(benchmark::State& state, bool tcp) {
  std::uint64_t sent = 0;
  std::uint64_t delivered = 0;
  try {
    std::uint16_t port = 0;
    const FileDescriptor listener =
        tcp ? LoopbackIo::Listen(1, port) : LoopbackIo::BindUdp(kLoopback, port);
    LoopbackChannel channel(LoopbackChannel::PluginPath(),
                            Config(tcp ? "TCP" : "UDP", port, tcp ? 0 : FreeUdpPort()));
    if (!channel.Connect(kConnectTimeout)) {
      state.SkipWithError("the channel did not connect");
      return;
    }
    const FileDescriptor accepted =
        tcp ? LoopbackIo::Accept(listener.Get(), kConnectTimeout) : FileDescriptor();
    const int peer = tcp ? accepted.Get() : listener.Get();
    if (peer < 0) {
      state.SkipWithError("the channel's connection was not accepted");
      return;
    }
    const PeerDrain drain(peer);
    ITag* const tx = channel.Tag("?tx_token?string-64");
    unsigned char text[65] = {};
    const std::string payload = BenchStreams::Payload(0, kPayload);
    std::memcpy(text, payload.data(), payload.size());
    for (auto _ : state) {
      if (!channel.Protocol().Write(tx, text)) {
        state.SkipWithError(channel.LastError().c_str());
        break;
      }
      ++sent;
    }
    const std::uint64_t frameBytes = sent * (kPayload + 2);
    const auto deadline = Clock::now() + kDeliveryTimeout;
    while (drain.Bytes() < frameBytes && Clock::now() < deadline) {
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    delivered = drain.Bytes() / (kPayload + 2);
  } catch (const std::exception& failure) {
    state.SkipWithError(failure.what());
    return;
  }
  state.SetItemsProcessed(static_cast<std::int64_t>(sent));
  state.SetBytesProcessed(static_cast<std::int64_t>(sent * (kPayload + 2)));
  state.counters["delivered"] =
      sent == 0 ? 0.0 : static_cast<double>(delivered) / static_cast<double>(sent);
}

}  // namespace

BENCHMARK(BM_UdpTokensReadAndAcknowledged)->Arg(1)->Arg(16)->Arg(45)->UseRealTime();
BENCHMARK(BM_TcpTokensReadAndAcknowledged)->Arg(1)->Arg(16)->Arg(64)->UseRealTime();
BENCHMARK_CAPTURE(BM_TxTokenSend, udp, false)->UseRealTime();
BENCHMARK_CAPTURE(BM_TxTokenSend, tcp, true)->UseRealTime();
