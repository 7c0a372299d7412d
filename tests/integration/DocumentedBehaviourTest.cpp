// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <functional>
#include <sstream>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "HostInterfaceFactory.h"
#include "IProtocol.h"
#include "LoopbackIo.h"
#include "PluginLoader.h"
#include "TempDirectory.h"
#include "velt-peer/Peer.h"

// The replies, texts and behaviours that the user documentation (docs/)
// quotes, checked against the built plug-in in the reference host, so the
// documentation cannot drift from the driver unnoticed.

namespace {

using namespace std::chrono_literals;

constexpr auto kPatience = 10s;

bool WaitFor(const std::function<bool()>& condition) {
  const auto deadline = std::chrono::steady_clock::now() + kPatience;
  while (!condition()) {
    if (std::chrono::steady_clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(10ms);
  }
  return true;
}

std::string TcpConfig(std::uint16_t port, const std::string& more = "") {
  return "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=" +
         std::to_string(port) + (more.empty() ? "" : " " + more);
}

std::string FileText(const std::string& path) {
  std::ifstream file(path);
  std::ostringstream text;
  text << file.rdbuf();
  return text.str();
}

// The plug-in loaded into the reference host with a storage file of its own.
class Documented : public ::testing::Test {
 protected:
  Documented() : host(dir.File("storage.ini")), loader(VELT_PLUGIN_PATH, host) {}
  Documented(const Documented&) = delete;
  Documented& operator=(const Documented&) = delete;
  Documented(Documented&&) = delete;
  Documented& operator=(Documented&&) = delete;
  ~Documented() override {
    for (IProtocol* channel : channels) {
      channel->Stop();
      loader.Protocols().DeleteProtocol(channel);
    }
  }

  // A configured channel, started unless the configuration is rejected.
  IProtocol& Channel(const std::string& config, const std::string& ident = "VELT") {
    IProtocol* const channel = loader.Protocols().CreateProtocol("VELT");
    channels.push_back(channel);
    channel->SetIdent(ident.c_str());
    if (channel->Config(config.c_str())) {
      channel->Start();
    }
    return *channel;
  }

  void Delete(IProtocol& channel) {
    channel.Stop();
    loader.Protocols().DeleteProtocol(&channel);
    channels.erase(std::find(channels.begin(), channels.end(), &channel));
  }

  static std::pair<bool, std::string> Run(IProtocol& channel, const std::string& command) {
    std::vector<char> out(65536, 0);
    const bool ok = channel.DoCommand(command.c_str(), out.data(), static_cast<int>(out.size()));
    return {ok, std::string(out.data())};
  }

  static std::string Reply(IProtocol& channel, const std::string& command) {
    return Run(channel, command).second;
  }

  static std::string ConfigError(IProtocol& channel, const std::string& config) {
    return channel.Config(config.c_str()) ? "accepted" : channel.GetLastErrorString();
  }

  TempDirectory dir;
  HostInterfaceFactory host;
  PluginLoader loader;
  std::vector<IProtocol*> channels;
};

veltpeer::Peer::Started StartPeer(veltpeer::Peer& peer) {
  const veltpeer::Peer::Started started = peer.Start();
  EXPECT_TRUE(started.Ok()) << started.error;
  return started;
}

veltpeer::PeerOptions FramedTcpDevice() {
  veltpeer::PeerOptions options;
  options.transport = veltpeer::Transport::kTcp;
  options.echo = true;
  options.rxPrefix = "\x02";
  options.rxSuffix = "\x03";
  options.emitCount = 3;
  options.rate = 20;
  options.txPrefix = "\x02";
  options.txSuffix = "\x03";
  options.payload = "temp={n}";
  options.maxSeconds = 30;
  return options;
}

const char kFramed[] = "rx_prefix=02 rx_suffix=03 tx_prefix=02 tx_suffix=03";

}  // namespace

TEST_F(Documented, ConsoleSessionRepliesAsShown) {
  veltpeer::Peer peer(FramedTcpDevice());
  const auto started = StartPeer(peer);
  IProtocol& channel = Channel(TcpConfig(started.port, kFramed));

  EXPECT_EQ(Run(channel, "get_stat"), std::make_pair(true, std::string("Disconnected")));
  EXPECT_EQ(Run(channel, "connect ON"), std::make_pair(true, std::string("OK")));
  ASSERT_TRUE(WaitFor([&] { return Reply(channel, "tokens_available") == "3"; }));
  EXPECT_EQ(Reply(channel, "get_stat"), "Connected");
  EXPECT_EQ(Reply(channel, "get"), "temp=1");
  EXPECT_EQ(Reply(channel, "get_token_length"), "6");
  EXPECT_EQ(Reply(channel, "get"), "temp=1");
  EXPECT_EQ(Reply(channel, "token_ack"), "OK");
  EXPECT_EQ(Reply(channel, "get"), "temp=2");
  EXPECT_EQ(Run(channel, "put hello world"), std::make_pair(true, std::string("OK")));
  ASSERT_TRUE(WaitFor([&] { return Reply(channel, "tokens_available") == "3"; }));
  EXPECT_EQ(Reply(channel, "read ?tokens_available?unsignedInt"), "03000000\n");
  EXPECT_EQ(Reply(channel, "read ?rx_token?string-8"), "74656d703d320000\n");
  EXPECT_EQ(Reply(channel, "read ?rx_token?string-6"), "token too long");
  EXPECT_EQ(Run(channel, "connect on"), std::make_pair(false, std::string("ERROR: wrong value")));
  EXPECT_EQ(Reply(channel, "lasterror"), "token too long");
  EXPECT_EQ(Reply(channel, "getmaxtm"), "maxtm = 0 ms\n");
  EXPECT_EQ(Reply(channel, "token_ack"), "OK");
  EXPECT_EQ(Reply(channel, "token_ack"), "OK");
  EXPECT_EQ(Reply(channel, "get"), "hello world");
}

TEST_F(Documented, ConsoleRefusalsAndTheHelpAndInformationTexts) {
  IProtocol& channel = Channel(TcpConfig(9));

  EXPECT_EQ(Run(channel, "connect"),
            std::make_pair(false, std::string("ERROR: new connect state is missing")));
  EXPECT_EQ(Run(channel, "connect  ON"), std::make_pair(false, std::string("ERROR: wrong value")));
  EXPECT_EQ(Run(channel, "set_ip_port 127.0.0.1"),
            std::make_pair(false, std::string("ERROR: IP and port are missing")));
  EXPECT_EQ(Run(channel, "put"),
            std::make_pair(false, std::string("ERROR: string to send is missing")));
  EXPECT_EQ(Run(channel, "get"), std::make_pair(true, std::string()));
  EXPECT_EQ(Run(channel, "get_token_length"), std::make_pair(true, std::string("0")));
  EXPECT_EQ(Run(channel, "bogus"), std::make_pair(false, std::string()));
  EXPECT_EQ(Reply(channel, "help"),
            "help - displays this message\n"
            "info - displays information about the protocol version\n"
            "xml  - displays the protocol xml description\n"
            "read uri - reads data pointed by uri string\n"
            "write uri hexData - writes data pointed by uri string\n"
            "lasterror - displays the last protocol error\n"
            "getmaxtm - displays the max time for executing a single read/write access\n"
            "connect cmd - set connect ON or OFF\n"
            "get_stat - get status of connection\n"
            "set_ip_port ip port - set new ip/port values\n"
            "put str - put the token to send\n"
            "get - get the received token\n"
            "get_token_length - get the length of the received token\n"
            "tokens_available - get number of tokens received\n"
            "token_ack - acknowledge reading token\n");
  EXPECT_EQ(Reply(channel, "info"),
            "Protocol: VELT (472) v.112\n"
            "Implementation: Protocol_VELT v.100\n"
            "ProtocolBase v.100\n"
            "ProtLib v.200\n"
            "HostMultiTask v.100\n"
            "HostSerialFactory v.100\n"
            "HostSocketFactory v.100\n");
  // The description block begins with its length line and a zero byte.
  EXPECT_EQ(Reply(channel, "xml").rfind("compressedXML=", 0), 0U);
  EXPECT_EQ(Reply(channel, "xml"), std::string(channel.GetXml()));
}

TEST_F(Documented, BoundedRepliesAreCutAtTheBufferWithoutATerminator) {
  IProtocol& channel = Channel(TcpConfig(9));
  char out[9];
  std::memset(out, '#', sizeof out);
  EXPECT_TRUE(channel.DoCommand("help", out, 8));
  EXPECT_EQ(std::string(out, sizeof out), "help - d#");
  std::memset(out, '#', sizeof out);
  EXPECT_TRUE(channel.DoCommand("read ?tokens_available?unsignedInt", out, 8));
  EXPECT_EQ(std::string(out, 6), std::string("0000\n\0", 6));
}

TEST_F(Documented, ConfigurationErrorTexts) {
  IProtocol& channel = *loader.Protocols().CreateProtocol("VELT");
  channels.push_back(&channel);
  const std::string base = "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1";
  const std::vector<std::pair<std::string, std::string>> cases = {
      {"model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=4000",
       "Parser: unknown format"},
      {"CfgVer=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=4000",
       "Parser: parameter 'model' is not found"},
      {"CfgVer=1 model=1 remoteIpAddress=127.0.0.1 remotePort=4000",
       "Parser: parameter 'socketType' is not found"},
      {"CfgVer=1 model=1 Node3::socketType=TCP remoteIpAddress=127.0.0.1 remotePort=4000",
       "Parser: parameter 'socketType' is not found"},
      {base, "Parser: parameter 'remotePort' is not found"},
      {base + " remotePort=65536", "parameter 'remotePort' out of range"},
      {base + " remotePort=-1", "parameter 'remotePort' out of range"},
      {base + " remotePort=4000 hex_tokens=True",
       "Parser: parameter 'hex_tokens' has illegal value"},
      {base + " remotePort=4000 token_queue_size=0", "parameter 'token_queue_size' out of range"},
      {base + " remotePort=4000 token_queue_size=10001",
       "parameter 'token_queue_size' out of range"},
      {base + " remotePort=4000 rx_prefix=ABC", "rx_prefix not in hex format"},
      {base + " remotePort=4000 tx_suffix=0G", "tx_suffix not in hex format"},
      {base + " remotePort=4000 tx_prefix=Hello&nbsp;World", "tx_prefix not in hex format"},
      {base + " remotePort=4000 rx_prefix=none localPort=-5 gap=-1 Node2::model=7", "accepted"},
      {base + " remotePort=0x1F CfgVer=2 remotePort=x", "accepted"},
  };
  for (const auto& [config, error] : cases) {
    EXPECT_EQ(ConfigError(channel, config), error) << config;
  }
}

TEST_F(Documented, IntegersAreReadAsCNumbers) {
  IProtocol& channel = Channel(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=0x1F "
      "token_queue_size=010 gap=abc localPort=4000x");
  EXPECT_EQ(Reply(channel, "read ?SP_RemotePort?unsignedShort"), "1f00\n");
  EXPECT_EQ(Reply(channel, "read ?SP_TokenQueueSize?unsignedInt"), "08000000\n");
  EXPECT_EQ(Reply(channel, "read ?SP_Gap?unsignedInt"), "00000000\n");
  EXPECT_EQ(Reply(channel, "read ?SP_LocalPort?unsignedShort"), "a00f\n");
}

TEST_F(Documented, TagAddressErrorTexts) {
  IProtocol& channel = Channel(TcpConfig(9, "Node2::model=7"));
  const std::vector<std::pair<std::string, std::string>> cases = {
      {"?tokens_available", "there must be 3 tag spe\x63ification fields"},
      {"?tokens_available?unsignedInt?", "there must be 3 tag spe\x63ification fields"},
      {"??unsignedInt", "memorytype field missing"},
      {"??", "memorytype field missing"},
      {"?tokens_available?", "tavuType field missing"},
      {"?TOKENS_AVAILABLE?unsignedInt", "Can't access memory type"},
      {"2?tokens_available?unsignedInt", "Can't access memory type"},
      {"?tokens_available?uint", "uint: data type unknown"},
      {"?rx_token?string-10(swap2", "string-10(swap2: data type unknown"},
      {"?tx_token?boolean", "not allowed tavu type"},
      {"?tokens_available?int", "not allowed tavu type"},
      {"?rx_token_len?unsignedInt-1", "not allowed tavu type"},
  };
  for (const auto& [address, text] : cases) {
    EXPECT_EQ(channel.CreateTag(address.c_str()), nullptr) << address;
    EXPECT_EQ(channel.GetLastError(), -1) << address;
    EXPECT_EQ(std::string(channel.GetLastErrorString()),
              "Tag URI error: " + address + " - " + text);
  }
  EXPECT_EQ(Reply(channel, "read 0x3?tokens_available?unsignedInt"), "00000000\n");
  EXPECT_EQ(Reply(channel, "read  ?tokens_available?unsignedInt"),
            "error: missing parameter (URI string)\n");
  EXPECT_EQ(Reply(channel, "read ?conn_stat?boolean(inv)"), "01\n");
  EXPECT_EQ(Reply(channel, "read ?tokens_available?unsignedInt(neg)"), "read conversion error");
  EXPECT_EQ(Reply(channel, "write ?tokens_available?unsignedInt 00000000"),
            "writing to read_only type");
  EXPECT_EQ(Reply(channel, "write ?connect?boolean 1"),
            "error: incorrect length of data to write\n");
  EXPECT_EQ(Reply(channel, "write ?connect?boolean 0G"), "error: incorrect hex data\n");
}

TEST_F(Documented, RuntimeParametersAreStagedAppliedStoredAndWinOverTheConfiguration) {
  IProtocol& first = Channel(TcpConfig(5000, "gap=20"), "PUMP1");
  EXPECT_EQ(Reply(first, "read ?SP_Gap?unsignedInt"), "14000000\n");
  EXPECT_EQ(Reply(first, "write ?SP_Gap?unsignedInt c8000000"), "written ok\n");
  EXPECT_EQ(Reply(first, "read ?SP_Gap?unsignedInt"), "c8000000\n");
  EXPECT_EQ(Reply(first, "write ?SP_RxSuffix?string-8 3044304100000000"), "written ok\n");
  EXPECT_EQ(Reply(first, "write ?SP_SocketType?string-4 75647000"), "illegal socket type");
  EXPECT_EQ(Reply(first, "write ?SP_RxPrefix?string-4 41424300"),
            "Rx prefix value is not hex format");
  EXPECT_EQ(Reply(first, "read ?SP_SocketType?string-3"), "socket type too long to read");
  EXPECT_EQ(Reply(first, "write ?SP_Done?boolean 01"), "written ok\n");
  EXPECT_EQ(Reply(first, "read ?SP_Done?boolean"), "00\n");
  EXPECT_NE(FileText(dir.File("storage.ini"))
                .find("[\"PUMP1\"]\n\"gap\" = int 200\n\"rx_suffix\" = text \"0D0A\"\n"),
            std::string::npos)
      << FileText(dir.File("storage.ini"));

  // The same channel configured again keeps the first values it read.
  first.Stop();
  ASSERT_TRUE(first.Config(TcpConfig(6000, "gap=30").c_str()));
  first.Start();
  EXPECT_EQ(Reply(first, "read ?SP_RemotePort?unsignedShort"), "8813\n");
  EXPECT_EQ(Reply(first, "read ?SP_Gap?unsignedInt"), "c8000000\n");
  Delete(first);

  // A new channel with the same identity reads the new configuration, except
  // what was applied.
  IProtocol& second = Channel(TcpConfig(6000, "gap=30 rx_suffix=03"), "PUMP1");
  EXPECT_EQ(Reply(second, "read ?SP_RemotePort?unsignedShort"), "7017\n");
  EXPECT_EQ(Reply(second, "read ?SP_Gap?unsignedInt"), "c8000000\n");
  EXPECT_EQ(Reply(second, "read ?SP_RxSuffix?string-8"), "3044304100000000\n");
  // Another identity has nothing stored.
  IProtocol& other = Channel(TcpConfig(6000, "gap=30"), "PUMP2");
  EXPECT_EQ(Reply(other, "read ?SP_Gap?unsignedInt"), "1e000000\n");
}

TEST_F(Documented, SetIpPortIsUndoneByTheNextApply) {
  veltpeer::PeerOptions options;
  options.transport = veltpeer::Transport::kTcp;
  options.maxSeconds = 30;
  veltpeer::Peer configured(options);
  veltpeer::Peer other(options);
  const auto configuredPort = StartPeer(configured).port;
  const auto otherPort = StartPeer(other).port;
  IProtocol& channel = Channel(TcpConfig(configuredPort));

  EXPECT_EQ(Reply(channel, "connect ON"), "OK");
  ASSERT_TRUE(WaitFor([&] { return configured.Totals().connections == 1; }));
  EXPECT_EQ(Reply(channel, "set_ip_port 127.0.0.1 " + std::to_string(otherPort)), "OK");
  ASSERT_TRUE(WaitFor([&] { return other.Totals().connections == 1; }));
  // The runtime parameter still shows the configured port.
  char configuredHex[8];
  std::snprintf(configuredHex, sizeof configuredHex, "%02x%02x\n", configuredPort & 0xFFU,
                configuredPort >> 8U);
  EXPECT_EQ(Reply(channel, "read ?SP_RemotePort?unsignedShort"), configuredHex);
  EXPECT_EQ(Reply(channel, "write ?SP_Gap?unsignedInt c8000000"), "written ok\n");
  EXPECT_EQ(Reply(channel, "write ?SP_Done?boolean 01"), "written ok\n");
  ASSERT_TRUE(WaitFor([&] { return configured.Totals().connections == 2; }));
  EXPECT_EQ(other.Totals().connections, 1U);
}

TEST_F(Documented, UdpChannelReadsNothingUntilConnected) {
  const std::uint16_t local = LoopbackIo::FreeUdpPort();
  ASSERT_NE(local, 0);
  IProtocol& channel =
      Channel("CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9 localPort=" +
              std::to_string(local));

  // The worker makes the socket anew on its first pass after Start, and a
  // datagram sent before that goes with the first socket, so several are
  // sent, none of which is read before connecting.
  for (int i = 0; i < 10; ++i) {
    ASSERT_TRUE(LoopbackIo::SendDatagram(local, "early"));
    std::this_thread::sleep_for(50ms);
    EXPECT_EQ(Reply(channel, "tokens_available"), "0");
  }
  EXPECT_EQ(Reply(channel, "connect ON"), "OK");
  // The reference host kept the later ones in the socket's buffer.
  ASSERT_TRUE(WaitFor([&] { return Reply(channel, "tokens_available") != "0"; }));
  EXPECT_EQ(Reply(channel, "get"), "early");
  EXPECT_EQ(Reply(channel, "get_stat"), "Connected");
}

TEST_F(Documented, ASocketTypeOtherThanExactlyUdpKeepsOneByteOfEachDatagram) {
  const std::uint16_t local = LoopbackIo::FreeUdpPort();
  ASSERT_NE(local, 0);
  IProtocol& channel =
      Channel("CfgVer=1 model=1 socketType=udp remoteIpAddress=127.0.0.1 remotePort=9 localPort=" +
              std::to_string(local));
  EXPECT_EQ(Reply(channel, "connect ON"), "OK");
  ASSERT_TRUE(WaitFor([&] { return Reply(channel, "get_stat") == "Connected"; }));

  ASSERT_TRUE(LoopbackIo::SendDatagram(local, "hello"));
  ASSERT_TRUE(WaitFor([&] { return Reply(channel, "tokens_available") == "1"; }));
  EXPECT_EQ(Reply(channel, "get"), "h");
}
