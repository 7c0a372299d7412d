// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <chrono>
#include <cstdint>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

#include "ChildProcess.h"
#include "LoopbackIo.h"
#include "velt-peer/Peer.h"

// The example host (examples/minimal-host) run as a program against an
// in-process device simulator on loopback.

namespace {

using namespace std::chrono_literals;

// Every run of the example is bounded by its --seconds; this only stops a
// hung one.
constexpr auto kProcessLimit = 60s;

ChildProcess::Result RunExample(const std::vector<std::string>& arguments) {
  std::vector<std::string> argv{MINIMAL_HOST_PROGRAM};
  argv.insert(argv.end(), arguments.begin(), arguments.end());
  return ChildProcess::Run(argv, kProcessLimit);
}

std::vector<std::string> Lines(const std::string& text) {
  std::vector<std::string> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) {
    lines.push_back(line);
  }
  return lines;
}

veltpeer::PeerOptions TcpEmitter(std::uint64_t count, const std::string& payload) {
  veltpeer::PeerOptions options;
  options.transport = veltpeer::Transport::kTcp;
  options.emitCount = count;
  options.rate = 20;
  options.txPrefix = "\x02";
  options.txSuffix = "\x03";
  options.payload = payload;
  options.maxSeconds = 30;
  return options;
}

std::string TcpConfig(std::uint16_t port) {
  return "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
         std::to_string(port) + " rx_prefix=02 rx_suffix=03";
}

const std::vector<std::string> kStartLines = {"loaded " VELT_PLUGIN_PATH, "module bound",
                                              "channel VELT started", "connect requested",
                                              "connected"};
const std::vector<std::string> kEndLines = {"stopped", "module closed", "unloaded"};

std::vector<std::string> Expected(const std::vector<std::string>& tokenLines) {
  std::vector<std::string> lines = kStartLines;
  lines.insert(lines.end(), tokenLines.begin(), tokenLines.end());
  lines.insert(lines.end(), kEndLines.begin(), kEndLines.end());
  return lines;
}

}  // namespace

TEST(MinimalHostExample, PrintsEachFramedTcpTokenOnceInOrder) {
  veltpeer::Peer peer(TcpEmitter(3, "temp={n}"));
  const veltpeer::Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;

  const ChildProcess::Result run = RunExample({"--seconds", "2", TcpConfig(started.port)});

  ASSERT_EQ(run.status, 0) << run.err;
  EXPECT_EQ(run.err, "");
  EXPECT_EQ(Lines(run.out), Expected({"token 1 (6 bytes): temp=1", "token 2 (6 bytes): temp=2",
                                      "token 3 (6 bytes): temp=3", "received 3 tokens"}));
}

TEST(MinimalHostExample, CutsATokenAtItsZeroByteAndEscapesUnprintableBytes) {
  veltpeer::PeerOptions options = TcpEmitter(1, std::string("A\\\x01\0B", 5));
  options.payloadCounter = false;
  veltpeer::Peer peer(options);
  const veltpeer::Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;

  const ChildProcess::Result run = RunExample({"--seconds", "1.5", TcpConfig(started.port)});

  ASSERT_EQ(run.status, 0) << run.err;
  // rx_token_len counts all five bytes; rx_token ends at the zero byte.
  EXPECT_EQ(Lines(run.out), Expected({"token 1 (5 bytes): A\\\\\\x01", "received 1 tokens"}));
}

TEST(MinimalHostExample, ReceivesUdpDatagramsOnceConnected) {
  const std::uint16_t local = LoopbackIo::FreeUdpPort();
  ASSERT_NE(local, 0);
  veltpeer::PeerOptions options;
  options.transport = veltpeer::Transport::kUdp;
  options.to = "127.0.0.1:" + std::to_string(local);
  options.emitCount = veltpeer::PeerOptions::kForever;
  options.rate = 20;
  options.txSuffix = "\r\n";
  options.payload = "reading {n}";
  options.maxSeconds = 30;
  veltpeer::Peer peer(options);
  const veltpeer::Peer::Started started = peer.Start();
  ASSERT_TRUE(started.Ok()) << started.error;

  const ChildProcess::Result run =
      RunExample({"--seconds", "1.5",
                  "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=" +
                      std::to_string(started.port) + " localPort=" + std::to_string(local) +
                      " rx_suffix=0D0A"});
  peer.Stop();

  ASSERT_EQ(run.status, 0) << run.err;
  const std::vector<std::string> lines = Lines(run.out);
  ASSERT_GE(lines.size(), kStartLines.size() + kEndLines.size() + 4) << run.out;
  EXPECT_EQ(std::vector<std::string>(lines.begin(), lines.begin() + 5), kStartLines);
  EXPECT_EQ(std::vector<std::string>(lines.end() - 3, lines.end()), kEndLines);
  // Datagrams sent before the channel's socket existed are lost, so the
  // first reading printed may be any; from there on none is missing.
  const std::regex tokenLine(R"(token (\d+) \((\d+) bytes\): reading (\d+))");
  const std::size_t tokens = lines.size() - kStartLines.size() - kEndLines.size() - 1;
  long firstReading = 0;
  for (std::size_t i = 0; i < tokens; ++i) {
    const std::string& line = lines[kStartLines.size() + i];
    std::smatch match;
    ASSERT_TRUE(std::regex_match(line, match, tokenLine)) << line;
    EXPECT_EQ(std::stoul(match[1]), i + 1) << line;
    const long reading = std::stol(match[3]);
    if (i == 0) {
      firstReading = reading;
    }
    EXPECT_EQ(reading, firstReading + static_cast<long>(i)) << line;
    EXPECT_EQ(std::stoul(match[2]), std::string("reading ").size() + match[3].length()) << line;
  }
  EXPECT_EQ(lines[kStartLines.size() + tokens], "received " + std::to_string(tokens) + " tokens");
}

TEST(MinimalHostExample, ReportsARejectedConfigurationAndExitsWithOne) {
  const ChildProcess::Result run =
      RunExample({"--seconds", "1", "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1"});

  EXPECT_EQ(run.status, 1);
  EXPECT_EQ(run.out, "loaded " VELT_PLUGIN_PATH "\nmodule bound\n");
  EXPECT_EQ(
      run.err,
      "minimal-host: Config failed: Parser: parameter 'remotePort' is not found (error -1)\n");
}

TEST(MinimalHostExample, WithoutAConfigurationPrintsItsUsageAndExitsWithTwo) {
  const ChildProcess::Result run = RunExample({});

  EXPECT_EQ(run.status, 2);
  EXPECT_EQ(run.out, "");
  EXPECT_EQ(Lines(run.err).at(0),
            "usage: minimal-host [--plugin PATH] [--storage FILE] [--ident NAME] [--seconds N] "
            "CONFIG");
}
