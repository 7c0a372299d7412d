// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/PeerOutput.h"

#include <gtest/gtest.h>

using veltpeer::PeerEvent;
using veltpeer::PeerOutput;
using veltpeer::PeerTotals;
using veltpeer::Transport;
using Kind = PeerEvent::Kind;

TEST(PeerOutput, FirstLineNamesTransportAndAddress) {
  const PeerOutput tcp(Transport::kTcp, false, false);
  EXPECT_EQ(tcp.Line({Kind::kListening, "127.0.0.1:40123", ""}),
            "velt-peer: listening tcp 127.0.0.1:40123");
  const PeerOutput udp(Transport::kUdp, false, true);
  EXPECT_EQ(udp.Line({Kind::kListening, "[::1]:5000", ""}), "velt-peer: bound udp [::1]:5000");
}

TEST(PeerOutput, FrameLinesInHexOrText) {
  const PeerOutput hex(Transport::kTcp, false, false);
  EXPECT_EQ(hex.Line({Kind::kReceived, "", "ABC"}), "rx 414243");
  EXPECT_EQ(hex.Line({Kind::kSent, "",
                      "\x02"
                      "AB\x03"}),
            "tx 02414203");
  EXPECT_EQ(hex.Line({Kind::kReceived, "", ""}), "rx");
  const PeerOutput text(Transport::kTcp, true, false);
  EXPECT_EQ(text.Line({Kind::kReceived, "", "\x02hi\\\n"}), "rx \\x02hi\\\\\\x0A");
  EXPECT_EQ(text.Line({Kind::kSent, "", "token 1"}), "tx token 1");
}

TEST(PeerOutput, ConnectionLines) {
  const PeerOutput output(Transport::kTcp, false, false);
  EXPECT_EQ(output.Line({Kind::kConnected, "127.0.0.1:5555", ""}), "connected 127.0.0.1:5555");
  EXPECT_EQ(output.Line({Kind::kClosed, "", ""}), "closed");
  EXPECT_EQ(output.Line({Kind::kReset, "", ""}), "reset");
}

TEST(PeerOutput, CountOnlyPrintsNothingButTheFirstLine) {
  const PeerOutput output(Transport::kTcp, false, true);
  EXPECT_EQ(output.Line({Kind::kConnected, "127.0.0.1:5555", ""}), "");
  EXPECT_EQ(output.Line({Kind::kReceived, "", "A"}), "");
  EXPECT_EQ(output.Line({Kind::kSent, "", "A"}), "");
  EXPECT_EQ(output.Line({Kind::kClosed, "", ""}), "");
  EXPECT_EQ(output.Line({Kind::kReset, "", ""}), "");
}

TEST(PeerOutput, TotalsLine) {
  PeerTotals totals;
  totals.framesReceived = 3;
  totals.bytesReceived = 12;
  totals.framesSent = 2;
  totals.bytesSent = 8;
  totals.connections = 1;
  EXPECT_EQ(PeerOutput::TotalsLine(totals),
            "totals rx_frames=3 rx_bytes=12 tx_frames=2 tx_bytes=8 connections=1");
}
