// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <chrono>
#include <string>
#include <thread>
#include <vector>

#include "DriverFixture.h"
#include "protlib/HexText.h"

namespace {

using Tokens = std::vector<std::string>;

std::string WithMarkers(const std::string& config, const std::string& prefix,
                        const std::string& suffix) {
  std::string text = config;
  if (!prefix.empty()) text += " rx_prefix=" + prefix;
  if (!suffix.empty()) text += " rx_suffix=" + suffix;
  return text;
}

class WorkerTest : public DriverFixture {
 protected:
  // The queued tokens, oldest first, read and acknowledged through the
  // console (which leaves nothing else changed).
  Tokens Drain() {
    Tokens tokens;
    for (;;) {
      if (Command("tokens_available") == "0") {
        return tokens;
      }
      TokenQueue::Guard held(protocol->getTokenQueue());
      tokens.push_back(held.Front());
      held.PopFront();
    }
  }
};

}  // namespace

TEST_F(WorkerTest, UdpWithoutMarkersMakesEachDatagramOneToken) {
  Connected(kUdpConfig);
  Sock().AddDatagram(Bytes("414243"));
  Sock().AddDatagram(Bytes("00FF"));
  Pass();
  EXPECT_EQ(Drain(), (Tokens{Bytes("414243"), Bytes("00FF")}));
}

TEST_F(WorkerTest, UdpDatagramOfFullBufferIsOneToken) {
  Connected(kUdpConfig);
  std::string datagram(1536, '\0');
  for (std::size_t i = 0; i < datagram.size(); ++i) {
    datagram[i] = static_cast<char>(i * 7 + 1);
  }
  Sock().AddDatagram(datagram);
  Pass();
  const Tokens tokens = Drain();
  ASSERT_EQ(tokens.size(), 1U);
  EXPECT_EQ(tokens[0], datagram);
}

TEST_F(WorkerTest, UdpLongerDatagramIsCutToTheBuffer) {
  Connected(kUdpConfig);
  Sock().AddDatagram(std::string(2000, 'x'));
  Pass();
  EXPECT_EQ(Drain(), Tokens{std::string(1536, 'x')});
}

TEST_F(WorkerTest, UdpReceivesWithTheBufferSizeAndTwentyMilliseconds) {
  Connected(kUdpConfig);
  Sock().AddDatagram("a");
  Pass();
  // The connecting pass received once, this one twice (a datagram, then
  // nothing).
  const auto receives = Sock().Receives();
  ASSERT_EQ(receives.size(), 3U);
  for (const auto& receive : receives) {
    EXPECT_EQ(receive.maxLength, 1536);
    EXPECT_EQ(receive.timeout, 20);
  }
}

TEST_F(WorkerTest, UdpFramedDatagramYieldsEachToken) {
  Connected(WithMarkers(kUdpConfig, "02", "03"));
  Sock().AddDatagram(Bytes("024103024203"));
  Pass();
  EXPECT_EQ(Drain(), (Tokens{"A", "B"}));
}

TEST_F(WorkerTest, UdpEmptyFrameYieldsNothing) {
  Connected(WithMarkers(kUdpConfig, "02", "03"));
  Sock().AddDatagram(Bytes("0203"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{});
}

TEST_F(WorkerTest, UdpFrameWithoutSuffixYieldsNothing) {
  Connected(WithMarkers(kUdpConfig, "02", "03"));
  Sock().AddDatagram(Bytes("0241"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{});
}

TEST_F(WorkerTest, UdpNothingCarriesOverToTheNextDatagram) {
  Connected(WithMarkers(kUdpConfig, "02", "03"));
  Sock().AddDatagram(Bytes("0241"));
  Sock().AddDatagram(Bytes("4203"));
  Sock().AddDatagram(Bytes("024303"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"C"});
}

TEST_F(WorkerTest, UdpMarkerSearchStopsAtAZeroByte) {
  Connected(WithMarkers(kUdpConfig, "02", "03"));
  // The suffix after the zero byte is not seen, so the frame is dropped.
  Sock().AddDatagram(Bytes("02410003"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{});
}

TEST_F(WorkerTest, UdpMarkerIsCutAtItsFirstZeroByte) {
  // The prefix 02 00 matches as 02 alone.
  Connected(WithMarkers(kUdpConfig, "0200", "03"));
  Sock().AddDatagram(Bytes("024103"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"A"});
}

TEST_F(WorkerTest, UdpMarkerMadeOfAZeroByteCountsAsEmpty) {
  Connected(WithMarkers(kUdpConfig, "00", ""));
  Sock().AddDatagram(Bytes("410042"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{Bytes("410042")});
}

TEST_F(WorkerTest, UdpFullDatagramIsSearchedWithinItsOwnBytes) {
  // A datagram that fills the buffer has no terminator after it: every
  // search stays inside the received bytes.
  Connected(WithMarkers(kUdpConfig, "0241", "0342"));
  std::string datagram(1534, 'x');
  datagram += Bytes("0241");
  Sock().AddDatagram(datagram);
  std::string framed = Bytes("0241") + std::string(1529, 'y') + Bytes("03");
  Sock().AddDatagram(framed);
  Pass();
  EXPECT_EQ(Drain(), Tokens{});
}

TEST_F(WorkerTest, UdpSuffixOnlyCutsSeveralTokens) {
  Connected(WithMarkers(kUdpConfig, "", "0D0A"));
  Sock().AddDatagram(Bytes("41420D0A43440D0A"));
  Pass();
  EXPECT_EQ(Drain(), (Tokens{"AB", "CD"}));
}

TEST_F(WorkerTest, TcpFramedStreamSkipsBytesBeforeThePrefix) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("5502414203"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"AB"});
}

TEST_F(WorkerTest, TcpReceivesUpToTheBufferWithTheGap) {
  Connected(WithMarkers(kTcpConfig, "02", "03") + " gap=250");
  Sock().AddStream(Bytes("024103"));
  Pass();
  // One receive of the connecting pass, one of this one, which takes the
  // whole frame at once.
  const auto receives = Sock().Receives();
  ASSERT_EQ(receives.size(), 2U);
  for (const auto& receive : receives) {
    EXPECT_EQ(receive.maxLength, 1536);
    EXPECT_EQ(receive.timeout, 250);
  }
  EXPECT_EQ(Drain(), Tokens{"A"});
}

TEST_F(WorkerTest, TcpGapZeroMeansFiveHundredMilliseconds) {
  Connected(kTcpConfig);
  Sock().AddStream("x");
  Pass();
  ASSERT_FALSE(Sock().Receives().empty());
  EXPECT_EQ(Sock().Receives()[0].timeout, 500);
}

TEST_F(WorkerTest, TcpPrefixOnlyStreamEndsTokensByTheNextPrefixAndTheGap) {
  Connected(WithMarkers(kTcpConfig, "02", ""));
  Sock().AddStream(Bytes("02410242"));
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), (Tokens{"A", "B"}));
}

TEST_F(WorkerTest, TcpPrefixOnlyQueuesAnEmptyBodyBetweenTwoPrefixes) {
  Connected(WithMarkers(kTcpConfig, "02", ""));
  Sock().AddStream(Bytes("020241"));
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), (Tokens{"", "A"}));
}

TEST_F(WorkerTest, TcpPrefixOnlyOverlappingPrefixDoesNotEndAToken) {
  Connected(WithMarkers(kTcpConfig, "AAAA", ""));
  // The third AA completes a prefix that overlaps the leading one and ends
  // nothing; the prefix after 41 ends the token AA 41.
  Sock().AddStream(Bytes("AAAAAA41AAAA"));
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), (Tokens{Bytes("AA41")}));
}

TEST_F(WorkerTest, TcpWithoutMarkersCollectsUntilTheGap) {
  Connected(kTcpConfig);
  Sock().AddStream("hello world");
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), Tokens{"hello world"});
}

TEST_F(WorkerTest, TcpWithoutMarkersDropsAThousandAndOneBytes) {
  Connected(kTcpConfig);
  Sock().AddStream(std::string(1001, 'z'));
  Sock().AddStream("next");
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), Tokens{});
  Pass();
  EXPECT_EQ(Drain(), Tokens{"next"});
}

TEST_F(WorkerTest, TcpWithoutMarkersKeepsAThousandBytes) {
  Connected(kTcpConfig);
  Sock().AddStream(std::string(1000, 'z'));
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), Tokens{std::string(1000, 'z')});
}

TEST_F(WorkerTest, TcpFrameCompletedByItsThousandAndFirstByteIsKept) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("02") + std::string(999, 'q') + Bytes("03"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{std::string(999, 'q')});
}

TEST_F(WorkerTest, TcpFrameLongerThanAThousandBytesIsDropped) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("02") + std::string(1000, 'q') + Bytes("03"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{});
}

TEST_F(WorkerTest, TcpEmptyFrameIsAnEmptyToken) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("0203"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{""});
}

TEST_F(WorkerTest, TcpPartialFrameAtTheGapIsDroppedWithASuffix) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("024142"));
  Sock().AddTimeout();
  Sock().AddStream(Bytes("03"));
  Pass(2);
  EXPECT_EQ(Drain(), Tokens{});
}

TEST_F(WorkerTest, TcpPrefixMismatchRestartsOnTheByteItself) {
  Connected(WithMarkers(kTcpConfig, "0102", "03"));
  Sock().AddStream(Bytes("0101024103"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"A"});
}

TEST_F(WorkerTest, TcpOnePassEndsWithTheFirstToken) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("024103024203"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"A"});
  Pass();
  EXPECT_EQ(Drain(), Tokens{"B"});
}

TEST_F(WorkerTest, QueueBoundKeepsTheNewestTokens) {
  Connected(std::string(kUdpConfig) + " token_queue_size=3");
  for (const char* token : {"1", "2", "3", "4", "5"}) {
    Sock().AddDatagram(token);
  }
  Pass();
  EXPECT_EQ(Drain(), (Tokens{"3", "4", "5"}));
}

TEST_F(WorkerTest, HexTokensQueueUpperCaseText) {
  Connected(std::string(kUdpConfig) + " hex_tokens=true");
  Sock().AddDatagram(Bytes("0AFF"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"0AFF"});
}

TEST_F(WorkerTest, NothingIsReceivedUntilConnectIsRequested) {
  Started(kUdpConfig);
  Pass();
  Sock().AddDatagram("early");
  Pass(3);
  EXPECT_TRUE(Sock().Receives().empty());
  EXPECT_TRUE(Sock().Connects().empty());
  EXPECT_EQ(Command("get_stat"), "Disconnected");
}

TEST_F(WorkerTest, FirstPassRenewsTheSocketMadeAtStart) {
  Started(kUdpConfig);
  sockets.ClearLog();
  Pass();
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #1 0", "create 6000 0 0 -> #2"}));
  EXPECT_EQ(tasks.Sleeps(), std::vector<int>{10});
}

TEST_F(WorkerTest, ConnectsToTheRemoteAddressAndPort) {
  Connected(kUdpConfig);
  const auto connects = Sock().Connects();
  ASSERT_EQ(connects.size(), 1U);
  EXPECT_EQ(connects[0].ip, "127.0.0.1");
  EXPECT_EQ(connects[0].port, 5000);
  EXPECT_EQ(Command("get_stat"), "Connected");
}

TEST_F(WorkerTest, FailedConnectSleepsAndRetriesOnTheNextPass) {
  Started(kTcpConfig);
  Pass();
  Sock().AddConnectResults(-1, 2);
  Command("connect ON");
  tasks.ClearSleeps();
  Pass(3);
  EXPECT_EQ(Sock().Connects().size(), 3U);
  EXPECT_EQ(tasks.Sleeps(), (std::vector<int>{10, 10}));
  EXPECT_TRUE(protocol->isConnected());
}

TEST_F(WorkerTest, HundredAndOneFailedConnectsRenewTheSocketOnce) {
  sockets.OnCreate([](ScriptedSocket& socket) { socket.AddConnectResults(-1, 1000); });
  Started(kTcpConfig);
  Pass();
  Command("connect ON");
  sockets.ClearLog();
  Pass(101);
  EXPECT_EQ(sockets.Log(), std::vector<std::string>{});
  EXPECT_EQ(Sock().Connects().size(), 101U);
  Pass();
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 0 1 0 -> #3"}));
  EXPECT_EQ(Sock().Connects().size(), 1U);
  // The count started again at 0: a hundred more failures renew nothing.
  sockets.ClearLog();
  Pass(100);
  EXPECT_EQ(sockets.Log(), std::vector<std::string>{});
  Pass();
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #3 0", "create 0 1 0 -> #4"}));
}

TEST_F(WorkerTest, BrokenConnectionRenewsTheSocketAndReconnects) {
  Connected(kTcpConfig);
  Sock().SetBroken(true);
  sockets.ClearLog();
  Pass();
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 0 1 0 -> #3"}));
  EXPECT_TRUE(protocol->isConnected());
  EXPECT_EQ(Sock().Connects().size(), 1U);
}

TEST_F(WorkerTest, ConnectOffDisconnectsAndRenewsTheSocket) {
  Connected(kTcpConfig);
  Command("connect OFF");
  sockets.ClearLog();
  Pass();
  EXPECT_FALSE(protocol->isConnected());
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 0 1 0 -> #3"}));
  EXPECT_TRUE(Sock().Connects().empty());
}

TEST_F(WorkerTest, NewRemoteAddressRenewsTheSocketAndConnectsThere) {
  Connected(kUdpConfig);
  Command("set_ip_port 127.0.0.2 0x1771");
  sockets.ClearLog();
  Pass();
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 6000 0 0 -> #3"}));
  ASSERT_EQ(Sock().Connects().size(), 1U);
  EXPECT_EQ(Sock().Connects()[0].ip, "127.0.0.2");
  EXPECT_EQ(Sock().Connects()[0].port, 6001);
}

TEST_F(WorkerTest, TokensSurviveARenewedSocket) {
  Connected(kUdpConfig);
  Sock().AddDatagram("kept");
  Pass();
  Sock().SetBroken(true);
  Command("connect OFF");
  Pass();
  EXPECT_EQ(Drain(), Tokens{"kept"});
}

TEST_F(WorkerTest, GlobalBroadcastConnectsToTheBroadcastAddressItself) {
  Connected(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=255.255.255.255 remotePort=7 "
      "broadcastType=Global");
  ASSERT_EQ(Sock().Connects().size(), 1U);
  EXPECT_EQ(Sock().Connects()[0].ip, "255.255.255.255");
}

TEST_F(WorkerTest, LocalBroadcastConnectsToTheSubnetBroadcastAddress) {
  sockets.SetAdapter(0xC0A8010AU, 0xFFFFFF00U);
  Connected(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=255.255.255.255 remotePort=7 "
      "broadcastType=Local localIpAddress=192.168.1.10");
  ASSERT_EQ(Sock().Connects().size(), 1U);
  EXPECT_EQ(Sock().Connects()[0].ip, "192.168.1.255");
}

TEST_F(WorkerTest, LocalBroadcastOnlyAppliesToTheBroadcastAddress) {
  sockets.SetAdapter(0xC0A8010AU, 0xFFFFFF00U);
  Connected(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=192.168.1.20 remotePort=7 "
      "broadcastType=Local localIpAddress=192.168.1.10");
  ASSERT_EQ(Sock().Connects().size(), 1U);
  EXPECT_EQ(Sock().Connects()[0].ip, "192.168.1.20");
}

TEST_F(WorkerTest, FailedSocketCreationIsRetriedAfterTheFailedConnects) {
  Started(kTcpConfig);
  sockets.FailCreates(1);
  Pass();  // the renewal fails: no socket
  EXPECT_EQ(sockets.Live(), 0);
  Command("connect ON");
  Pass(101);
  EXPECT_EQ(sockets.Live(), 0);
  Pass();
  EXPECT_EQ(sockets.Live(), 1);
  EXPECT_TRUE(protocol->isConnected());
}

TEST_F(WorkerTest, UnreadableLocalAddressIsNotRetriedUntilTheSettingsChange) {
  Started(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4 remotePort=1 broadcastType=Local "
      "localIpAddress=10.0.0");
  Pass();
  Command("connect ON");
  Pass(300);
  // One probe each from the start and the first pass, none from retries.
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"create 0 0 0 -> #1", "create 0 0 0 -> #2"}));
  Command("set_ip_port 1.2.3.5 1");
  Pass();
  EXPECT_EQ(sockets.Log().size(), 3U);
}

TEST_F(WorkerTest, ReceiveErrorEndsThePassLikeATimeout) {
  Connected(kUdpConfig);
  Sock().AddError();
  Sock().AddDatagram("after");
  Pass();
  EXPECT_EQ(Drain(), Tokens{});
  Pass();
  EXPECT_EQ(Drain(), Tokens{"after"});
}

TEST_F(WorkerTest, TcpBytesAfterATokenWaitForTheNextPass) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("55024103") + Bytes("550242") + Bytes("03"));
  Sock().AddStream(Bytes("024303"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"A"});
  // The next pass starts afresh on the bytes after the token: the leading
  // 55 is skipped and the frame completes with the next receive.
  Pass();
  EXPECT_EQ(Drain(), Tokens{"B"});
  Pass();
  EXPECT_EQ(Drain(), Tokens{"C"});
  EXPECT_EQ(Sock().Receives().size(), 3U);
}

TEST_F(WorkerTest, TcpConnectionIsNotAskedWhileReceivedBytesWaitToBeFramed) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("024103024203"));
  Pass();
  Sock().SetBroken(true);
  sockets.ClearLog();
  // The bytes that arrived before the connection broke come first.
  Pass();
  EXPECT_EQ(Drain(), (Tokens{"A", "B"}));
  EXPECT_EQ(sockets.Log(), std::vector<std::string>{});
  Pass();
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 0 1 0 -> #3"}));
}

TEST_F(WorkerTest, UdpPassEndsBeforeItsNextReceiveWhenARequestIsMade) {
  Connected(kUdpConfig);
  const std::size_t before = Sock().Receives().size();
  Sock().AddDatagram("1");
  // Connect is switched off while the worker waits for its second datagram.
  Sock().AddAction([this] { Command("connect OFF"); });
  Sock().AddDatagram("2");
  Sock().AddDatagram("3");
  Pass();
  EXPECT_EQ(Sock().Receives().size() - before, 2U);
  EXPECT_EQ(Sock().Pending(), 1U);
  sockets.ClearLog();
  Pass();
  EXPECT_FALSE(protocol->isConnected());
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 6000 0 0 -> #3"}));
  // Nothing received was lost to the request.
  EXPECT_EQ(Drain(), (Tokens{"1", "2"}));
}

TEST_F(WorkerTest, TcpPassEndedForARequestGoesOnWhereItStopped) {
  Connected(WithMarkers(kTcpConfig, "02", ""));
  Sock().AddStream(Bytes("0241"));
  Sock().AddAction([this] {
    EXPECT_TRUE(WriteInt(Tag("?SP_Gap?unsignedInt"), 100));
    EXPECT_TRUE(WriteBool(Tag("?SP_Done?boolean"), true));
  });
  Sock().AddStream(Bytes("4202"));
  Sock().AddStream(Bytes("43"));
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), Tokens{"AB"});
  sockets.ClearLog();
  // The frame opened by the second prefix goes on in the next pass, which
  // receives with the applied gap.
  Pass();
  EXPECT_EQ(Drain(), Tokens{"C"});
  EXPECT_EQ(sockets.Log(), std::vector<std::string>{});
  EXPECT_EQ(Sock().Receives().back().timeout, 100);
}

TEST_F(WorkerTest, TcpAppliedMarkersTakeEffectUnderSteadyTraffic) {
  Connected(WithMarkers(kTcpConfig, "02", ""));
  Sock().AddStream(Bytes("024102420243"));
  Sock().AddAction([this] {
    EXPECT_TRUE(WriteText(Tag("?SP_RxPrefix?string-8"), "03"));
    EXPECT_TRUE(WriteBool(Tag("?SP_Done?boolean"), true));
  });
  Sock().AddStream(Bytes("44"));
  Sock().AddStream(Bytes("0345034603"));
  Sock().AddTimeout();
  Pass(2);
  // The apply emptied the queue of A and B; the frame open under the old
  // prefix was dropped with it, and the new prefix frames what follows.
  EXPECT_EQ(Drain(), (Tokens{"E", "F"}));
}

TEST_F(WorkerTest, TcpConnectOffFramesTheBytesAlreadyReceivedFirst) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("024103024203024403") + Bytes("0245"));
  Pass();
  EXPECT_EQ(Drain(), Tokens{"A"});
  Command("connect OFF");
  sockets.ClearLog();
  Pass();
  EXPECT_EQ(Drain(), (Tokens{"B", "D"}));
  EXPECT_EQ(sockets.Log(), (std::vector<std::string>{"delete #2 0", "create 0 1 0 -> #3"}));
  // The open frame went with the old socket: the new one starts afresh.
  Command("connect ON");
  Sock().AddStream(Bytes("4603") + Bytes("024703"));
  Pass(2);
  EXPECT_EQ(Drain(), Tokens{"G"});
}

TEST_F(WorkerTest, StopFramesTheBytesAlreadyReceived) {
  Connected(WithMarkers(kTcpConfig, "02", "03"));
  Sock().AddStream(Bytes("024103024203"));
  Pass();
  protocol->Stop();
  EXPECT_EQ(Drain(), (Tokens{"A", "B"}));
}

TEST_F(WorkerTest, StopEndsAPassUnderContinuousTraffic) {
  // A prefix-only stream without a silence never ends a pass by itself; the
  // worker must still end when the host stops it, long before the stream
  // runs out.
  constexpr std::size_t kRepeats = 1000000000;
  tasks.RunTasksOnThreads(true);
  sockets.OnCreate([](ScriptedSocket& socket) {
    socket.KeepRecords(false);
    socket.AddRepeatedStream(DriverFixture::Bytes("0241"), kRepeats);
  });
  Started(WithMarkers(kTcpConfig, "02", ""));
  Command("connect ON");
  for (int i = 0; i < 5000 && Command("tokens_available") == "0"; ++i) {
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
  }
  ASSERT_NE(Command("tokens_available"), "0");
  protocol->Stop();
  EXPECT_EQ(Sock().Pending(), 1U);
}

TEST_F(WorkerTest, DatagramSocketFramedAsAStreamKeepsOneByteOfEachDatagram) {
  // A socket type other than exactly "UDP" or "TCP" makes a UDP socket
  // framed as a stream, one byte per receive.
  Connected("CfgVer=1 model=1 socketType=udp remoteIpAddress=127.0.0.1 remotePort=5000");
  EXPECT_EQ(Sock().Tcp(), 0);
  Sock().AddDatagram("hello");
  Sock().AddDatagram("xy");
  Sock().AddTimeout();
  Pass();
  EXPECT_EQ(Drain(), Tokens{"hx"});
  for (const auto& receive : Sock().Receives()) {
    EXPECT_EQ(receive.maxLength, 1);
  }
}
