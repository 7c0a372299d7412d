// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Token framing: the stream framer fed a long stream in receives of up to
// 1536 bytes, as the channel's worker feeds it; the datagram framer over full
// 1536-byte datagrams of many framed tokens; and the worker's whole pass
// (framing plus queueing) on a started channel over scripted host services.
// Markers are given as hexadecimal text, as the configuration gives them.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

#include "AllocationMeter.h"
#include "FramingReference.h"
#include "ScriptedChannel.h"
#include "driver/DatagramFraming.h"
#include "driver/StreamFraming.h"
#include "driver/TokenSink.h"
#include "protlib/HexText.h"

namespace {

using framing_reference::Piece;
using framing_reference::Stream;

constexpr std::size_t kStreamBytes = 64 * 1024;
constexpr std::size_t kReceiveBytes = 1536;

// The body of a token: printable bytes that never match a marker.
std::string Body(std::size_t size, std::size_t seed) {
  std::string body(size, 'a');
  for (std::size_t i = 0; i < size; ++i) {
    body[i] = static_cast<char>('a' + (i + seed) % 26);
  }
  return body;
}

// Counts the tokens it is given.
class CountingSink final : public TokenSink {
 public:
  void Token(const char* data, std::size_t length) override {
    benchmark::DoNotOptimize(data);
    benchmark::DoNotOptimize(length);
    ++count;
  }
  std::size_t count = 0;
};

// A stream of framed tokens of tokenSize bytes, about kStreamBytes long, in
// receives of up to kReceiveBytes. A silence follows every token when no
// marker ends it, and the stream when only a prefix does (it ends the last
// token).
Stream MakeStream(const std::string& prefix, const std::string& suffix, std::size_t tokenSize,
                  std::size_t& tokens, std::size_t& bytes) {
  Stream stream;
  std::string pending;
  tokens = 0;
  bytes = 0;
  const auto flush = [&stream, &pending] {
    for (std::size_t at = 0; at < pending.size(); at += kReceiveBytes) {
      stream.push_back({false, pending.substr(at, kReceiveBytes)});
    }
    pending.clear();
  };
  while (bytes + prefix.size() + tokenSize + suffix.size() <= kStreamBytes) {
    pending += prefix + Body(tokenSize, tokens) + suffix;
    bytes += prefix.size() + tokenSize + suffix.size();
    ++tokens;
    if (suffix.empty() && prefix.empty()) {
      flush();
      stream.push_back({true, {}});
    }
  }
  flush();
  if (suffix.empty() && !prefix.empty()) {
    stream.push_back({true, {}});
  }
  return stream;
}

void FeedStream(StreamFraming& framing, const Stream& stream, TokenSink& sink) {
  for (const Piece& piece : stream) {
    if (piece.silence) {
      framing.Gap(sink);
      continue;
    }
    const auto* const data = reinterpret_cast<const unsigned char*>(piece.bytes.data());
    for (std::size_t at = 0; at < piece.bytes.size();) {
      at += framing.Feed(data + at, piece.bytes.size() - at, sink).taken;
    }
  }
}

void BM_StreamFraming(benchmark::State& state, const char* prefixHex, const char* suffixHex) {
  const std::string prefix = fromHex(prefixHex);
  const std::string suffix = fromHex(suffixHex);
  std::size_t tokens = 0;
  std::size_t bytes = 0;
  const Stream stream =
      MakeStream(prefix, suffix, static_cast<std::size_t>(state.range(0)), tokens, bytes);
  StreamFraming framing(prefix, suffix);
  CountingSink sink;
  const AllocationMeter meter;
  for (auto _ : state) {
    FeedStream(framing, stream, sink);
  }
  meter.Report(state);
  if (sink.count != tokens * static_cast<std::size_t>(state.iterations())) {
    state.SkipWithError("the framer did not cut every token");
  }
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(bytes));
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(tokens));
  state.counters["tokens/stream"] = static_cast<double>(tokens);
}

// One datagram of as many framed tokens as fit in 1536 bytes, padded with
// bytes that hold no marker.
std::string MakeDatagram(const std::string& prefix, const std::string& suffix,
                         std::size_t tokenSize, std::size_t& tokens) {
  std::string datagram;
  tokens = 0;
  if (prefix.empty() && suffix.empty()) {
    tokens = 1;
    return Body(kReceiveBytes, 0);
  }
  while (datagram.size() + prefix.size() + tokenSize + suffix.size() <= kReceiveBytes) {
    datagram += prefix + Body(tokenSize, tokens) + suffix;
    ++tokens;
  }
  datagram += Body(kReceiveBytes - datagram.size(), 0);
  return datagram;
}

void BM_DatagramFraming(benchmark::State& state, const char* prefixHex, const char* suffixHex) {
  const std::string prefix = fromHex(prefixHex);
  const std::string suffix = fromHex(suffixHex);
  std::size_t tokens = 0;
  const std::string datagram =
      MakeDatagram(prefix, suffix, static_cast<std::size_t>(state.range(0)), tokens);
  const auto* const bytes = reinterpret_cast<const unsigned char*>(datagram.data());
  const DatagramFraming framing(prefix, suffix);
  CountingSink sink;
  const AllocationMeter meter;
  for (auto _ : state) {
    framing.Feed(bytes, datagram.size(), sink);
  }
  meter.Report(state);
  if (sink.count != tokens * static_cast<std::size_t>(state.iterations())) {
    state.SkipWithError("the framer did not cut every token");
  }
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(datagram.size()));
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(tokens));
  state.counters["tokens/datagram"] = static_cast<double>(tokens);
}

// The worker's pass on a connected TCP channel (STX/ETX framing, queue bound
// 100, no reader, so the queue drops its oldest token for each new one),
// one framed token of range(0) body bytes per pass; the socket is scripted,
// so only the channel's own cost is measured.
void BM_WorkerPass(benchmark::State& state) {
  const auto body = static_cast<std::size_t>(state.range(0));
  ScriptedChannel channel(
      "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=5000 rx_prefix=02 "
      "rx_suffix=03",
      true);
  Protocol_VELT& protocol = channel.Protocol();
  channel.Connect().AddRepeatedStream("\x02" + Body(body, 0) + "\x03", 1000000000);
  for (int i = 0; i < 1000; ++i) {
    protocol.Task();
  }
  const AllocationMeter meter;
  for (auto _ : state) {
    protocol.Task();
  }
  meter.Report(state);
  state.SetItemsProcessed(state.iterations());
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(body));
}

// Guards the counter itself: one allocation per iteration must read 1.
void BM_AllocationMeterCalibration(benchmark::State& state) {
  const AllocationMeter meter;
  for (auto _ : state) {
    void* volatile memory = ::operator new(16);
    ::operator delete(memory);
  }
  meter.Report(state);
}

}  // namespace

BENCHMARK(BM_AllocationMeterCalibration);

BENCHMARK_CAPTURE(BM_StreamFraming, stx_etx, "02", "03")->Arg(16)->Arg(64)->Arg(256);
BENCHMARK_CAPTURE(BM_StreamFraming, crlf_suffix, "", "0D0A")->Arg(16)->Arg(64)->Arg(256);
BENCHMARK_CAPTURE(BM_StreamFraming, prefix_only, "02", "")->Arg(16)->Arg(64)->Arg(256);
BENCHMARK_CAPTURE(BM_StreamFraming, no_markers, "", "")->Arg(16)->Arg(64)->Arg(256);

BENCHMARK_CAPTURE(BM_DatagramFraming, stx_etx, "02", "03")->Arg(8)->Arg(32)->Arg(128);
BENCHMARK_CAPTURE(BM_DatagramFraming, crlf_suffix, "", "0D0A")->Arg(8)->Arg(32)->Arg(128);
BENCHMARK_CAPTURE(BM_DatagramFraming, no_markers, "", "")->Arg(1536);

BENCHMARK(BM_WorkerPass)->Arg(15)->Arg(16)->Arg(64)->Arg(256);
