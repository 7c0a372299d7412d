// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <sys/socket.h>

#include <atomic>
#include <chrono>
#include <string>
#include <thread>
#include <vector>

#include "HostedChannel.h"
#include "LoopbackIo.h"

using namespace std::chrono_literals;
using LoopbackIo::Bytes;

namespace {

std::string Text(const Bytes& bytes) { return std::string(bytes.begin(), bytes.end()); }
Bytes Raw(const std::string& text) { return Bytes(text.begin(), text.end()); }

std::string TcpConfig(std::uint16_t port, const std::string& extra = "") {
  return "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
         std::to_string(port) + " " + extra;
}

std::string UdpConfig(std::uint16_t peer, std::uint16_t local, const std::string& extra = "") {
  return "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=" +
         std::to_string(peer) + " localPort=" + std::to_string(local) + " " + extra;
}

class ChannelOnHost : public HostedChannel {
 protected:
  // Opens a TCP channel to a loopback listener, connects it through the
  // connect tag and accepts the connection.
  FileDescriptor ConnectTcp(const std::string& extra) {
    listener = LoopbackIo::ListenBelowEphemeral(4, listenPort);
    Open(TcpConfig(listenPort, extra));
    EXPECT_TRUE(WriteBool("?connect?boolean", true));
    FileDescriptor peer = LoopbackIo::Accept(listener.Get(), 5000ms);
    EXPECT_TRUE(peer.Valid());
    EXPECT_TRUE(WaitFor([&] { return ReadBool("?conn_stat?boolean"); }));
    return peer;
  }

  FileDescriptor listener;
  std::uint16_t listenPort = 0;
};

}  // namespace

TEST_F(ChannelOnHost, TcpFramedTokensAreQueuedInOrder) {
  FileDescriptor peer = ConnectTcp("rx_prefix=02 rx_suffix=03");
  LoopbackIo::SendAll(peer.Get(), Raw("\x55\x02"
                                      "AB\x03\x02"
                                      "C\x03\x02\x03"));
  EXPECT_EQ(Tokens(3), (std::vector<std::string>{"AB", "C", ""}));
}

TEST_F(ChannelOnHost, TcpGapDelimitsTokensWithoutMarkers) {
  FileDescriptor peer = ConnectTcp("gap=60");
  LoopbackIo::SendAll(peer.Get(), Raw("hello"));
  EXPECT_EQ(Tokens(1), std::vector<std::string>{"hello"});
  LoopbackIo::SendAll(peer.Get(), Raw("world"));
  EXPECT_EQ(Tokens(1), std::vector<std::string>{"world"});
}

TEST_F(ChannelOnHost, HexTokensAreQueuedAsText) {
  FileDescriptor peer = ConnectTcp("rx_suffix=03 hex_tokens=true");
  LoopbackIo::SendAll(peer.Get(), Bytes{0x0A, 0xFF, 0x03});
  EXPECT_EQ(Tokens(1), std::vector<std::string>{"0AFF"});
}

TEST_F(ChannelOnHost, QueueBoundKeepsTheNewestTokens) {
  FileDescriptor peer = ConnectTcp("rx_suffix=0A token_queue_size=3");
  LoopbackIo::SendAll(peer.Get(), Raw("1\n2\n3\n4\n5\n"));
  ASSERT_TRUE(WaitFor([&] { return Console("get") == "3"; }));
  EXPECT_EQ(Tokens(3), (std::vector<std::string>{"3", "4", "5"}));
}

TEST_F(ChannelOnHost, ConnectTagConnectsAndDisconnects) {
  FileDescriptor peer = ConnectTcp("");
  EXPECT_EQ(Console("get_stat"), "Connected");
  EXPECT_TRUE(WriteBool("?connect?boolean", false));
  EXPECT_TRUE(WaitFor([&] { return !ReadBool("?conn_stat?boolean"); }));
  // The peer sees the connection end.
  EXPECT_TRUE(WaitFor([&] {
    return LoopbackIo::ReceiveUpTo(peer.Get(), 1, 10ms).empty() &&
           ::recv(peer.Get(), nullptr, 0, MSG_DONTWAIT) == 0;
  }));
  EXPECT_FALSE(ReadBool("?connect?boolean"));
}

TEST_F(ChannelOnHost, ReconnectsWhenThePeerClosesAndComesBack) {
  FileDescriptor peer = ConnectTcp("rx_suffix=0A");
  LoopbackIo::SendAll(peer.Get(), Raw("before\n"));
  EXPECT_EQ(Tokens(1), std::vector<std::string>{"before"});
  peer = FileDescriptor();
  listener = FileDescriptor();
  EXPECT_TRUE(WaitFor([&] { return !ReadBool("?conn_stat?boolean"); }));
  std::this_thread::sleep_for(100ms);
  // The listener comes back on the same port; connect is still set.
  listener = LoopbackIo::ListenOn(4, listenPort);
  FileDescriptor again = LoopbackIo::Accept(listener.Get(), 5000ms);
  ASSERT_TRUE(again.Valid());
  EXPECT_TRUE(WaitFor([&] { return ReadBool("?conn_stat?boolean"); }));
  EXPECT_TRUE(ReadBool("?connect?boolean"));
  LoopbackIo::SendAll(again.Get(), Raw("after\n"));
  EXPECT_EQ(Tokens(1), std::vector<std::string>{"after"});
}

TEST_F(ChannelOnHost, TxTokenArrivesByteForByte) {
  FileDescriptor peer = ConnectTcp("tx_prefix=02 tx_suffix=0d0a");
  EXPECT_TRUE(WriteText("?tx_token?string-32", "hello big world"));
  EXPECT_EQ(Text(LoopbackIo::ReceiveUpTo(peer.Get(), 18, 5000ms)), "\x02hello big world\r\n");
  EXPECT_EQ(Console("put 12 34"), "OK");
  EXPECT_EQ(Text(LoopbackIo::ReceiveUpTo(peer.Get(), 8, 5000ms)),
            "\x02"
            "12 34\r\n");
}

TEST_F(ChannelOnHost, UdpDatagramsBecomeTokensAfterConnect) {
  std::uint16_t peerPort = 0;
  const FileDescriptor peer = LoopbackIo::BindUdp(0x7F000001U, peerPort);
  const std::uint16_t local = LoopbackIo::FreeUdpPort();
  Open(UdpConfig(peerPort, local, "rx_prefix=02 rx_suffix=03 tx_suffix=03"));
  EXPECT_TRUE(WriteBool("?connect?boolean", true));
  ASSERT_TRUE(WaitFor([&] { return ReadBool("?conn_stat?boolean"); }));
  LoopbackIo::SendTo(peer.Get(), local, Raw("\x02one\x03\x02two\x03"));
  EXPECT_EQ(Tokens(2), (std::vector<std::string>{"one", "two"}));
  EXPECT_TRUE(WriteText("?tx_token?string-8", "back"));
  std::uint16_t sender = 0;
  EXPECT_EQ(Text(LoopbackIo::ReceiveDatagram(peer.Get(), 5000ms, &sender)), "back\x03");
  EXPECT_EQ(sender, local);
}

TEST_F(ChannelOnHost, AppliedLocalPortMovesTheSocket) {
  std::uint16_t peerPort = 0;
  const FileDescriptor peer = LoopbackIo::BindUdp(0x7F000001U, peerPort);
  const std::uint16_t first = LoopbackIo::FreeUdpPort();
  Open(UdpConfig(peerPort, first));
  EXPECT_TRUE(WriteBool("?connect?boolean", true));
  ASSERT_TRUE(WaitFor([&] { return ReadBool("?conn_stat?boolean"); }));
  LoopbackIo::SendTo(peer.Get(), first, Raw("at first"));
  EXPECT_EQ(Tokens(1), std::vector<std::string>{"at first"});

  const std::uint16_t second = LoopbackIo::FreeUdpPort();
  EXPECT_TRUE(WriteShort("?SP_LocalPort?unsignedShort", second));
  EXPECT_EQ(ReadShort("?SP_LocalPort?unsignedShort"), second);
  EXPECT_TRUE(WriteBool("?SP_Done?boolean", true));
  // The socket is made again on the new port; datagrams sent there arrive.
  EXPECT_TRUE(WaitFor([&] {
    LoopbackIo::SendTo(peer.Get(), second, Raw("moved"));
    return Console("tokens_available") != "0";
  }));
  std::string token;
  ASSERT_TRUE(TakeToken(token));
  EXPECT_EQ(token, "moved");
  std::uint16_t sender = 0;
  EXPECT_TRUE(WriteText("?tx_token?string-8", "from"));
  while (Text(LoopbackIo::ReceiveDatagram(peer.Get(), 5000ms, &sender)) != "from") {
  }
  EXPECT_EQ(sender, second);
}

TEST_F(ChannelOnHost, AppliedValueSurvivesUnloadAndReload) {
  std::uint16_t peerPort = 0;
  const FileDescriptor peer = LoopbackIo::BindUdp(0x7F000001U, peerPort);
  Open(UdpConfig(peerPort, 0, "gap=0 tx_prefix=none"), "line-4");
  EXPECT_TRUE(WriteInt("?SP_Gap?unsignedInt", 77));
  EXPECT_TRUE(WriteText("?SP_TxPrefix?string-8", "0A0B"));
  EXPECT_TRUE(WriteBool("?SP_Done?boolean", true));
  Unload();

  Load();
  Open(UdpConfig(peerPort, 0, "gap=0 tx_prefix=none"), "line-4");
  EXPECT_EQ(ReadInt("?SP_Gap?unsignedInt"), 77);
  EXPECT_EQ(ReadText("?SP_TxPrefix?string-8"), "0A0B");
  // Another identity starts from the configuration.
  Open(UdpConfig(peerPort, 0, "gap=0 tx_prefix=none"), "line-5");
  EXPECT_EQ(ReadInt("?SP_Gap?unsignedInt"), 0);
  EXPECT_EQ(ReadText("?SP_TxPrefix?string-8"), "none");
}

TEST_F(ChannelOnHost, StopIsPromptWhileTheWorkerWaitsOutALongGap) {
  FileDescriptor peer = ConnectTcp("rx_prefix=02 rx_suffix=03 gap=60000");
  LoopbackIo::SendAll(peer.Get(), Raw("\x02partial"));
  std::this_thread::sleep_for(50ms);
  const auto start = std::chrono::steady_clock::now();
  EXPECT_TRUE(channel->Stop());
  const auto took = std::chrono::steady_clock::now() - start;
  EXPECT_LT(took, 2000ms) << std::chrono::duration_cast<std::chrono::milliseconds>(took).count();
}

TEST_F(ChannelOnHost, LocalBroadcastReachesTheLoopbackSubnet) {
  std::uint16_t port = 0;
  const FileDescriptor everyone = LoopbackIo::BindUdp(0, port);
  Open("CfgVer=1 model=1 socketType=UDP remoteIpAddress=255.255.255.255 remotePort=" +
       std::to_string(port) + " broadcastType=Local localIpAddress=127.0.0.1");
  EXPECT_TRUE(WriteBool("?connect?boolean", true));
  ASSERT_TRUE(WaitFor([&] { return ReadBool("?conn_stat?boolean"); }));
  EXPECT_TRUE(WriteText("?tx_token?string-8", "all"));
  EXPECT_EQ(Text(LoopbackIo::ReceiveDatagram(everyone.Get(), 5000ms, nullptr)), "all");
}

TEST_F(ChannelOnHost, UnreadableLocalAddressIsReported) {
  Open(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9 "
      "broadcastType=Local localIpAddress=300.1.1.1");
  EXPECT_EQ(channel->GetLastError(), -6);
  EXPECT_STREQ(channel->GetLastErrorString(), "Incorrect format of IP address");
}
