// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <cstring>
#include <string>
#include <vector>

#include "DriverFixture.h"
#include "IProtocolFactory.h"
#include "binding/HostServices.h"
#include "driver/XmlDescription.h"
#include "factory/ProtFactory.h"

namespace {

using Log = std::vector<std::string>;

class ProtocolLifecycleTest : public DriverFixture {};

}  // namespace

TEST_F(ProtocolLifecycleTest, Identity) {
  Protocol_VELT& p = Create(kUdpConfig);
  EXPECT_STREQ(p.GetName(), "VELT");
  EXPECT_STREQ(p.GetImpName(), "Protocol_VELT");
  EXPECT_EQ(p.GetImpVersion(), 100);
  EXPECT_EQ(p.GetProtocolVersion(), 112);
  EXPECT_EQ(p.GetProtocolType(), 472);
  EXPECT_STREQ(p.GetProtocolName(), "Velt Conduit");
  EXPECT_EQ(p.GetMaxTm(nullptr), 0);
  EXPECT_STREQ(p.GetIdent(), "VELT");
  const char* const* names = p.tagUriNames();
  EXPECT_STREQ(names[0], "node");
  EXPECT_STREQ(names[1], "memorytype");
  EXPECT_STREQ(names[2], "datatype");
  EXPECT_EQ(names[3], nullptr);
  EXPECT_EQ(p.getTagUriFieldCount(), 3);
  EXPECT_EQ(p.GetXml(), GetXml_VELT());
  EXPECT_EQ(p.GetXml(), p.GetXml());
}

TEST_F(ProtocolLifecycleTest, ConvertToAnswersTheProtocolNames) {
  Protocol_VELT& p = Create(kUdpConfig);
  for (const char* name : {"Protocol_VELT", "ProtocolBase", "IProtocol7", "IProtocol6",
                           "IProtocol5", "IProtocol4", "IProtocol3", "IProtocol2", "IProtocol"}) {
    EXPECT_EQ(p.ConvertTo(name), static_cast<IInterface*>(&p)) << name;
  }
}

TEST_F(ProtocolLifecycleTest, ConvertToAnyOtherNameGivesNull) {
  Protocol_VELT& p = Create(kUdpConfig);
  for (const char* name : {"IProtocol8", "iprotocol", "Protocol_velt", "", "IProtocolFactory"}) {
    EXPECT_EQ(p.ConvertTo(name), nullptr) << name;
  }
}

TEST_F(ProtocolLifecycleTest, GetNodeIdAnswersTheTagsNode) {
  Protocol_VELT& p = Create(kUdpConfig);
  ITag* const tag = Tag("0x1F?rx_token?string-10");
  EXPECT_EQ(p.GetNodeID(tag), 31);
  EXPECT_EQ(p.GetNodeID(nullptr), 0);
}

TEST_F(ProtocolLifecycleTest, InformationTextNamesTheDriver) {
  Protocol_VELT& p = Create(kUdpConfig);
  char text[512] = {};
  const int written = p.GetInfo(text, sizeof text);
  EXPECT_EQ(std::string(text, static_cast<std::size_t>(written)),
            "Protocol: VELT (472) v.112\n"
            "Implementation: Protocol_VELT v.100\n"
            "ProtocolBase v.100\n"
            "ProtLib v.200\n"
            "FakeMultiTask v.7\n"
            "InertSerialFactory v.1\n"
            "ScriptedSocketFactory v.3\n");
}

TEST_F(ProtocolLifecycleTest, ExtendAnswersTheCapabilityRecord) {
  Protocol_VELT& p = Create(kUdpConfig);
  unsigned char record[8] = {3, 0, 0, 0, 9, 9, 9, 9};
  EXPECT_EQ(p.Extend(0, record), 1);
  EXPECT_EQ(std::vector<unsigned char>(record + 4, record + 8),
            (std::vector<unsigned char>{1, 0, 0, 0}));
  unsigned char other[8] = {2, 0, 0, 0, 9, 9, 9, 9};
  EXPECT_EQ(p.Extend(0, other), 1);
  EXPECT_EQ(std::vector<unsigned char>(other + 4, other + 8),
            (std::vector<unsigned char>{0, 0, 0, 0}));
  unsigned char hostRecord[80] = {};
  hostRecord[68] = 42;
  EXPECT_EQ(p.Extend(3, hostRecord), 42);
  EXPECT_EQ(p.Extend(1, hostRecord), 0);
  EXPECT_EQ(p.Extend(0, nullptr), 0);
}

TEST_F(ProtocolLifecycleTest, JstrcpyCopiesWithTheTerminator) {
  char target[8];
  std::memset(target, 'x', sizeof target);
  EXPECT_EQ(Protocol_VELT::_jstrcpy(target, "abc"), target);
  EXPECT_EQ(std::string(target, 5), std::string("abc\0x", 5));
}

TEST_F(ProtocolLifecycleTest, ConstructionMakesOneLockAndTouchesNoNetwork) {
  Create(kUdpConfig);
  EXPECT_EQ(tasks.LiveMutexes(), 1);
  EXPECT_EQ(sockets.Log(), Log{});
  Destroy();
  EXPECT_EQ(tasks.LiveMutexes(), 0);
}

TEST_F(ProtocolLifecycleTest, ConfigFailureIsTheProtocolsError) {
  protocol = std::make_unique<Protocol_VELT>();
  EXPECT_FALSE(protocol->Config("CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.2.3.4"));
  EXPECT_EQ(protocol->GetLastError(), -1);
  EXPECT_STREQ(protocol->GetLastErrorString(), "Parser: parameter 'remotePort' is not found");
  EXPECT_FALSE(protocol->Config("socketType=UDP"));
  EXPECT_STREQ(protocol->GetLastErrorString(), "Parser: unknown format");
}

TEST_F(ProtocolLifecycleTest, ConfigWithoutABoundModuleFails) {
  // A channel needs the module's services to be made; once the module is
  // closed, configuring it reports the missing socket service.
  protocol = std::make_unique<Protocol_VELT>();
  module.Close();
  EXPECT_FALSE(protocol->Config(kUdpConfig));
  EXPECT_EQ(protocol->GetLastError(), -1);
  EXPECT_STREQ(protocol->GetLastErrorString(), "Internal error: ISocketFactory2 missing");
  protocol.reset();
  EXPECT_EQ(module.Init(&host), 1);
}

TEST_F(ProtocolLifecycleTest, StartMakesTheSocketAndOneWorker) {
  Protocol_VELT& p = Create(kUdpConfig);
  EXPECT_TRUE(p.Start());
  EXPECT_EQ(sockets.Log(), Log{"create 6000 0 0 -> #1"});
  EXPECT_EQ(tasks.TasksCreated(), 1);
  EXPECT_EQ(tasks.LastTaskSetting(), 3);
  EXPECT_TRUE(p.Start());
  EXPECT_EQ(tasks.TasksCreated(), 1);
  EXPECT_EQ(sockets.Log(), Log{"create 6000 0 0 -> #1"});
}

TEST_F(ProtocolLifecycleTest, StopOfAStoppedChannelDoesNothing) {
  Protocol_VELT& p = Create(kUdpConfig);
  EXPECT_TRUE(p.Stop());
  EXPECT_EQ(tasks.DeleteWaits(), std::vector<int>{});
  EXPECT_TRUE(p.Start());
  EXPECT_TRUE(p.Stop());
  EXPECT_TRUE(p.Stop());
  EXPECT_EQ(tasks.DeleteWaits(), std::vector<int>{1000});
  EXPECT_EQ(sockets.Log(), (Log{"create 6000 0 0 -> #1", "delete #1 0"}));
}

TEST_F(ProtocolLifecycleTest, StopRepeatsTheTaskDeletionUntilTheTaskEnded) {
  Protocol_VELT& p = Started(kUdpConfig);
  tasks.DeleteTaskFailures(2);
  EXPECT_TRUE(p.Stop());
  EXPECT_EQ(tasks.DeleteWaits(), (std::vector<int>{1000, 1000, 1000}));
  EXPECT_EQ(tasks.LiveTasks(), 0);
}

TEST_F(ProtocolLifecycleTest, RestartMakesANewWorkerAndWaitsForConnect) {
  Protocol_VELT& p = Connected(kUdpConfig);
  EXPECT_TRUE(p.Stop());
  EXPECT_TRUE(p.Start());
  EXPECT_EQ(tasks.TasksCreated(), 2);
  EXPECT_FALSE(p.isConnected());
  EXPECT_FALSE(p.isConnectRequested());
  Pass(2);
  EXPECT_TRUE(Sock().Connects().empty());
}

TEST_F(ProtocolLifecycleTest, FlagsAreClearedBeforeTheNewWorkerStarts) {
  Protocol_VELT& p = Connected(kUdpConfig);
  p.Stop();
  bool requested = true;
  bool connectedAtStart = true;
  tasks.OnStartTask([&] {
    requested = p.isConnectRequested();
    connectedAtStart = p.isConnected();
  });
  p.Start();
  EXPECT_FALSE(requested);
  EXPECT_FALSE(connectedAtStart);
}

TEST_F(ProtocolLifecycleTest, LowerCaseTcpGivesAUdpSocket) {
  Started("CfgVer=1 model=1 socketType=tcp remoteIpAddress=127.0.0.1 remotePort=1");
  EXPECT_EQ(sockets.Log(), Log{"create 0 0 0 -> #1"});
}

TEST_F(ProtocolLifecycleTest, TcpGivesATcpSocketOnTheLocalPort) {
  Started("CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1 remotePort=1 localPort=4321");
  EXPECT_EQ(sockets.Log(), Log{"create 4321 1 0 -> #1"});
}

TEST_F(ProtocolLifecycleTest, LocalBroadcastWithoutLocalAddressLooksUpAPublicOne) {
  sockets.SetAdapter(0x0A000005U, 0xFF000000U);
  Started(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=255.255.255.255 remotePort=1 "
      "broadcastType=Local localIpAddress=");
  const auto all = sockets.Sockets();
  ASSERT_EQ(all.size(), 2U);
  EXPECT_EQ(all[0]->AdapterQueries(), std::vector<unsigned int>{0x08080808U});
  EXPECT_EQ(sockets.Log(), (Log{"create 0 0 0 -> #1", "delete #1 0", "create 0 0 0 -> #2"}));
}

TEST_F(ProtocolLifecycleTest, LocalBroadcastLooksUpTheGivenAddressLiterally) {
  sockets.SetAdapter(0x7F000001U, 0xFF000000U);
  Started(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=255.255.255.255 remotePort=1 "
      "broadcastType=Local");
  EXPECT_EQ(sockets.Sockets()[0]->AdapterQueries(), std::vector<unsigned int>{0U});
}

TEST_F(ProtocolLifecycleTest, LocalBroadcastAddressIsTheAdapterOrNotItsMask) {
  // The look-up address is public; the broadcast address comes from the
  // adapter, never from the looked-up address.
  sockets.SetAdapter(0xC0A8010AU, 0xFFFFFF00U);
  Connected(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=255.255.255.255 remotePort=9 "
      "broadcastType=Local localIpAddress=8.8.4.4");
  EXPECT_EQ(Sock().Connects().at(0).ip, "192.168.1.255");
}

TEST_F(ProtocolLifecycleTest, ProbeSocketFailureIsReported) {
  sockets.FailCreates(1);
  Protocol_VELT& p = Started(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.1.1.1 remotePort=1 broadcastType=Local");
  EXPECT_EQ(p.GetLastError(), -6);
  EXPECT_STREQ(p.GetLastErrorString(), "Can't open connection socket");
  EXPECT_EQ(sockets.Log(), Log{"create 0 0 0 -> null"});
}

TEST_F(ProtocolLifecycleTest, BadLookupAddressLeavesTheProbeUndeleted) {
  Protocol_VELT& p = Started(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.1.1.1 remotePort=1 broadcastType=Local "
      "localIpAddress=10.0.0");
  EXPECT_EQ(p.GetLastError(), -6);
  EXPECT_STREQ(p.GetLastErrorString(), "Incorrect format of IP address");
  EXPECT_EQ(sockets.Log(), Log{"create 0 0 0 -> #1"});
  EXPECT_EQ(sockets.Live(), 1);
}

TEST_F(ProtocolLifecycleTest, FailedAdapterLookupDeletesTheProbe) {
  Protocol_VELT& p = Started(
      "CfgVer=1 model=1 socketType=UDP remoteIpAddress=1.1.1.1 remotePort=1 broadcastType=Local "
      "localIpAddress=10.1.2.3");
  EXPECT_EQ(p.GetLastError(), -6);
  EXPECT_STREQ(p.GetLastErrorString(), "Can't get IP adapter info");
  EXPECT_EQ(sockets.Log(), (Log{"create 0 0 0 -> #1", "delete #1 0"}));
}

TEST_F(ProtocolLifecycleTest, ChannelSocketThatCannotBeMadeLeavesNoErrorAndStartSucceeds) {
  sockets.FailCreates(1);
  Protocol_VELT& p = Create(kUdpConfig);
  EXPECT_TRUE(p.Start());
  EXPECT_EQ(p.GetLastError(), 1);
  EXPECT_STREQ(p.GetLastErrorString(), "");
  EXPECT_EQ(sockets.Log(), Log{"create 6000 0 0 -> null"});
  EXPECT_EQ(tasks.TasksCreated(), 1);
}

TEST_F(ProtocolLifecycleTest, StartReadsTheThirteenLiveNamesInOrder) {
  storage.presetInt("VELT", "remote_port", 7777);
  Started(kUdpConfig);
  std::vector<std::string> asked;
  for (const StorageCall& call : storage.calls()) {
    if (call.operation == "HasValue") {
      asked.push_back(call.name);
    }
  }
  EXPECT_EQ(asked, (std::vector<std::string>{"socket_type", "remote_ip_address", "remote_port",
                                             "local_ip_address", "local_port", "broadcast_type",
                                             "rx_prefix", "rx_suffix", "gap", "tx_prefix",
                                             "tx_suffix", "hex_tokens", "token_queue_size"}));
  EXPECT_EQ(protocol->getSettings().number(Setting::RemotePort), 7777);
  EXPECT_EQ(protocol->getSettings().text(Setting::RemoteIp), "127.0.0.1");
}

TEST_F(ProtocolLifecycleTest, StorageIsReadOnlyAtTheFirstStart) {
  Protocol_VELT& p = Started(kUdpConfig);
  p.Stop();
  storage.clearCalls();
  p.Start();
  EXPECT_TRUE(storage.calls().empty());
}

TEST_F(ProtocolLifecycleTest, StoredValuesLiveUnderTheInstanceIdentity) {
  storage.presetText("panel-7", "remote_ip_address", "127.0.0.9");
  Protocol_VELT& p = Create(kUdpConfig);
  p.SetIdent("panel-7");
  p.Start();
  EXPECT_EQ(p.getSettings().text(Setting::RemoteIp), "127.0.0.9");
}

TEST_F(ProtocolLifecycleTest, LaterConfigDoesNotChangeTheLiveValuesOfTheSameChannel) {
  Protocol_VELT& p = Started(kUdpConfig);
  p.Stop();
  ASSERT_TRUE(
      p.Config("CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.5 remotePort=9 gap=40"));
  p.Start();
  EXPECT_EQ(p.getSettings().text(Setting::SocketType), "UDP");
  EXPECT_EQ(p.getSettings().text(Setting::RemoteIp), "127.0.0.1");
  EXPECT_EQ(p.getSettings().number(Setting::RemotePort), 5000);
  EXPECT_EQ(p.getSettings().number(Setting::Gap), 0);
}

TEST_F(ProtocolLifecycleTest, NewChannelStartsFromTheNewConfiguration) {
  Started(kUdpConfig);
  Destroy();
  Protocol_VELT& p =
      Started("CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.5 remotePort=9 gap=40");
  EXPECT_EQ(p.getSettings().text(Setting::SocketType), "TCP");
  EXPECT_EQ(p.getSettings().text(Setting::RemoteIp), "127.0.0.5");
  EXPECT_EQ(p.getSettings().number(Setting::Gap), 40);
}

TEST_F(ProtocolLifecycleTest, DestroyingARunningChannelStopsItFirst) {
  Started(kUdpConfig);
  protocol.reset();
  EXPECT_EQ(tasks.LiveTasks(), 0);
  EXPECT_EQ(sockets.Live(), 0);
  EXPECT_EQ(tasks.LiveMutexes(), 0);
}

TEST_F(ProtocolLifecycleTest, ProtocolFactoryCreatesIndependentChannels) {
  auto* const factory =
      static_cast<IProtocolFactory*>(GetInterfaceFactory()->CreateInterface("IProtocolFactory"));
  IProtocol* const first = factory->CreateProtocol("VELT");
  IProtocol* const second = factory->CreateProtocol("VELT");
  ASSERT_NE(first, nullptr);
  ASSERT_NE(second, nullptr);
  EXPECT_NE(first, second);
  EXPECT_STREQ(first->GetName(), "VELT");
  EXPECT_EQ(factory->CreateProtocol("VELT "), nullptr);
  EXPECT_EQ(factory->CreateProtocol(""), nullptr);
  factory->DeleteProtocol(first);
  factory->DeleteProtocol(second);
  factory->DeleteProtocol(nullptr);
  EXPECT_EQ(tasks.LiveMutexes(), 0);
}
