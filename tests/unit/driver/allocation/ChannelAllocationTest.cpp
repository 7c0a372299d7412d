// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Heap allocations of the worker per received token, counted on the
// worker's thread (here the test's own, which runs the passes). Once the
// token queue has grown to its bound, a token of up to 15 bytes costs no
// allocation and a longer one at most one.

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "AllocationCounter.h"
#include "ScriptedChannel.h"

namespace {

constexpr int kWarmUpPasses = 300;

std::string Frame(std::size_t bodyBytes, char fill) {
  return "\x02" + std::string(bodyBytes, fill) + "\x03";
}

class ChannelAllocation : public ::testing::Test {
 protected:
  // Allocations of count passes after the warm-up.
  static std::uint64_t AllocationsOfPasses(Protocol_VELT& protocol, int count) {
    for (int i = 0; i < kWarmUpPasses; ++i) {
      protocol.Task();
    }
    const AllocationCounter counter;
    for (int i = 0; i < count; ++i) {
      protocol.Task();
    }
    return counter.count();
  }
};

const char kTcp[] =
    "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=5000 rx_prefix=02 "
    "rx_suffix=03";
const char kUdp[] =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=5000 rx_prefix=02 "
    "rx_suffix=03";

}  // namespace

TEST_F(ChannelAllocation, StreamTokensOfFifteenBytesAllocateNothing) {
  ScriptedChannel channel(kTcp, true);
  ScriptedSocket& socket = channel.Connect();
  socket.AddRepeatedStream(Frame(15, 'a'), 100000);
  // One token per pass.
  EXPECT_EQ(AllocationsOfPasses(channel.Protocol(), 2000), 0U);
}

TEST_F(ChannelAllocation, HexStreamTokensOfFifteenBytesAllocateNothing) {
  ScriptedChannel channel(std::string(kTcp) + " hex_tokens=true", true);
  ScriptedSocket& socket = channel.Connect();
  socket.AddRepeatedStream(Frame(15, 'a'), 100000);
  EXPECT_EQ(AllocationsOfPasses(channel.Protocol(), 2000), 0U);
}

TEST_F(ChannelAllocation, LongerStreamTokensAllocateAtMostOnceEach) {
  for (const std::size_t body : {16U, 64U, 65U, 999U}) {
    ScriptedChannel channel(kTcp, true);
    ScriptedSocket& socket = channel.Connect();
    socket.AddRepeatedStream(Frame(body, 'b'), 100000);
    EXPECT_LE(AllocationsOfPasses(channel.Protocol(), 1000), 1000U) << body;
  }
}

TEST_F(ChannelAllocation, DatagramTokensOfFifteenBytesAllocateNothing) {
  ScriptedChannel channel(kUdp, true);
  ScriptedSocket& socket = channel.Connect();
  // Each pass takes every datagram there is: one per pass here, the pass
  // ending on the time-out after it.
  for (int i = 0; i < kWarmUpPasses + 1000; ++i) {
    socket.AddDatagram(Frame(15, 'c'));
    socket.AddTimeout();
  }
  EXPECT_EQ(AllocationsOfPasses(channel.Protocol(), 1000), 0U);
  EXPECT_EQ(socket.Pending(), 0U);
}
