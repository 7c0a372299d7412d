// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// 256 channels of the plug-in in one embedding program on the reference
// host: 128 TCP channels whose peers are absent, 64 TCP channels connected to
// a listener and 64 UDP channels. All start, connect (or keep trying), carry
// a token each where connected, and stop cleanly, every service given back.
#include <gtest/gtest.h>

#include <chrono>
#include <cstring>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "DescriptorLimit.h"
#include "HostInterfaceFactory.h"
#include "LoopbackIo.h"
#include "PluginLoader.h"
#include "TempDirectory.h"

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;

namespace {

constexpr int kAbsent = 128;
constexpr int kTcp = 64;
constexpr int kUdp = 64;
constexpr int kChannels = kAbsent + kTcp + kUdp;

// One channel made through the plug-in's factory, with the tags the test
// uses.
class Channel {
 public:
  Channel(IProtocolFactory& factory, const std::string& name, const std::string& config)
      : factory_(factory), protocol_(factory.CreateProtocol("VELT")) {
    EXPECT_NE(protocol_, nullptr);
    protocol_->SetIdent(name.c_str());
    EXPECT_TRUE(protocol_->Config(config.c_str())) << protocol_->GetLastErrorString();
    EXPECT_TRUE(protocol_->Start());
    connect_ = Tag("?connect?boolean");
    connected_ = Tag("?conn_stat?boolean");
    available_ = Tag("?tokens_available?unsignedInt");
  }
  Channel(const Channel&) = delete;
  Channel& operator=(const Channel&) = delete;
  Channel(Channel&&) = delete;
  Channel& operator=(Channel&&) = delete;
  ~Channel() { Delete(); }

  bool Connect() {
    const unsigned char on = 1;
    return protocol_->Write(connect_, &on);
  }
  bool Connected() {
    unsigned char value = 0;
    return protocol_->Read(connected_, &value) && value != 0;
  }
  unsigned TokensAvailable() {
    unsigned char bytes[4] = {};
    unsigned value = 0;
    if (protocol_->Read(available_, bytes)) {
      std::memcpy(&value, bytes, sizeof value);
    }
    return value;
  }
  bool Stop() { return protocol_->Stop(); }
  void Delete() {
    if (protocol_ == nullptr) {
      return;
    }
    for (ITag* const tag : {connect_, connected_, available_}) {
      protocol_->FreeTag(tag);
    }
    factory_.DeleteProtocol(protocol_);
    protocol_ = nullptr;
  }

 private:
  ITag* Tag(const char* uri) {
    ITag* const tag = protocol_->CreateTag(uri);
    EXPECT_NE(tag, nullptr) << uri;
    return tag;
  }

  IProtocolFactory& factory_;
  IProtocol* protocol_;
  ITag* connect_ = nullptr;
  ITag* connected_ = nullptr;
  ITag* available_ = nullptr;
};

std::string Tcp(const std::string& address, std::uint16_t port) {
  return "CfgVer=1 model=1 socketType=TCP remoteIpAddress=" + address +
         " remotePort=" + std::to_string(port) + " rx_suffix=0A";
}

bool WaitUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) {
  const auto deadline = Clock::now() + limit;
  while (!condition()) {
    if (Clock::now() >= deadline) {
      return false;
    }
    std::this_thread::sleep_for(5ms);
  }
  return true;
}

}  // namespace

TEST(ManyChannels, TwoHundredFiftySixChannelsStartConnectCarryAndStop) {
  const auto start = Clock::now();
  // The channels, and the test's own ends of the TCP connections.
  const std::size_t needed = DescriptorLimit::ForChannels(kChannels) + 2 * kTcp;
  std::string error;
  if (!DescriptorLimit::Ensure(needed, error)) {
    GTEST_SKIP() << "this machine's limit of open files is too low for the test: " << error;
  }
  const TempDirectory folder;
  std::uint16_t refusing = 0;
  const FileDescriptor closed = LoopbackIo::ClosedTcpPort(refusing);
  std::uint16_t listening = 0;
  const FileDescriptor listener = LoopbackIo::Listen(kTcp, listening);
  auto host = std::make_unique<HostInterfaceFactory>(folder.File("storage.ini"));
  {
    PluginLoader plugin(VELT_PLUGIN_PATH, *host);
    std::vector<std::unique_ptr<Channel>> channels;
    for (int i = 0; i < kChannels; ++i) {
      // Each absent device has an address of its own, as separate devices
      // that are switched off do.
      const std::string config =
          i < kAbsent ? Tcp("127.0.1." + std::to_string(i + 1), refusing)
          : i < kAbsent + kTcp
              ? Tcp("127.0.0.1", listening)
              : "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";
      channels.push_back(
          std::make_unique<Channel>(plugin.Protocols(), "CH" + std::to_string(i), config));
    }
    EXPECT_EQ(host->MultiTask().LiveTasks(), static_cast<std::size_t>(kChannels));
    for (const auto& channel : channels) {
      ASSERT_TRUE(channel->Connect());
    }
    const auto asked = Clock::now();
    std::vector<FileDescriptor> peers;
    while (peers.size() < kTcp) {
      FileDescriptor peer = LoopbackIo::Accept(listener.Get(), 10000ms);
      ASSERT_TRUE(peer.Valid()) << "accepted " << peers.size() << " of " << kTcp;
      peers.push_back(std::move(peer));
    }
    for (int i = kAbsent; i < kChannels; ++i) {
      EXPECT_TRUE(WaitUntil([&] { return channels[i]->Connected(); }, 10000ms)) << i;
    }
    for (const FileDescriptor& peer : peers) {
      LoopbackIo::SendAll(peer.Get(), LoopbackIo::FromText("token\n"));
    }
    for (int i = kAbsent; i < kAbsent + kTcp; ++i) {
      EXPECT_TRUE(WaitUntil([&] { return channels[i]->TokensAvailable() == 1; }, 10000ms)) << i;
    }
    for (int i = 0; i < kAbsent; ++i) {
      EXPECT_FALSE(channels[i]->Connected()) << i;
    }
    // The absent devices are paced: a handful of attempts in the first
    // second (windows of 10 ms to 1 s), then one a second, where the drivers
    // ask a hundred times a second.
    const double seconds = std::chrono::duration<double>(Clock::now() - asked).count();
    EXPECT_LE(static_cast<double>(host->SocketFactory().ConnectAttempts()),
              kAbsent * (10 + seconds) + kTcp)
        << "in " << seconds << " s";
    for (const auto& channel : channels) {
      EXPECT_TRUE(channel->Stop());
    }
    EXPECT_EQ(host->MultiTask().LiveTasks(), 0U);
    EXPECT_EQ(host->SocketFactory().LiveSockets(), 0U);
    channels.clear();
  }
  EXPECT_EQ(host->HeldTotal(), 0);
  EXPECT_EQ(host->MultiTask().LiveMutexes(), 0U);
  EXPECT_LT(Clock::now() - start, 60s);
}
