// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/PeerCommandLine.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using veltpeer::PeerCommandLine;
using veltpeer::PeerOptions;
using veltpeer::Transport;
using Arguments = std::vector<std::string>;

namespace {

// The error text for arguments that must be refused.
std::string ErrorOf(const Arguments& arguments) {
  PeerCommandLine commandLine;
  EXPECT_FALSE(commandLine.Parse(arguments));
  return commandLine.Error();
}

}  // namespace

TEST(PeerCommandLine, DefaultsForABareTransport) {
  PeerCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({"tcp"})) << commandLine.Error();
  EXPECT_EQ(commandLine.GetAction(), PeerCommandLine::Action::kRun);
  const PeerOptions& o = commandLine.Options();
  EXPECT_EQ(o.transport, Transport::kTcp);
  EXPECT_EQ(o.bindAddress, "127.0.0.1");
  EXPECT_EQ(o.port, 0);
  EXPECT_FALSE(o.echo);
  EXPECT_EQ(o.emitCount, 0U);
  EXPECT_DOUBLE_EQ(o.rate, 1.0);
  EXPECT_EQ(o.payload, "token {n}");
  EXPECT_TRUE(o.payloadCounter);
  EXPECT_EQ(o.gapMs, 500);
  EXPECT_FALSE(commandLine.Text());
  EXPECT_FALSE(commandLine.CountOnly());
}

TEST(PeerCommandLine, ReadsEveryOption) {
  PeerCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({"tcp",         "--bind",
                                 "0.0.0.0",     "--port=5000",
                                 "--rx-prefix", "02",
                                 "--rx-suffix", "0d0A",
                                 "--gap",       "250",
                                 "--echo",      "--emit",
                                 "forever",     "--rate",
                                 "0.5",         "--prefix",
                                 "none",        "--suffix",
                                 "03",          "--payload",
                                 "-{n}-",       "--delay",
                                 "10",          "--chunk",
                                 "3",           "--chunk-delay",
                                 "7",           "--close-after",
                                 "4",           "--close-after-ms",
                                 "900",         "--exit-after",
                                 "12",          "--max-seconds",
                                 "1.5",         "--text"}))
      << commandLine.Error();
  const PeerOptions& o = commandLine.Options();
  EXPECT_EQ(o.bindAddress, "0.0.0.0");
  EXPECT_EQ(o.port, 5000);
  EXPECT_EQ(o.rxPrefix, "\x02");
  EXPECT_EQ(o.rxSuffix, "\r\n");
  EXPECT_EQ(o.gapMs, 250);
  EXPECT_TRUE(o.echo);
  EXPECT_EQ(o.emitCount, PeerOptions::kForever);
  EXPECT_DOUBLE_EQ(o.rate, 0.5);
  EXPECT_EQ(o.txPrefix, "");
  EXPECT_EQ(o.txSuffix, "\x03");
  EXPECT_EQ(o.payload, "-{n}-");
  EXPECT_EQ(o.delayMs, 10);
  EXPECT_EQ(o.chunkBytes, 3U);
  EXPECT_EQ(o.chunkDelayMs, 7);
  EXPECT_EQ(o.closeAfterFrames, 4U);
  EXPECT_EQ(o.closeAfterMs, 900);
  EXPECT_EQ(o.exitAfterFrames, 12U);
  EXPECT_DOUBLE_EQ(o.maxSeconds, 1.5);
  EXPECT_TRUE(commandLine.Text());
}

TEST(PeerCommandLine, UdpWithDestinationHexPayloadAndCount) {
  PeerCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse(
      {"udp", "--to", "127.0.0.1:4000", "--emit", "3", "--payload-hex", "414200", "--count"}))
      << commandLine.Error();
  const PeerOptions& o = commandLine.Options();
  EXPECT_EQ(o.transport, Transport::kUdp);
  EXPECT_EQ(o.to, "127.0.0.1:4000");
  EXPECT_EQ(o.emitCount, 3U);
  EXPECT_EQ(o.payload, std::string("AB\0", 3));
  EXPECT_FALSE(o.payloadCounter);
  EXPECT_TRUE(commandLine.CountOnly());
}

TEST(PeerCommandLine, HelpAndVersionWinOverEverythingElse) {
  PeerCommandLine help;
  ASSERT_TRUE(help.Parse({"--bogus", "--help"}));
  EXPECT_EQ(help.GetAction(), PeerCommandLine::Action::kHelp);
  PeerCommandLine version;
  ASSERT_TRUE(version.Parse({"--version"}));
  EXPECT_EQ(version.GetAction(), PeerCommandLine::Action::kVersion);
  EXPECT_EQ(PeerCommandLine::Version(), "velt-peer " VELT_VERSION);
  EXPECT_EQ(std::string(PeerCommandLine::Usage()).rfind("Usage: velt-peer tcp|udp [options]\n", 0),
            0U);
}

TEST(PeerCommandLine, TransportErrors) {
  EXPECT_EQ(ErrorOf({}), "missing transport: tcp or udp");
  EXPECT_EQ(ErrorOf({"--echo"}), "missing transport: tcp or udp");
  EXPECT_EQ(ErrorOf({"TCP"}), "unknown transport 'TCP' (tcp or udp expected)");
  EXPECT_EQ(ErrorOf({"tcp", "udp"}), "unexpected argument 'udp'");
}

TEST(PeerCommandLine, OptionSyntaxErrors) {
  EXPECT_EQ(ErrorOf({"tcp", "--bogus"}), "unknown option '--bogus'");
  EXPECT_EQ(ErrorOf({"tcp", "-x"}), "unknown option '-x'");
  EXPECT_EQ(ErrorOf({"tcp", "--port"}), "option --port needs a value");
  EXPECT_EQ(ErrorOf({"tcp", "--echo=1"}), "option --echo takes no value");
  EXPECT_EQ(ErrorOf({"tcp", "--port", "1", "--port", "2"}), "option --port given twice");
}

TEST(PeerCommandLine, BadPortsAndNumbers) {
  EXPECT_EQ(ErrorOf({"tcp", "--port", "65536"}), "bad port '65536' (0..65535 expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--port", "-1"}), "bad port '-1' (0..65535 expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--port", "80x"}), "bad port '80x' (0..65535 expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--emit", "0"}),
            "bad value for --emit: '0' (a count of 1 or more, or forever expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--emit", "3", "--rate", "fast"}),
            "bad value for --rate: 'fast' (0, or 0.001..1000000 tokens per second, expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--emit", "3", "--rate", "0.0001"}),
            "bad value for --rate: '0.0001' (0, or 0.001..1000000 tokens per second, expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--gap", "0"}), "bad value for --gap: '0' (1..3600000 ms expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--delay", "3600001"}),
            "bad value for --delay: '3600001' (0..3600000 ms expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--chunk", "0"}),
            "bad value for --chunk: '0' (1..1000000000 bytes expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--close-after", "0"}),
            "bad value for --close-after: '0' (a count of 1 or more expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--exit-after", "x"}),
            "bad value for --exit-after: 'x' (a count of 1 or more expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--max-seconds", "0"}),
            "bad value for --max-seconds: '0' (more than 0, at most 31536000, expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--bind", ""}), "bad value for --bind: an address is needed");
}

TEST(PeerCommandLine, BadHex) {
  EXPECT_EQ(ErrorOf({"tcp", "--rx-prefix", "ABC"}),
            "bad hex for --rx-prefix: 'ABC' (pairs of hex digits, or none, expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--rx-suffix", "0G"}),
            "bad hex for --rx-suffix: '0G' (pairs of hex digits, or none, expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--emit", "1", "--prefix", "2"}),
            "bad hex for --prefix: '2' (pairs of hex digits, or none, expected)");
  EXPECT_EQ(ErrorOf({"tcp", "--emit", "1", "--payload-hex", "x1"}),
            "bad hex for --payload-hex: 'x1' (pairs of hex digits, or none, expected)");
}

TEST(PeerCommandLine, BadDestination) {
  EXPECT_EQ(ErrorOf({"udp", "--to", "127.0.0.1"}),
            "bad value for --to: bad address '127.0.0.1' (HOST:PORT expected)");
  EXPECT_EQ(ErrorOf({"udp", "--to", "127.0.0.1:99999"}),
            "bad value for --to: bad port '99999' in '127.0.0.1:99999' (0..65535 expected)");
}

TEST(PeerCommandLine, CombinationErrors) {
  EXPECT_EQ(ErrorOf({"tcp", "--to", "127.0.0.1:4000"}), "--to applies to udp only");
  EXPECT_EQ(ErrorOf({"udp", "--close-after", "2"}), "--close-after applies to tcp only");
  EXPECT_EQ(ErrorOf({"udp", "--close-after-ms", "20"}), "--close-after-ms applies to tcp only");
  EXPECT_EQ(ErrorOf({"tcp", "--rate", "5"}), "--rate needs --emit");
  EXPECT_EQ(ErrorOf({"tcp", "--payload", "x"}), "--payload needs --emit");
  EXPECT_EQ(ErrorOf({"tcp", "--emit", "1", "--payload", "x", "--payload-hex", "41"}),
            "--payload and --payload-hex exclude each other");
  EXPECT_EQ(ErrorOf({"tcp", "--chunk-delay", "5"}), "--chunk-delay needs --chunk");
  EXPECT_EQ(ErrorOf({"tcp", "--text", "--count"}), "--text and --count exclude each other");
  EXPECT_EQ(ErrorOf({"tcp", "--emit", "1", "--payload", ""}),
            "the emitted token is empty: give --payload, --prefix or --suffix");
}

TEST(PeerCommandLine, EmptyUdpTokenIsAllowed) {
  PeerCommandLine commandLine;
  EXPECT_TRUE(commandLine.Parse({"udp", "--emit", "1", "--payload", ""})) << commandLine.Error();
}
