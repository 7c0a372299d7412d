// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>

#include <map>
#include <stdexcept>
#include <string>
#include <vector>

#include "HostInterfaceFactory.h"
#include "PluginLoader.h"
#include "RecordingHostFactory.h"
#include "TempDirectory.h"

namespace {

const std::string kPlugin = VELT_PLUGIN_PATH;

std::string LoadError(const std::string& path, IInterfaceFactory& host) {
  try {
    PluginLoader loader(path, host);
  } catch (const std::runtime_error& e) {
    return e.what();
  }
  return std::string();
}

}  // namespace

TEST(PluginLoader, BindsTheHostsServicesAndGivesThemBackOnDestruction) {
  TempDirectory dir;
  HostInterfaceFactory host(dir.File("store.txt"));
  {
    PluginLoader loader(kPlugin, host);
    EXPECT_EQ(loader.Path(), kPlugin);
    EXPECT_STREQ(loader.Module().GetImpName(), "ProtModule");
    EXPECT_STREQ(loader.Module().GetLastError(), "");
    EXPECT_STREQ(loader.Protocols().GetImpName(), "ProtFactoryInDLL");
    EXPECT_EQ(loader.Protocols().GetImpVersion(), 100);
    EXPECT_EQ(host.HeldInterfaces(), (std::map<std::string, int>{{"ICDSBuffer", 1},
                                                                 {"IMultiTask2", 1},
                                                                 {"IPermanentStorage", 1},
                                                                 {"ISerialFactory", 1},
                                                                 {"ISocketFactory", 1}}));
  }
  EXPECT_EQ(host.HeldTotal(), 0);
  EXPECT_EQ(host.UnmatchedReleases(), 0);
  EXPECT_EQ(host.MultiTask().LiveTasks(), 0U);
  EXPECT_EQ(host.SocketFactory().LiveSockets(), 0U);
}

TEST(PluginLoader, ClosesTheModuleInItsReleaseOrder) {
  RecordingHostFactory host;
  { PluginLoader loader(kPlugin, host); }
  EXPECT_EQ(host.Released(),
            (std::vector<std::string>{"IFastTimer", "ISmux", "IDriverInterface", "IDiag",
                                      "IPermanentStorage", "IMultiTask2", "ISerialFactory",
                                      "ISocketFactory", "ICDSBuffer"}));
  EXPECT_EQ(host.Held(), 0);
}

TEST(PluginLoader, AModuleThatFailsToInitialiseIsReportedWithItsText) {
  RecordingHostFactory host;
  host.Refuse("ICDSBuffer");
  EXPECT_EQ(LoadError(kPlugin, host),
            "plug-in " + kPlugin + " failed to initialise: piCDSBuffer not created");
  EXPECT_EQ(host.Held(), 0);
}

TEST(PluginLoader, AMissingFileIsReportedWithTheLoadersText) {
  HostInterfaceFactory host("");
  const std::string error = LoadError("/nonexistent/libnothing.so", host);
  EXPECT_EQ(error,
            "cannot load plug-in /nonexistent/libnothing.so: /nonexistent/libnothing.so: cannot "
            "open shared object file: No such file or directory");
  EXPECT_EQ(host.HeldTotal(), 0);
}

TEST(PluginLoader, ALibraryWithoutTheEntryPointIsRefused) {
  HostInterfaceFactory host("");
  const std::string error = LoadError("libm.so.6", host);
  const std::string expected = "plug-in libm.so.6 has no GetInterfaceFactory: ";
  EXPECT_EQ(error.substr(0, expected.size()), expected);
  EXPECT_NE(error.find("undefined symbol: GetInterfaceFactory"), std::string::npos) << error;
}

TEST(PluginLoader, CanLoadAgainAfterUnloading) {
  HostInterfaceFactory host("");
  for (int round = 0; round < 3; ++round) {
    PluginLoader loader(kPlugin, host);
    EXPECT_EQ(host.Held("IMultiTask2"), 1);
  }
  EXPECT_EQ(host.HeldTotal(), 0);
}
