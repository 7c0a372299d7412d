// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <string>

#include "HostInterfaceFactory.h"
#include "ICDSBuffer.h"
#include "IMultiTask2.h"
#include "IPermanentStorage.h"
#include "ISerialFactory.h"
#include "ISocketFactory.h"
#include "StorageError.h"
#include "TempDirectory.h"

TEST(HostInterfaceFactory, HandsOutEveryServiceByName) {
  TempDirectory dir;
  HostInterfaceFactory host(dir.File("store.txt"));
  auto* const multiTask = static_cast<IMultiTask2*>(host.CreateInterface("IMultiTask2"));
  auto* const serial = static_cast<ISerialFactory*>(host.CreateInterface("ISerialFactory"));
  auto* const sockets = static_cast<ISocketFactory2*>(host.CreateInterface("ISocketFactory"));
  auto* const cds = static_cast<ICDSBuffer*>(host.CreateInterface("ICDSBuffer"));
  auto* const storage = static_cast<IPermanentStorage*>(host.CreateInterface("IPermanentStorage"));
  ASSERT_NE(multiTask, nullptr);
  ASSERT_NE(serial, nullptr);
  ASSERT_NE(sockets, nullptr);
  ASSERT_NE(cds, nullptr);
  ASSERT_NE(storage, nullptr);
  EXPECT_EQ(multiTask, &host.MultiTask());
  EXPECT_EQ(sockets, &host.SocketFactory());
  EXPECT_EQ(storage, host.Storage());
  EXPECT_STREQ(multiTask->GetImpName(), "HostMultiTask");
  EXPECT_EQ(multiTask->GetImpVersion(), 100);
  EXPECT_STREQ(serial->GetImpName(), "HostSerialFactory");
  EXPECT_EQ(serial->GetImpVersion(), 100);
  EXPECT_STREQ(sockets->GetImpName(), "HostSocketFactory");
  EXPECT_EQ(sockets->GetImpVersion(), 100);
  EXPECT_STREQ(cds->GetImpName(), "HostCDSBuffer");
  EXPECT_EQ(cds->GetImpVersion(), 100);
  EXPECT_EQ(static_cast<IPermanentStorage2*>(storage->ConvertTo("IPermanentStorage2")),
            host.Storage());
}

TEST(HostInterfaceFactory, OtherNamesGiveNull) {
  HostInterfaceFactory host("");
  for (const char* name : {"IDiag", "IDriverInterface", "ISmux", "IFastTimer", "ISocketFactory2",
                           "IPermanentStorage2", "imultitask2", "IMultiTask", "IMultiTask2 ", ""}) {
    EXPECT_EQ(host.CreateInterface(name), nullptr) << name;
  }
  EXPECT_EQ(host.CreateInterface(nullptr), nullptr);
  EXPECT_EQ(host.HeldTotal(), 0);
}

TEST(HostInterfaceFactory, WithoutAStoragePathThereIsNoPermanentStorage) {
  HostInterfaceFactory host("");
  EXPECT_EQ(host.CreateInterface("IPermanentStorage"), nullptr);
  EXPECT_EQ(host.Storage(), nullptr);
  EXPECT_EQ(host.Held("IPermanentStorage"), 0);
}

TEST(HostInterfaceFactory, CountsWhatIsStillHeldPerName) {
  HostInterfaceFactory host("");
  IInterface* const first = host.CreateInterface("IMultiTask2");
  IInterface* const second = host.CreateInterface("IMultiTask2");
  IInterface* const sockets = host.CreateInterface("ISocketFactory");
  EXPECT_EQ(first, second);
  EXPECT_EQ(host.Held("IMultiTask2"), 2);
  EXPECT_EQ(host.Held("ISocketFactory"), 1);
  EXPECT_EQ(host.Held("ICDSBuffer"), 0);
  EXPECT_EQ(host.HeldTotal(), 3);
  EXPECT_EQ(host.HeldInterfaces(),
            (std::map<std::string, int>{{"IMultiTask2", 2}, {"ISocketFactory", 1}}));

  host.ReleaseInterface(first);
  host.ReleaseInterface(sockets);
  EXPECT_EQ(host.HeldInterfaces(), (std::map<std::string, int>{{"IMultiTask2", 1}}));
  host.ReleaseInterface(second);
  EXPECT_EQ(host.HeldTotal(), 0);
  EXPECT_TRUE(host.HeldInterfaces().empty());
  EXPECT_EQ(host.UnmatchedReleases(), 0);
}

TEST(HostInterfaceFactory, ReleasesThatMatchNoHandOutAreCounted) {
  HostInterfaceFactory host("");
  HostInterfaceFactory other("");
  IInterface* const foreign = other.CreateInterface("IMultiTask2");
  host.ReleaseInterface(foreign);
  IInterface* const own = host.CreateInterface("ICDSBuffer");
  host.ReleaseInterface(own);
  host.ReleaseInterface(own);
  host.ReleaseInterface(nullptr);
  EXPECT_EQ(host.UnmatchedReleases(), 2);
  EXPECT_EQ(host.HeldTotal(), 0);
  EXPECT_EQ(other.Held("IMultiTask2"), 1);
}

TEST(HostInterfaceFactory, ACorruptStorageFileStopsTheHost) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  std::ofstream(path) << "[\"s\"]\n\"n\" = int many\n";
  try {
    HostInterfaceFactory host(path);
    FAIL() << "the host accepted a corrupt storage file";
  } catch (const StorageError& e) {
    EXPECT_EQ(std::string(e.what()), path + ":2: bad integer value: 'many'");
  }
}

TEST(HostInterfaceFactory, PassesSocketTimeoutsOn) {
  HostInterfaceFactory host(
      "", HostSocket::Timeouts{std::chrono::milliseconds(500), std::chrono::milliseconds(700)});
  EXPECT_EQ(host.SocketFactory().Timeouts().connect, std::chrono::milliseconds(500));
  EXPECT_EQ(host.SocketFactory().Timeouts().send, std::chrono::milliseconds(700));
}

TEST(HostInterfaceFactory, ConnectBackoffCeilingIsAnOptionOfTheHost) {
  HostInterfaceFactory byDefault("");
  EXPECT_EQ(byDefault.SocketFactory().Pacing().Ceiling(), std::chrono::milliseconds(1000));
  HostInterfaceFactory host(
      "", HostSocket::Timeouts{std::chrono::milliseconds(500), std::chrono::milliseconds(700),
                               std::chrono::milliseconds(250)});
  EXPECT_EQ(host.SocketFactory().Timeouts().connectBackoff, std::chrono::milliseconds(250));
  EXPECT_EQ(host.SocketFactory().Pacing().Ceiling(), std::chrono::milliseconds(250));
}
