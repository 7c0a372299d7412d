// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The instance's own console through velt-host's scripted standard input:
// every reply is printed as it stands, with a line feed added where it has
// none.

#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "HostProcess.h"
#include "LoopbackPeer.h"
#include "ScratchFolder.h"

namespace {

using Line = std::optional<std::string>;

const char* const kHelp[] = {
    "help - displays this message",
    "info - displays information about the protocol version",
    "xml  - displays the protocol xml description",
    "read uri - reads data pointed by uri string",
    "write uri hexData - writes data pointed by uri string",
    "lasterror - displays the last protocol error",
    "getmaxtm - displays the max time for executing a single read/write access",
    "connect cmd - set connect ON or OFF",
    "get_stat - get status of connection",
    "set_ip_port ip port - set new ip/port values",
    "put str - put the token to send",
    "get - get the received token",
    "get_token_length - get the length of the received token",
    "tokens_available - get number of tokens received",
    "token_ack - acknowledge reading token",
};

const char* const kInfo[] = {
    "Protocol: VELT (472) v.112", "Implementation: Protocol_VELT v.100",
    "ProtocolBase v.100",         "ProtLib v.200",
    "HostMultiTask v.100",        "HostSerialFactory v.100",
    "HostSocketFactory v.100",
};

class ConsoleTranscript : public ::testing::Test {
 protected:
  ConsoleTranscript()
      : peer_(LoopbackPeer::Setup()),
        host_({"--storage", scratch_.File("storage.ini"), "--config", peer_.Config()}) {}

  void Connect() {
    ASSERT_EQ(host_.Ask("connect ON"), Line("OK"));
    ASSERT_TRUE(host_.AskUntil("get_stat", "Connected"));
  }

  ScratchFolder scratch_;
  LoopbackPeer peer_;
  HostProcess host_;
};

}  // namespace

TEST_F(ConsoleTranscript, ConnectPutGetAcknowledge) {
  ASSERT_TRUE(peer_.Ok()) << peer_.StartError();
  ASSERT_TRUE(host_.Started());
  EXPECT_EQ(host_.Ask("get_stat"), Line("Disconnected"));
  Connect();

  EXPECT_EQ(host_.Ask("put hello  world"), Line("OK"));
  EXPECT_TRUE(peer_.WaitReceived("\x02hello  world\x03"));
  EXPECT_TRUE(host_.AskUntil("tokens_available", "1"));
  EXPECT_EQ(host_.Ask("get"), Line("hello  world"));
  EXPECT_EQ(host_.Ask("get"), Line("hello  world"));
  EXPECT_EQ(host_.Ask("get_token_length"), Line("12"));

  EXPECT_EQ(host_.Ask("put second"), Line("OK"));
  EXPECT_TRUE(host_.AskUntil("tokens_available", "2"));
  EXPECT_EQ(host_.Ask("token_ack"), Line("OK"));
  EXPECT_EQ(host_.Ask("tokens_available"), Line("1"));
  EXPECT_EQ(host_.Ask("get"), Line("second"));
  EXPECT_EQ(host_.Ask("get_token_length"), Line("6"));
  EXPECT_EQ(host_.Ask("token_ack"), Line("OK"));

  EXPECT_EQ(host_.Ask("tokens_available"), Line("0"));
  EXPECT_EQ(host_.Ask("get"), Line(""));
  EXPECT_EQ(host_.Ask("get_token_length"), Line("0"));
  EXPECT_EQ(host_.Ask("token_ack"), Line("OK"));

  EXPECT_EQ(host_.Ask("connect OFF"), Line("OK"));
  EXPECT_TRUE(host_.AskUntil("get_stat", "Disconnected"));
  host_.CloseInput();
  EXPECT_EQ(host_.ReadOutput(), "");
  EXPECT_EQ(host_.ReadErrors(), "");
  EXPECT_EQ(host_.Wait(), std::optional<int>(0));
}

TEST_F(ConsoleTranscript, HelpIsTheBaseHelpThenTheDriversLines) {
  host_.Send("help\n");
  for (const char* line : kHelp) {
    EXPECT_EQ(host_.ReadLine(), Line(line));
  }
  EXPECT_EQ(host_.Ask("get_stat"), Line("Disconnected"));
}

TEST_F(ConsoleTranscript, InfoNamesTheProtocolAndTheHostsServices) {
  host_.Send("info\n");
  for (const char* line : kInfo) {
    EXPECT_EQ(host_.ReadLine(), Line(line));
  }
  EXPECT_EQ(host_.Ask("get_stat"), Line("Disconnected"));
}

TEST_F(ConsoleTranscript, ReadAndWriteTakeHexBytes) {
  EXPECT_EQ(host_.Ask("read ?SP_Gap?unsignedInt"), Line("00000000"));
  EXPECT_EQ(host_.Ask("write ?SP_Gap?unsignedInt 2c010000"), Line("written ok"));
  EXPECT_EQ(host_.Ask("read ?SP_Gap?unsignedInt"), Line("2c010000"));
  EXPECT_EQ(host_.Ask("read ?SP_RemoteIP?string-12"), Line("3132372e302e302e31000000"));
  EXPECT_EQ(host_.Ask("read"), Line("error: missing parameter (URI string)"));
  EXPECT_EQ(host_.Ask("write ?SP_Gap?unsignedInt 2c01"),
            Line("error: incorrect length of data to write"));
  EXPECT_EQ(host_.Ask("write ?SP_Gap?unsignedInt 2c01000g"), Line("error: incorrect hex data"));
  host_.CloseInput();
  EXPECT_EQ(host_.Wait(), std::optional<int>(0));
}

TEST_F(ConsoleTranscript, ReceivedTokenTravelsThroughGetAndTokenAck) {
  Connect();
  // velt-peer echoes the frame; the driver queues its body.
  EXPECT_EQ(host_.Ask("put A1"), Line("OK"));
  EXPECT_EQ(host_.Ask("put B2"), Line("OK"));
  EXPECT_TRUE(host_.AskUntil("tokens_available", "2"));
  EXPECT_EQ(host_.Ask("get"), Line("A1"));
  EXPECT_EQ(host_.Ask("token_ack"), Line("OK"));
  EXPECT_EQ(host_.Ask("get"), Line("B2"));
}

TEST_F(ConsoleTranscript, FailedCommandPrintsItsReplyAndEndsTheRunWithOne) {
  EXPECT_EQ(host_.Ask("connect on"), Line("ERROR: wrong value"));
  EXPECT_EQ(host_.Ask("connect"), Line("ERROR: new connect state is missing"));
  EXPECT_EQ(host_.Ask("put"), Line("ERROR: string to send is missing"));
  EXPECT_EQ(host_.Ask("set_ip_port 127.0.0.1"), Line("ERROR: IP and port are missing"));
  EXPECT_EQ(host_.Ask("get_stat"), Line("Disconnected"));
  host_.CloseInput();
  EXPECT_EQ(host_.ReadErrors(), "");
  EXPECT_EQ(host_.Wait(), std::optional<int>(1));
}
