// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "IProtModule.h"
#include "IProtocolFactory.h"
#include "RecordingHostFactory.h"

namespace {

using Names = std::vector<std::string>;
using EntryPoint = IInterfaceFactory* (*)();

const Names kAllRequests = {"IMultiTask2",      "ISerialFactory", "ISocketFactory",
                            "ICDSBuffer",       "IDiag",          "IPermanentStorage",
                            "IDriverInterface", "ISmux",          "IFastTimer"};
const Names kFullReleaseOrder = {
    "IFastTimer",  "ISmux",          "IDriverInterface", "IDiag",     "IPermanentStorage",
    "IMultiTask2", "ISerialFactory", "ISocketFactory",   "ICDSBuffer"};

// Opens the built plug-in as a host does and closes it when the test ends.
class Plugin {
 public:
  Plugin() : handle_(dlopen(VELT_PLUGIN_PATH, RTLD_NOW | RTLD_LOCAL)) {}
  Plugin(const Plugin&) = delete;
  Plugin& operator=(const Plugin&) = delete;
  Plugin(Plugin&&) = delete;
  Plugin& operator=(Plugin&&) = delete;
  ~Plugin() { Unload(); }

  bool Loaded() const { return handle_ != nullptr; }
  EntryPoint Entry() const {
    return reinterpret_cast<EntryPoint>(dlsym(handle_, "GetInterfaceFactory"));
  }
  void* Symbol(const char* name) const { return dlsym(handle_, name); }
  int Unload() {
    const int rc = handle_ == nullptr ? 0 : dlclose(handle_);
    handle_ = nullptr;
    return rc;
  }

 private:
  void* handle_;
};

}  // namespace

TEST(PluginLoad, EntryPointInitAndCloseThroughDlopen) {
  Plugin plugin;
  ASSERT_TRUE(plugin.Loaded()) << dlerror();
  const EntryPoint entry = plugin.Entry();
  ASSERT_NE(entry, nullptr);
  IInterfaceFactory* const factory = entry();
  ASSERT_NE(factory, nullptr);
  EXPECT_EQ(entry(), factory);

  auto* const module = static_cast<IProtModule*>(factory->CreateInterface("IProtModule"));
  ASSERT_NE(module, nullptr);
  EXPECT_STREQ(module->GetImpName(), "ProtModule");

  RecordingHostFactory host;
  ASSERT_EQ(module->Init(&host), 1) << module->GetLastError();
  EXPECT_EQ(host.Requested(), kAllRequests);
  EXPECT_EQ(host.Held(), 9);

  auto* const protocols =
      static_cast<IProtocolFactory*>(factory->CreateInterface("IProtocolFactory"));
  ASSERT_NE(protocols, nullptr);
  EXPECT_STREQ(protocols->GetImpName(), "ProtFactoryInDLL");
  EXPECT_EQ(protocols->GetImpVersion(), 100);

  module->Close();
  EXPECT_EQ(host.Released(), kFullReleaseOrder);
  EXPECT_EQ(host.Held(), 0);
  EXPECT_EQ(plugin.Unload(), 0);
}

TEST(PluginLoad, UnloadWithoutCloseGivesTheServicesBack) {
  RecordingHostFactory host;
  {
    Plugin plugin;
    ASSERT_TRUE(plugin.Loaded()) << dlerror();
    auto* const module =
        static_cast<IProtModule*>(plugin.Entry()()->CreateInterface("IProtModule"));
    ASSERT_EQ(module->Init(&host), 1);
    host.ClearLog();
    ASSERT_EQ(plugin.Unload(), 0);
  }
  EXPECT_EQ(host.Released(), kFullReleaseOrder);
  EXPECT_EQ(host.Held(), 0);
}

TEST(PluginLoad, FailedInitIsReportedThroughTheModule) {
  Plugin plugin;
  ASSERT_TRUE(plugin.Loaded()) << dlerror();
  auto* const module = static_cast<IProtModule*>(plugin.Entry()()->CreateInterface("IProtModule"));
  RecordingHostFactory host;
  host.Refuse("ICDSBuffer");
  EXPECT_EQ(module->Init(&host), 0);
  EXPECT_STREQ(module->GetLastError(), "piCDSBuffer not created");
  EXPECT_EQ(host.Held(), 0);
}

TEST(PluginLoad, OnlyTheEntryPointIsVisible) {
  Plugin plugin;
  ASSERT_TRUE(plugin.Loaded()) << dlerror();
  EXPECT_NE(plugin.Symbol("GetInterfaceFactory"), nullptr);
  EXPECT_EQ(plugin.Symbol("Factory"), nullptr);
  EXPECT_EQ(plugin.Symbol("piMultiTask"), nullptr);
  EXPECT_EQ(plugin.Symbol("_Z16CompareInterfacePKcS0_"), nullptr);
}

TEST(PluginLoad, UnloadsAfterTheLastErrorWasReadOnThisThread) {
  {
    Plugin plugin;
    ASSERT_TRUE(plugin.Loaded()) << dlerror();
    IInterfaceFactory* const factory = plugin.Entry()();
    auto* const module = static_cast<IProtModule*>(factory->CreateInterface("IProtModule"));
    RecordingHostFactory host;
    ASSERT_EQ(module->Init(&host), 1);
    auto* const protocols =
        static_cast<IProtocolFactory*>(factory->CreateInterface("IProtocolFactory"));
    IProtocol* const channel = protocols->CreateProtocol("VELT");
    ASSERT_NE(channel, nullptr);
    EXPECT_FALSE(channel->Config("no section"));
    EXPECT_STREQ(channel->GetLastErrorString(), "Parser: unknown format");
    protocols->DeleteProtocol(channel);
    module->Close();
    ASSERT_EQ(plugin.Unload(), 0);
  }
  // Nothing of the plug-in stays behind in this thread: the library is gone.
  EXPECT_EQ(dlopen(VELT_PLUGIN_PATH, RTLD_NOW | RTLD_NOLOAD), nullptr);
}
