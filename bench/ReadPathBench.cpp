// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The read path without a device: the framework's Read (block read plus
// conversion) of values up to 64 device bytes and its array-item access up to
// 256 host bytes, the tag conversions up to 256 bytes, and the driver's own
// reads of the token memory types. Within those sizes the framework promises
// no heap allocation; the counter allocs/iter shows it, and what the longer
// values cost.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>
#include <vector>

#include "AllocationMeter.h"
#include "MemoryProtocol.h"
#include "ScriptedChannel.h"
#include "TestTagBase.h"

namespace {

// Marks the results of the sizes the framework promises to serve without an
// allocation.
void Promise(benchmark::State& state, std::int64_t size, std::int64_t limit) {
  if (size <= limit) {
    state.SetLabel("no allocation promised");
  }
}

// A tag "0?<type><range(0)><conversions>" of the memory protocol.
void BM_BaseRead(benchmark::State& state, const char* type, const char* conversions) {
  MemoryProtocol protocol;
  const std::string uri = "0?" + std::string(type) + std::to_string(state.range(0)) + conversions;
  ITag* const tag = protocol.CreateTag(uri.c_str());
  if (tag == nullptr) {
    state.SkipWithError(protocol.GetLastErrorString());
    return;
  }
  std::vector<unsigned char> value(static_cast<std::size_t>(tag->GetVarLength()));
  bool read = true;
  const AllocationMeter meter;
  for (auto _ : state) {
    read = protocol.Read(tag, value.data()) && read;
    benchmark::DoNotOptimize(value.data());
  }
  meter.Report(state);
  if (!read) {
    state.SkipWithError(protocol.GetLastErrorString());
  }
  Promise(state, tag->PackedLen(), 64);
  state.SetBytesProcessed(state.iterations() * tag->PackedLen());
}

void BM_BaseArrayItem(benchmark::State& state, bool write) {
  MemoryProtocol protocol;
  const std::string uri = "0?unsignedByte-" + std::to_string(state.range(0));
  ITag* const tag = protocol.CreateTag(uri.c_str());
  if (tag == nullptr) {
    state.SkipWithError(protocol.GetLastErrorString());
    return;
  }
  const int last = static_cast<int>(state.range(0)) - 1;
  unsigned char item = 0x5A;
  bool done = true;
  const AllocationMeter meter;
  for (auto _ : state) {
    done = (write ? protocol.writeArrayItem(tag, last, &item)
                  : protocol.readArrayItem(tag, last, &item)) &&
           done;
    benchmark::DoNotOptimize(item);
  }
  meter.Report(state);
  if (!done) {
    state.SkipWithError(protocol.GetLastErrorString());
  }
  Promise(state, tag->GetVarLength(), 256);
  state.SetItemsProcessed(state.iterations());
}

// A tag of length range(0) bytes of the given array type and conversions,
// converted in one direction.
void BM_TagConvert(benchmark::State& state, ICU_Type type, ICU_Type itemType,
                   std::vector<std::string> conversions, bool toDevice) {
  const int length = static_cast<int>(state.range(0));
  TestTagBase tag(type, length, itemType);
  tag.conversionList() = std::move(conversions);
  // 0x12 is a valid packed BCD byte, so every conversion takes it.
  std::vector<unsigned char> host(static_cast<std::size_t>(length), 0x12);
  std::vector<unsigned char> device(static_cast<std::size_t>(tag.PackedLen()), 0x12);
  const unsigned char* const source = toDevice ? host.data() : device.data();
  unsigned char* const target = toDevice ? device.data() : host.data();
  bool converted = true;
  const AllocationMeter meter;
  for (auto _ : state) {
    converted = tag.Convert(source, target, toDevice) && converted;
    benchmark::DoNotOptimize(target);
  }
  meter.Report(state);
  if (!converted) {
    state.SkipWithError(tag.GetError().c_str());
  }
  Promise(state, length, 256);
  state.SetBytesProcessed(state.iterations() * length);
}

// The driver's reads through the host's Read, on a started channel whose
// queue holds one token of range(0) bytes.
void BM_DriverRead(benchmark::State& state, const char* memoryType) {
  ScriptedChannel channel(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=5000", true);
  const auto size = static_cast<std::size_t>(state.range(0));
  channel.Receive(std::string(size, 't'));
  Protocol_VELT& protocol = channel.Protocol();
  const std::string name = memoryType;
  const std::string uri =
      "?" + name + "?" +
      (name == "rx_token" ? "string-" + std::to_string(size + 1) : std::string("unsignedInt"));
  ITag* const tag = protocol.CreateTag(uri.c_str());
  if (tag == nullptr) {
    state.SkipWithError(protocol.GetLastErrorString());
    return;
  }
  std::vector<unsigned char> value(static_cast<std::size_t>(tag->GetVarLength()));
  bool read = true;
  const AllocationMeter meter;
  for (auto _ : state) {
    read = protocol.Read(tag, value.data()) && read;
    benchmark::DoNotOptimize(value.data());
  }
  meter.Report(state);
  if (!read) {
    state.SkipWithError(protocol.GetLastErrorString());
  }
  Promise(state, tag->PackedLen(), 64);
  state.SetBytesProcessed(state.iterations() * tag->PackedLen());
}

// An apply (SP_Done) of eight staged runtime parameters on a started
// channel over scripted host services, whose permanent storage is in
// memory: the apply's own cost, of which the part under queueLock is a
// share (the staging is not timed).
void BM_DriverApply(benchmark::State& state) {
  ScriptedChannel channel(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=5000", true);
  Protocol_VELT& protocol = channel.Protocol();
  const auto tag = [&protocol](const char* uri) { return protocol.CreateTag(uri); };
  ITag* const gap = tag("?SP_Gap?unsignedInt");
  ITag* const queue = tag("?SP_TokenQueueSize?unsignedInt");
  ITag* const hex = tag("?SP_HexTokens?boolean");
  ITag* const done = tag("?SP_Done?boolean");
  std::vector<ITag*> texts;
  for (const char* uri : {"?SP_RxPrefix?string-8", "?SP_RxSuffix?string-8", "?SP_TxPrefix?string-8",
                          "?SP_TxSuffix?string-8", "?SP_RemoteIP?string-16"}) {
    texts.push_back(tag(uri));
  }
  int round = 0;
  bool applied = true;
  for (auto _ : state) {
    state.PauseTiming();
    const int value = 100 + round % 7;
    const bool odd = ++round % 2 != 0;
    protocol.Write(gap, reinterpret_cast<const unsigned char*>(&value));
    protocol.Write(queue, reinterpret_cast<const unsigned char*>(&value));
    const unsigned char flag = odd ? 1 : 0;
    protocol.Write(hex, &flag);
    for (std::size_t i = 0; i < texts.size(); ++i) {
      const std::string text = i + 1 == texts.size() ? "127.0.0.1" : (odd ? "02" : "0A0B");
      std::vector<unsigned char> bytes(text.begin(), text.end());
      bytes.resize(17, 0);
      protocol.Write(texts[i], bytes.data());
    }
    state.ResumeTiming();
    applied = protocol.Write(done, &flag) && applied;
  }
  if (!applied) {
    state.SkipWithError(protocol.GetLastErrorString());
  }
}

}  // namespace

BENCHMARK(BM_DriverApply);

BENCHMARK_CAPTURE(BM_BaseRead, binary, "binary-", "")
    ->Arg(1)
    ->Arg(4)
    ->Arg(16)
    ->Arg(64)
    ->Arg(65)
    ->Arg(256)
    ->Arg(1024)
    ->Arg(4096);
BENCHMARK_CAPTURE(BM_BaseRead, int_swap4_neg, "int-", "(swap4,neg)")
    ->Arg(1)
    ->Arg(16)
    ->Arg(17)
    ->Arg(64);

BENCHMARK_CAPTURE(BM_BaseArrayItem, read, false)->Arg(16)->Arg(256)->Arg(257)->Arg(1024);
BENCHMARK_CAPTURE(BM_BaseArrayItem, write, true)->Arg(16)->Arg(256)->Arg(257)->Arg(1024);

BENCHMARK_CAPTURE(BM_TagConvert, to_device_plain, ICU_BINARY, ICU_UNSIGNED_BYTE,
                  std::vector<std::string>{}, true)
    ->Arg(4)
    ->Arg(64)
    ->Arg(256)
    ->Arg(257)
    ->Arg(4096);
BENCHMARK_CAPTURE(BM_TagConvert, to_device_swap2, ICU_UNSIGNED_SHORT_ARRAY, ICU_UNSIGNED_SHORT,
                  std::vector<std::string>{"swap2"}, true)
    ->Arg(4)
    ->Arg(64)
    ->Arg(256)
    ->Arg(258)
    ->Arg(4096);
BENCHMARK_CAPTURE(BM_TagConvert, from_device_swap4_neg, ICU_INT_ARRAY, ICU_INT,
                  std::vector<std::string>{"swap4", "neg"}, false)
    ->Arg(4)
    ->Arg(64)
    ->Arg(256)
    ->Arg(260)
    ->Arg(4096);
BENCHMARK_CAPTURE(BM_TagConvert, from_device_bcd, ICU_UNSIGNED_SHORT_ARRAY, ICU_UNSIGNED_SHORT,
                  std::vector<std::string>{"bcd"}, false)
    ->Arg(4)
    ->Arg(64)
    ->Arg(256)
    ->Arg(258)
    ->Arg(4096);
BENCHMARK_CAPTURE(BM_TagConvert, to_device_bits_inv, ICU_BOOLEAN_ARRAY, ICU_BOOLEAN,
                  std::vector<std::string>{"inv"}, true)
    ->Arg(8)
    ->Arg(64)
    ->Arg(256)
    ->Arg(257)
    ->Arg(4096);

BENCHMARK_CAPTURE(BM_DriverRead, rx_token, "rx_token")->Arg(8)->Arg(63)->Arg(127)->Arg(999);
BENCHMARK_CAPTURE(BM_DriverRead, rx_token_len, "rx_token_len")->Arg(8);
BENCHMARK_CAPTURE(BM_DriverRead, tokens_available, "tokens_available")->Arg(8);
