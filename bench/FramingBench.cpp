// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Token framing: the stream framer fed a long stream one byte at a time, and
// the datagram framer over full 1536-byte datagrams of many framed tokens.
// Markers are given as hexadecimal text, as the configuration gives them.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "AllocationMeter.h"
#include "driver/DatagramFraming.h"
#include "driver/StreamFraming.h"
#include "protlib/HexText.h"

namespace {

constexpr std::size_t kStreamBytes = 64 * 1024;
constexpr std::size_t kDatagramBytes = 1536;
constexpr int kSilence = -1;

// The body of a token: printable bytes that never match a marker.
std::string Body(std::size_t size, std::size_t seed) {
  std::string body(size, 'a');
  for (std::size_t i = 0; i < size; ++i) {
    body[i] = static_cast<char>('a' + (i + seed) % 26);
  }
  return body;
}

// A stream of framed tokens of tokenSize bytes, about kStreamBytes long. A
// silence follows every token when no suffix ends it (without markers the
// silence is the only end; with a prefix alone it ends the last token).
std::vector<int> MakeStream(const std::string& prefix, const std::string& suffix,
                            std::size_t tokenSize, std::size_t& tokens, std::size_t& bytes) {
  std::vector<int> stream;
  tokens = 0;
  bytes = 0;
  while (bytes + prefix.size() + tokenSize + suffix.size() <= kStreamBytes) {
    const std::string frame = prefix + Body(tokenSize, tokens) + suffix;
    stream.insert(stream.end(), frame.begin(), frame.end());
    if (suffix.empty() && prefix.empty()) {
      stream.push_back(kSilence);
    }
    bytes += frame.size();
    ++tokens;
  }
  if (suffix.empty() && !prefix.empty()) {
    stream.push_back(kSilence);
  }
  return stream;
}

void BM_StreamFraming(benchmark::State& state, const char* prefixHex, const char* suffixHex) {
  const std::string prefix = fromHex(prefixHex);
  const std::string suffix = fromHex(suffixHex);
  std::size_t tokens = 0;
  std::size_t bytes = 0;
  const std::vector<int> stream =
      MakeStream(prefix, suffix, static_cast<std::size_t>(state.range(0)), tokens, bytes);
  const StreamFraming framing(prefix, suffix);
  std::size_t position = 0;
  std::size_t emitted = 0;
  const StreamFraming::ReceiveByte receive = [&](unsigned char& byte) {
    if (position >= stream.size()) {
      return 0;
    }
    const int entry = stream[position++];
    if (entry == kSilence) {
      return 0;
    }
    byte = static_cast<unsigned char>(entry);
    return 1;
  };
  const StreamFraming::Emit emit = [&](const std::string& token) {
    benchmark::DoNotOptimize(token.data());
    ++emitted;
  };
  const AllocationMeter meter;
  for (auto _ : state) {
    position = 0;
    while (position < stream.size()) {
      framing.Pass(receive, emit);
    }
  }
  meter.Report(state);
  if (emitted != tokens * static_cast<std::size_t>(state.iterations())) {
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
    return Body(kDatagramBytes, 0);
  }
  while (datagram.size() + prefix.size() + tokenSize + suffix.size() <= kDatagramBytes) {
    datagram += prefix + Body(tokenSize, tokens) + suffix;
    ++tokens;
  }
  datagram += Body(kDatagramBytes - datagram.size(), 0);
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
  std::size_t emitted = 0;
  const std::function<void(const std::string&)> emit = [&](const std::string& token) {
    benchmark::DoNotOptimize(token.data());
    ++emitted;
  };
  const AllocationMeter meter;
  for (auto _ : state) {
    framing.Split(bytes, datagram.size(), emit);
  }
  meter.Report(state);
  if (emitted != tokens * static_cast<std::size_t>(state.iterations())) {
    state.SkipWithError("the framer did not cut every token");
  }
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(datagram.size()));
  state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(tokens));
  state.counters["tokens/datagram"] = static_cast<double>(tokens);
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
