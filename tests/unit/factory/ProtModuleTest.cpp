// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "factory/ProtModule.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "RecordingHostFactory.h"
#include "binding/HostServices.h"
#include "factory/ProtFactory.h"

namespace {

using Names = std::vector<std::string>;

const Names kAllRequests = {"IMultiTask2",      "ISerialFactory", "ISocketFactory",
                            "ICDSBuffer",       "IDiag",          "IPermanentStorage",
                            "IDriverInterface", "ISmux",          "IFastTimer"};

const Names kFullReleaseOrder = {
    "IFastTimer",  "ISmux",          "IDriverInterface", "IDiag",     "IPermanentStorage",
    "IMultiTask2", "ISerialFactory", "ISocketFactory",   "ICDSBuffer"};

bool AllServicePointersNull() {
  return piMultiTask == nullptr && piSerialFactory == nullptr && piSocketFactory == nullptr &&
         piCDSBuffer == nullptr && piDiag == nullptr && piPermanentStorage == nullptr &&
         piDriverInterface == nullptr && piSmux == nullptr && piFastTimer == nullptr;
}

// Each test uses a module object of its own and leaves the module-wide
// pointers cleared, so tests stay independent of each other.
class ProtModuleTest : public ::testing::Test {
 protected:
  void TearDown() override {
    piMultiTask = nullptr;
    piSerialFactory = nullptr;
    piSocketFactory = nullptr;
    piCDSBuffer = nullptr;
    piDiag = nullptr;
    piPermanentStorage = nullptr;
    piDriverInterface = nullptr;
    piSmux = nullptr;
    piFastTimer = nullptr;
  }

  RecordingHostFactory host;
};

}  // namespace

TEST_F(ProtModuleTest, Identity) {
  ProtModule module;
  EXPECT_STREQ(module.GetImpName(), "ProtModule");
  EXPECT_EQ(module.GetImpVersion(), 100);
  EXPECT_STREQ(module.GetLastError(), "");
}

TEST_F(ProtModuleTest, ConvertToAnswersItsTwoNames) {
  ProtModule module;
  EXPECT_EQ(module.ConvertTo("ProtModule"), static_cast<IInterface*>(&module));
  EXPECT_EQ(module.ConvertTo("IProtModule"), static_cast<IInterface*>(&module));
  EXPECT_EQ(module.ConvertTo("protmodule"), nullptr);
  EXPECT_EQ(module.ConvertTo("IProtocolFactory"), nullptr);
}

TEST_F(ProtModuleTest, InitRequestsEveryServiceInOrderAndBindsThem) {
  ProtModule module;
  ASSERT_EQ(module.Init(&host), 1);
  EXPECT_EQ(host.Requested(), kAllRequests);
  EXPECT_EQ(host.Released(), Names{});
  EXPECT_EQ(host.Held(), 9);
  EXPECT_STREQ(piMultiTask->GetImpName(), "InertMultiTask");
  EXPECT_STREQ(piSerialFactory->GetImpName(), "InertSerialFactory");
  EXPECT_STREQ(piSocketFactory->GetImpName(), "InertSocketFactory");
  EXPECT_STREQ(piCDSBuffer->GetImpName(), "InertCDSBuffer");
  EXPECT_STREQ(piDiag->GetImpName(), "InertDiag");
  EXPECT_NE(piPermanentStorage, nullptr);
  EXPECT_STREQ(piDriverInterface->GetImpName(), "InertDriverInterface");
  EXPECT_STREQ(piSmux->GetImpName(), "InertSmux");
  EXPECT_STREQ(piFastTimer->GetImpName(), "InertFastTimer");
  EXPECT_STREQ(module.GetLastError(), "");
  module.Close();
}

TEST_F(ProtModuleTest, CloseReleasesEverythingInTheFixedOrder) {
  ProtModule module;
  ASSERT_EQ(module.Init(&host), 1);
  host.ClearLog();
  module.Close();
  EXPECT_EQ(host.Released(), kFullReleaseOrder);
  EXPECT_EQ(host.Held(), 0);
  EXPECT_TRUE(AllServicePointersNull());
}

TEST_F(ProtModuleTest, MissingMultiTaskFailsWithoutReleases) {
  host.Refuse("IMultiTask2");
  ProtModule module;
  EXPECT_EQ(module.Init(&host), 0);
  EXPECT_STREQ(module.GetLastError(), "IMultiTask2 not created");
  EXPECT_EQ(host.Log(), Names{"create IMultiTask2 -> null"});
  EXPECT_EQ(host.Held(), 0);
}

TEST_F(ProtModuleTest, MissingSerialFactoryReleasesMultiTask) {
  host.Refuse("ISerialFactory");
  ProtModule module;
  EXPECT_EQ(module.Init(&host), 0);
  EXPECT_STREQ(module.GetLastError(), "ISerialFactory not created");
  EXPECT_EQ(host.Log(),
            (Names{"create IMultiTask2", "create ISerialFactory -> null", "release IMultiTask2"}));
  EXPECT_EQ(host.Held(), 0);
}

TEST_F(ProtModuleTest, MissingSocketFactoryReleasesTwoInOrder) {
  host.Refuse("ISocketFactory");
  ProtModule module;
  EXPECT_EQ(module.Init(&host), 0);
  EXPECT_STREQ(module.GetLastError(), "ISocketFactory not created");
  EXPECT_EQ(host.Released(), (Names{"IMultiTask2", "ISerialFactory"}));
  EXPECT_EQ(host.Held(), 0);
}

TEST_F(ProtModuleTest, MissingCdsBufferReleasesThreeInOrderAndNamesThePointer) {
  host.Refuse("ICDSBuffer");
  ProtModule module;
  EXPECT_EQ(module.Init(&host), 0);
  EXPECT_EQ(host.Log(),
            (Names{"create IMultiTask2", "create ISerialFactory", "create ISocketFactory",
                   "create ICDSBuffer -> null", "release IMultiTask2", "release ISerialFactory",
                   "release ISocketFactory"}));
  EXPECT_STREQ(module.GetLastError(), "piCDSBuffer not created");
  EXPECT_EQ(host.Held(), 0);
}

TEST_F(ProtModuleTest, FailedInitLeavesTheModuleUnbound) {
  host.Refuse("ICDSBuffer");
  ProtModule module;
  ASSERT_EQ(module.Init(&host), 0);
  host.ClearLog();
  module.Close();
  EXPECT_EQ(host.Log(), Names{});
  EXPECT_TRUE(AllServicePointersNull());
}

TEST_F(ProtModuleTest, AllOptionalMissingStillSucceedsAndCloseReleasesFour) {
  for (const char* optional :
       {"IDiag", "IPermanentStorage", "IDriverInterface", "ISmux", "IFastTimer"}) {
    host.Refuse(optional);
  }
  ProtModule module;
  ASSERT_EQ(module.Init(&host), 1);
  EXPECT_STREQ(module.GetLastError(), "");
  EXPECT_EQ(piDiag, nullptr);
  EXPECT_EQ(piPermanentStorage, nullptr);
  EXPECT_EQ(piDriverInterface, nullptr);
  EXPECT_EQ(piSmux, nullptr);
  EXPECT_EQ(piFastTimer, nullptr);
  host.ClearLog();
  module.Close();
  EXPECT_EQ(host.Released(),
            (Names{"IMultiTask2", "ISerialFactory", "ISocketFactory", "ICDSBuffer"}));
  EXPECT_EQ(host.Held(), 0);
}

TEST_F(ProtModuleTest, NestedInitReleasesOnlyAtTheLastClose) {
  ProtModule module;
  ASSERT_EQ(module.Init(&host), 1);
  host.ClearLog();
  ASSERT_EQ(module.Init(&host), 1);
  EXPECT_EQ(host.Log(), Names{});
  module.Close();
  EXPECT_EQ(host.Log(), Names{});
  EXPECT_NE(piMultiTask, nullptr);
  module.Close();
  EXPECT_EQ(host.Released(), kFullReleaseOrder);
  host.ClearLog();
  module.Close();
  EXPECT_EQ(host.Log(), Names{});
  EXPECT_TRUE(AllServicePointersNull());
}

TEST_F(ProtModuleTest, SecondInitIgnoresItsFactory) {
  ProtModule module;
  ASSERT_EQ(module.Init(&host), 1);
  RecordingHostFactory other;
  ASSERT_EQ(module.Init(&other), 1);
  EXPECT_EQ(other.Log(), Names{});
  module.Close();
  module.Close();
  EXPECT_EQ(other.Log(), Names{});
  EXPECT_EQ(host.Released(), kFullReleaseOrder);
}

TEST_F(ProtModuleTest, CloseBeforeInitDoesNothing) {
  ProtModule module;
  module.Close();
  EXPECT_EQ(host.Log(), Names{});
  ASSERT_EQ(module.Init(&host), 1);
  EXPECT_EQ(host.Requested(), kAllRequests);
  module.Close();
}

TEST_F(ProtModuleTest, DestructorGivesTheServicesBack) {
  {
    ProtModule module;
    ASSERT_EQ(module.Init(&host), 1);
    host.ClearLog();
  }
  EXPECT_EQ(host.Released(), kFullReleaseOrder);
  EXPECT_EQ(host.Held(), 0);
}

TEST_F(ProtModuleTest, NullHostFactoryFails) {
  ProtModule module;
  EXPECT_EQ(module.Init(nullptr), 0);
  EXPECT_STREQ(module.GetLastError(), "IMultiTask2 not created");
  EXPECT_TRUE(AllServicePointersNull());
}

TEST_F(ProtModuleTest, TheModuleWideModuleBindsThroughTheEntryPoint) {
  auto* const module =
      static_cast<IProtModule*>(Factory.interfaceFactory.CreateInterface("IProtModule"));
  ASSERT_EQ(module->Init(&host), 1);
  EXPECT_EQ(host.Requested(), kAllRequests);
  module->Close();
  EXPECT_EQ(host.Released(), kFullReleaseOrder);
}
