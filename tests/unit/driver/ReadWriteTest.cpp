// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <chrono>
#include <cstring>
#include <future>
#include <string>
#include <utility>
#include <vector>

#include "DriverFixture.h"

namespace {

class ReadWriteTest : public DriverFixture {
 protected:
  void Queue(const std::string& token) {
    TokenQueue::Guard held(protocol->getTokenQueue());
    held.addToken(token);
  }
  std::size_t Queued() {
    TokenQueue::Guard held(protocol->getTokenQueue());
    return held.Size();
  }
};

}  // namespace

// Reading.

TEST_F(ReadWriteTest, ReadingAnEmptyQueueGivesZeros) {
  Started(kUdpConfig);
  bool ok = false;
  EXPECT_EQ(ReadBytes(Tag("?rx_token?string-6"), &ok), std::vector<unsigned char>(6, 0));
  EXPECT_TRUE(ok);
  EXPECT_EQ(ReadInt(Tag("?rx_token_len?unsignedInt"), &ok), 0);
  EXPECT_TRUE(ok);
  EXPECT_EQ(ReadInt(Tag("?tokens_available?unsignedInt"), &ok), 0);
  EXPECT_TRUE(ok);
}

TEST_F(ReadWriteTest, NineByteTokenFitsATagOfTen) {
  Started(kUdpConfig);
  Queue("123456789");
  bool ok = false;
  const auto bytes = ReadBytes(Tag("?rx_token?string-10"), &ok);
  EXPECT_TRUE(ok);
  EXPECT_EQ(std::string(bytes.begin(), bytes.end()), std::string("123456789\0", 10));
}

TEST_F(ReadWriteTest, TokenAsLongAsTheTagIsTooLong) {
  Started(kUdpConfig);
  Queue("123456789");
  bool ok = true;
  ReadBytes(Tag("?rx_token?string-9"), &ok);
  EXPECT_FALSE(ok);
  EXPECT_EQ(protocol->GetLastError(), -1);
  EXPECT_STREQ(protocol->GetLastErrorString(), "token too long");
}

TEST_F(ReadWriteTest, TokenWithAZeroByteReadsCutButCountsWhole) {
  Started(kUdpConfig);
  Queue(std::string("ab\0cd", 5));
  EXPECT_EQ(ReadText(Tag("?rx_token?string-10")), "ab");
  EXPECT_EQ(ReadInt(Tag("?rx_token_len?unsignedInt")), 5);
}

TEST_F(ReadWriteTest, TooLongTestUsesTheWholeStoredLength) {
  Started(kUdpConfig);
  Queue(std::string("ab\0cdef", 7));
  bool ok = true;
  ReadBytes(Tag("?rx_token?string-7"), &ok);
  EXPECT_FALSE(ok);
  EXPECT_STREQ(protocol->GetLastErrorString(), "token too long");
  EXPECT_EQ(ReadText(Tag("?rx_token?string-8"), &ok), "ab");
  EXPECT_TRUE(ok);
}

TEST_F(ReadWriteTest, ReadingTwiceGivesTheSameTokenUntilAcknowledged) {
  Started(kUdpConfig);
  Queue("first");
  Queue("second");
  ITag* const rx = Tag("?rx_token?string-10");
  EXPECT_EQ(ReadText(rx), "first");
  EXPECT_EQ(ReadText(rx), "first");
  EXPECT_EQ(ReadInt(Tag("?tokens_available?unsignedInt")), 2);
  EXPECT_TRUE(WriteBool(Tag("?token_ack?boolean"), false));
  EXPECT_EQ(ReadText(rx), "second");
  EXPECT_EQ(ReadInt(Tag("?rx_token_len?unsignedInt")), 6);
}

TEST_F(ReadWriteTest, ConnectionFlagsRead) {
  Started(kUdpConfig);
  ITag* const status = Tag("?conn_stat?boolean");
  ITag* const connect = Tag("?connect?boolean");
  EXPECT_FALSE(ReadBool(status));
  EXPECT_FALSE(ReadBool(connect));
  EXPECT_TRUE(WriteBool(connect, true));
  EXPECT_TRUE(ReadBool(connect));
  Pass(2);
  EXPECT_TRUE(ReadBool(status));
}

TEST_F(ReadWriteTest, WriteOnlyTypesReadAsZero) {
  Started(kUdpConfig);
  EXPECT_EQ(ReadBytes(Tag("?tx_token?string-4")), std::vector<unsigned char>(4, 0));
  EXPECT_FALSE(ReadBool(Tag("?token_ack?boolean")));
  EXPECT_FALSE(ReadBool(Tag("?SP_Done?boolean")));
}

TEST_F(ReadWriteTest, AnyReadBeforeStartFails) {
  Create(kUdpConfig);
  for (const char* uri : {"?rx_token?string-4", "?conn_stat?boolean", "?SP_Gap?unsignedInt"}) {
    bool ok = true;
    ReadBytes(Tag(uri), &ok);
    EXPECT_FALSE(ok) << uri;
    EXPECT_EQ(protocol->GetLastError(), -3);
    EXPECT_STREQ(protocol->GetLastErrorString(), "Protocol not started");
  }
}

TEST_F(ReadWriteTest, RuntimeParametersReadTheirWorkingValues) {
  Started(std::string(kUdpConfig) + " rx_prefix=0d0A gap=40 hex_tokens=true");
  EXPECT_EQ(ReadText(Tag("?SP_SocketType?string-4")), "UDP");
  EXPECT_EQ(ReadText(Tag("?SP_RemoteIP?string-16")), "127.0.0.1");
  EXPECT_EQ(ReadShort(Tag("?SP_RemotePort?unsignedShort")), 5000);
  EXPECT_EQ(ReadText(Tag("?SP_LocalIP?string-16")), "0.0.0.0");
  EXPECT_EQ(ReadShort(Tag("?SP_LocalPort?unsignedShort")), 6000);
  EXPECT_EQ(ReadText(Tag("?SP_BroadcastType?string-8")), "Global");
  EXPECT_EQ(ReadText(Tag("?SP_RxPrefix?string-8")), "0d0A");
  EXPECT_EQ(ReadText(Tag("?SP_RxSuffix?string-8")), "");
  EXPECT_EQ(ReadInt(Tag("?SP_Gap?unsignedInt")), 40);
  EXPECT_TRUE(ReadBool(Tag("?SP_HexTokens?boolean")));
  EXPECT_EQ(ReadInt(Tag("?SP_TokenQueueSize?unsignedInt")), 100);
}

TEST_F(ReadWriteTest, RuntimeTextTooLongForTheTag) {
  Started(kUdpConfig);
  bool ok = true;
  ReadBytes(Tag("?SP_RemoteIP?string-9"), &ok);
  EXPECT_FALSE(ok);
  EXPECT_STREQ(protocol->GetLastErrorString(), "remote ip address too long to read");
  ReadBytes(Tag("?SP_SocketType?string-3"), &ok);
  EXPECT_STREQ(protocol->GetLastErrorString(), "socket type too long to read");
  ReadBytes(Tag("?SP_BroadcastType?string-6"), &ok);
  EXPECT_STREQ(protocol->GetLastErrorString(), "broadcast address too long to read");
  ReadBytes(Tag("?SP_LocalIP?string-7"), &ok);
  EXPECT_STREQ(protocol->GetLastErrorString(), "local ip address too long to read");
}

TEST_F(ReadWriteTest, StagedValueReadsBackBeforeItIsApplied) {
  Started(kUdpConfig);
  ITag* const ip = Tag("?SP_RemoteIP?string-16");
  EXPECT_TRUE(WriteText(ip, "127.0.0.77"));
  EXPECT_EQ(ReadText(ip), "127.0.0.77");
  EXPECT_EQ(protocol->getSettings().text(Setting::RemoteIp), "127.0.0.1");
}

TEST_F(ReadWriteTest, StagedNumberAndFlagReadBackBeforeTheyAreApplied) {
  Started(kUdpConfig);
  ITag* const gap = Tag("?SP_Gap?unsignedInt");
  ITag* const hex = Tag("?SP_HexTokens?boolean");
  EXPECT_TRUE(WriteInt(gap, 100));
  EXPECT_TRUE(WriteBool(hex, true));
  EXPECT_EQ(ReadInt(gap), 100);
  EXPECT_TRUE(ReadBool(hex));
  EXPECT_EQ(protocol->getSettings().number(Setting::Gap), 0);
  EXPECT_FALSE(protocol->getSettings().flag(Setting::HexTokens));
}

TEST_F(ReadWriteTest, PortReadsTheLowTwoBytesOfTheValue) {
  storage.presetInt("VELT", "remote_port", 70000);
  Started(kUdpConfig);
  ITag* const port = Tag("?SP_RemotePort?unsignedShort");
  EXPECT_EQ(ReadShort(port), 70000 & 0xFFFF);
  EXPECT_TRUE(WriteShort(port, 0xBEEF));
  EXPECT_EQ(ReadShort(port), 0xBEEF);
}

// Writing.

TEST_F(ReadWriteTest, AcknowledgingWithZeroRemovesOneToken) {
  Started(kUdpConfig);
  Queue("a");
  Queue("b");
  ITag* const ack = Tag("?token_ack?boolean");
  EXPECT_TRUE(WriteBool(ack, false));
  EXPECT_EQ(Queued(), 1U);
  EXPECT_TRUE(WriteBool(ack, true));
  EXPECT_TRUE(WriteBool(ack, true));
  EXPECT_EQ(Queued(), 0U);
}

TEST_F(ReadWriteTest, HexTokenIsSentBetweenTheDecodedMarkers) {
  Connected(std::string(kUdpConfig) + " hex_tokens=true tx_prefix=02 tx_suffix=0d0a");
  ITag* const tx = Tag("?tx_token?string-10");
  EXPECT_TRUE(WriteText(tx, "0A0B"));
  EXPECT_EQ(Sock().Sends(), std::vector<std::string>{Bytes("020A0B0D0A")});
  EXPECT_FALSE(WriteText(tx, "0A0"));
  EXPECT_EQ(protocol->GetLastError(), -1);
  EXPECT_STREQ(protocol->GetLastErrorString(), "token to send must be in hex format");
  EXPECT_EQ(Sock().Sends().size(), 1U);
}

TEST_F(ReadWriteTest, TextTokenIsSentWithoutItsTerminator) {
  Connected(std::string(kUdpConfig) + " tx_suffix=03");
  EXPECT_TRUE(WriteText(Tag("?tx_token?string-10"), "hi there"));
  EXPECT_EQ(Sock().Sends(), std::vector<std::string>{"hi there" + Bytes("03")});
}

TEST_F(ReadWriteTest, TokenWrittenIsSentUnderTheChannelLockAndPutWithoutIt) {
  Connected(std::string(kUdpConfig) + " tx_suffix=03");
  EXPECT_TRUE(WriteText(Tag("?tx_token?string-10"), "hi"));
  EXPECT_EQ(Command("put 41"), "OK");
  EXPECT_EQ(Sock().Sends(), (std::vector<std::string>{"hi" + Bytes("03"), "41" + Bytes("03")}));
  // A tx_token write sends under queueLock, as every write to the channel
  // acts; the console's put, which takes the lock for the queue alone, sends
  // after releasing it.
  EXPECT_EQ(Sock().LocksHeldAtSends(), (std::vector<int>{1, 0}));
}

TEST_F(ReadWriteTest, TokenFillingTheWholeTagIsSentWhole) {
  Connected(kUdpConfig);
  EXPECT_TRUE(WriteText(Tag("?tx_token?string-4"), "abcd"));
  EXPECT_EQ(Sock().Sends(), std::vector<std::string>{"abcd"});
}

TEST_F(ReadWriteTest, SendingWithoutASocketStillSucceeds) {
  Started(kUdpConfig);
  sockets.FailCreates(1);
  Pass();
  EXPECT_EQ(sockets.Live(), 0);
  EXPECT_TRUE(WriteText(Tag("?tx_token?string-4"), "abc"));
}

TEST_F(ReadWriteTest, ConnectWriteSetsTheRequest) {
  Started(kUdpConfig);
  ITag* const connect = Tag("?connect?boolean");
  EXPECT_TRUE(WriteBool(connect, true));
  EXPECT_TRUE(protocol->isConnectRequested());
  EXPECT_TRUE(WriteBool(connect, false));
  EXPECT_FALSE(protocol->isConnectRequested());
}

TEST_F(ReadWriteTest, ReadOnlyTypesCannotBeWritten) {
  Started(kUdpConfig);
  for (const char* uri : {"?rx_token?string-4", "?rx_token_len?unsignedInt",
                          "?tokens_available?unsignedInt", "?conn_stat?boolean"}) {
    EXPECT_FALSE(WriteInt(Tag(uri), 1)) << uri;
    EXPECT_EQ(protocol->GetLastError(), -1);
    EXPECT_STREQ(protocol->GetLastErrorString(), "writing to read_only type");
  }
}

TEST_F(ReadWriteTest, WritingPastTheLargestIndexIsRefused) {
  Started(kUdpConfig);
  EXPECT_FALSE(WriteText(Tag("?SP_RemoteIP?string-10000"), "1.2.3.4"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "writing after the end of memory type");
  EXPECT_TRUE(WriteText(Tag("?SP_RemoteIP?string-9999"), "1.2.3.4"));
}

TEST_F(ReadWriteTest, WritesNeverReadTheOldValueFirst) {
  // Reading these tags would fail (their values do not fit), so a write that
  // read the old value before writing would fail too.
  Started(kUdpConfig);
  EXPECT_TRUE(WriteText(Tag("?SP_RemoteIP?string-4"), "1.2"));
  EXPECT_TRUE(WriteText(Tag("?SP_SocketType?string-3"), "TCP"));
  EXPECT_TRUE(WriteText(Tag("?SP_BroadcastType?string-6"), "Local"));
}

TEST_F(ReadWriteTest, StagingValidatesTheValue) {
  Started(kUdpConfig);
  EXPECT_FALSE(WriteText(Tag("?SP_SocketType?string-4"), "udp"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "illegal socket type");
  EXPECT_FALSE(WriteText(Tag("?SP_BroadcastType?string-8"), "global"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "illegal broadcast type");
  EXPECT_FALSE(WriteText(Tag("?SP_RxPrefix?string-8"), "ABC"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "Rx prefix value is not hex format");
  EXPECT_FALSE(WriteText(Tag("?SP_RxSuffix?string-8"), "0G"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "Rx suffix value is not hex format");
  EXPECT_FALSE(WriteText(Tag("?SP_TxPrefix?string-8"), "x"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "Tx prefix value is not hex format");
  EXPECT_FALSE(WriteText(Tag("?SP_TxSuffix?string-8"), "123"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "Tx suffix value is not hex format");
  EXPECT_TRUE(WriteText(Tag("?SP_RxPrefix?string-8"), "none"));
  EXPECT_TRUE(WriteInt(Tag("?SP_TokenQueueSize?unsignedInt"), 0));
}

TEST_F(ReadWriteTest, StagedPortChangesNothingUntilApplied) {
  Connected(kUdpConfig);
  Queue("old");
  EXPECT_TRUE(WriteShort(Tag("?SP_RemotePort?unsignedShort"), 5001));
  sockets.ClearLog();
  Pass();
  EXPECT_EQ(sockets.Log(), std::vector<std::string>{});
  EXPECT_EQ(Sock().Connects().back().port, 5000);
  EXPECT_TRUE(WriteBool(Tag("?SP_Done?boolean"), true));
  EXPECT_EQ(Queued(), 0U);
  Pass();
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 6000 0 0 -> #3"}));
  EXPECT_EQ(Sock().Connects().back().port, 5001);
}

TEST_F(ReadWriteTest, AppliedGapTakesEffectWithoutANewSocket) {
  Connected(kTcpConfig);
  EXPECT_TRUE(WriteInt(Tag("?SP_Gap?unsignedInt"), 100));
  EXPECT_TRUE(WriteBool(Tag("?SP_Done?boolean"), false));
  EXPECT_EQ(protocol->getSettings().number(Setting::Gap), 100);
  sockets.ClearLog();
  Sock().AddStream("x");
  Pass();
  EXPECT_EQ(sockets.Log(), std::vector<std::string>{});
  EXPECT_EQ(Sock().Receives().back().timeout, 100);
}

TEST_F(ReadWriteTest, ApplyPersistsUnderTheInstanceAndKeepsTheStagedValues) {
  Started(kUdpConfig);
  EXPECT_TRUE(WriteInt(Tag("?SP_Gap?unsignedInt"), 30));
  EXPECT_TRUE(WriteText(Tag("?SP_TxPrefix?string-8"), "0A"));
  storage.clearCalls();
  ITag* const done = Tag("?SP_Done?boolean");
  EXPECT_TRUE(WriteBool(done, true));
  EXPECT_EQ(storage.writes(),
            (std::vector<StorageCall>{{"SetIntValue", "VELT", "gap", "30"},
                                      {"SetStringValue", "VELT", "tx_prefix", "0A"}}));
  storage.clearCalls();
  EXPECT_TRUE(WriteBool(done, true));
  EXPECT_EQ(storage.writes().size(), 2U);
  EXPECT_EQ(protocol->getSettings().text(Setting::TxPrefix), "0A");
}

TEST_F(ReadWriteTest, ApplyWritesStorageWhileHoldingTheChannelLock) {
  Started(kUdpConfig);
  EXPECT_TRUE(WriteInt(Tag("?SP_Gap?unsignedInt"), 30));
  EXPECT_TRUE(WriteText(Tag("?SP_TxPrefix?string-8"), "0A"));
  // The whole apply happens under queueLock, storage writes included: a host
  // can tell the values of one apply by the lock held while they arrive.
  std::vector<int> held;
  storage.onWrite([&](const std::string& /*name*/) { held.push_back(tasks.MutexesHeldHere()); });
  EXPECT_TRUE(WriteBool(Tag("?SP_Done?boolean"), true));
  storage.onWrite(nullptr);
  EXPECT_EQ(held, (std::vector<int>{1, 1}));
  EXPECT_EQ(tasks.MutexesHeldHere(), 0);
}

TEST_F(ReadWriteTest, QueueBoundWrittenAtRunTimeOfZeroKeepsTheNewestToken) {
  Started(kUdpConfig);
  EXPECT_TRUE(WriteInt(Tag("?SP_TokenQueueSize?unsignedInt"), 0));
  EXPECT_TRUE(WriteBool(Tag("?SP_Done?boolean"), true));
  Queue("1");
  Queue("2");
  EXPECT_EQ(Queued(), 1U);
  EXPECT_EQ(Command("get"), "2");
}

TEST_F(ReadWriteTest, NegativeQueueBoundLeavesTheQueueUnbounded) {
  Started(kUdpConfig);
  EXPECT_TRUE(WriteInt(Tag("?SP_TokenQueueSize?unsignedInt"), -1));
  EXPECT_TRUE(WriteBool(Tag("?SP_Done?boolean"), true));
  for (int i = 0; i < 150; ++i) {
    Queue(std::to_string(i));
  }
  EXPECT_EQ(Queued(), 150U);
}

TEST_F(ReadWriteTest, AnyWriteBeforeStartFails) {
  Create(kUdpConfig);
  for (const char* uri : {"?SP_RemotePort?unsignedShort", "?SP_Done?boolean", "?connect?boolean",
                          "?tx_token?string-4"}) {
    EXPECT_FALSE(WriteInt(Tag(uri), 1)) << uri;
    EXPECT_EQ(protocol->GetLastError(), -3);
    EXPECT_STREQ(protocol->GetLastErrorString(), "Protocol not started");
  }
}

TEST_F(ReadWriteTest, ConversionFailureOfAWriteIsReported) {
  Started(kUdpConfig);
  ITag* const tx = Tag("?tx_token?string-3(swap2)");
  EXPECT_FALSE(WriteText(tx, "abc"));
  EXPECT_EQ(protocol->GetLastError(), -9);
  EXPECT_STREQ(protocol->GetLastErrorString(), "write conversion error");
}

TEST_F(ReadWriteTest, ConversionFailureOfAReadIsReported) {
  Started(kUdpConfig);
  Queue("ab");
  bool ok = true;
  ReadBytes(Tag("?rx_token?string-5(swap2)"), &ok);
  EXPECT_FALSE(ok);
  EXPECT_EQ(protocol->GetLastError(), -9);
  EXPECT_STREQ(protocol->GetLastErrorString(), "read conversion error");
}
