// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Where velt-host looks for the plug-in and keeps its storage by default, and
// how instances find their configuration and storage section.

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <filesystem>
#include <optional>
#include <string>

#include "HostProcess.h"
#include "ScratchFolder.h"

namespace {

const std::string kConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";

}  // namespace

// Installed, the plug-in lives in its own folder under the library folder
// (lib/velt, or lib/<triplet>/velt under /usr), which the build tells as a
// path relative to the program's folder.
TEST(Layout, InstalledProgramFindsThePluginInThePluginFolder) {
  ScratchFolder scratch;
  ASSERT_EQ(::mkdir(scratch.File("bin").c_str(), 0700), 0);
  const std::string pluginFolder = scratch.File("bin/" VELT_INSTALLED_PLUGIN_FOLDER);
  ASSERT_TRUE(std::filesystem::create_directories(pluginFolder));
  const std::string program = scratch.File("bin/velt-host");
  std::filesystem::copy_file(VELT_HOST_PROGRAM, program);
  std::filesystem::copy_file(VELT_PLUGIN_PATH, pluginFolder + "/libvelt.so");
  const std::string command = program + " info > " + scratch.File("out.txt") + " 2>&1";
  ASSERT_EQ(std::system(command.c_str()), 0) << scratch.Read("out.txt");
  EXPECT_EQ(scratch.Read("out.txt").rfind("Protocol: VELT (472) v.112\n", 0), 0U);

  std::filesystem::remove(pluginFolder + "/libvelt.so");
  EXPECT_NE(std::system(command.c_str()), 0);
  EXPECT_EQ(scratch.Read("out.txt"), "velt-host: cannot load plug-in " + scratch.File("bin") +
                                         "/libvelt.so: " + scratch.File("bin") +
                                         "/libvelt.so: cannot open shared object file: No such "
                                         "file or directory\n");
}

TEST(Layout, DefaultStorageUnderXdgStateHomeIsCreatedAndKeepsAppliedValues) {
  ScratchFolder scratch;
  const std::string state = "XDG_STATE_HOME=" + scratch.File("state");
  HostProcess::Result result =
      HostProcess::Run({"--config", kConfig, "-c", ".write ?SP_Gap?unsignedInt 7", "-c",
                        ".write ?SP_Done?boolean 1"},
                       "", {state});
  ASSERT_EQ(result.status, std::optional<int>(0)) << result.err;
  EXPECT_NE(scratch.Read("state/velt/storage.ini").find("[\"VELT\"]\n\"gap\" = int 7\n"),
            std::string::npos)
      << scratch.Read("state/velt/storage.ini");
  struct stat info {};
  ASSERT_EQ(::stat(scratch.File("state/velt").c_str(), &info), 0);
  EXPECT_EQ(info.st_mode & 0777U, 0700U);

  // A new run starts with the applied value instead of the configured one.
  result = HostProcess::Run({"--config", kConfig, "-c", ".read ?SP_Gap?unsignedInt"}, "", {state});
  EXPECT_EQ(result.out, "7\n");
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(Layout, DefaultStorageFallsBackToTheHome) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--config", kConfig, "-c", ".write ?SP_Gap?unsignedInt 9", "-c",
                        ".write ?SP_Done?boolean 1"},
                       "", {"-XDG_STATE_HOME", "HOME=" + scratch.Path()});
  ASSERT_EQ(result.status, std::optional<int>(0)) << result.err;
  EXPECT_NE(scratch.Read(".local/state/velt/storage.ini").find("\"gap\" = int 9\n"),
            std::string::npos);
}

TEST(Layout, IdentNamesTheStorageSection) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kConfig, "--ident",
                        "Press1", "-c", ".write ?SP_RemotePort?unsignedShort 4000", "-c",
                        ".write ?SP_Done?boolean 1", "-c", ".list"});
  EXPECT_EQ(result.out, "* Press1 UDP 127.0.0.1:4000 disconnected\n");
  EXPECT_EQ(result.status, std::optional<int>(0)) << result.err;
  EXPECT_NE(scratch.Read("storage.ini").find("[\"Press1\"]\n\"remote_port\" = int 4000\n"),
            std::string::npos)
      << scratch.Read("storage.ini");
}

TEST(Layout, ConfigurationFileMayBreakItsStringIntoLines) {
  ScratchFolder scratch;
  scratch.Write("press.cfg",
                "CfgVer=1 model=1\nsocketType=TCP\r\nremoteIpAddress=127.0.0.1\nremotePort=9\n");
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kConfig,
                        "--config-file", scratch.File("press.cfg"), "-c", ".list"});
  EXPECT_EQ(result.out,
            "* VELT  UDP 127.0.0.1:9 disconnected\n"
            "  VELT2 TCP 127.0.0.1:9 disconnected\n");
  EXPECT_EQ(result.err, "");
  EXPECT_EQ(result.status, std::optional<int>(0));
}
