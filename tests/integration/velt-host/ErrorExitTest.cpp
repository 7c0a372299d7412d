// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// Start-up failures end velt-host with status 1 and one line on standard
// error; a bad command line ends it with status 2 before anything is loaded.

#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "HostProcess.h"
#include "ScratchFolder.h"

namespace {

const std::string kGoodConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";
const std::string kTryHelp = "Try 'velt-host --help'.\n";

}  // namespace

TEST(ErrorExit, BadConfigurationShowsTheParsersText) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config",
                        "CfgVer=1 model=1 socketType=TCP remoteIpAddress=127.0.0.1"},
                       "get_stat\n");
  EXPECT_EQ(result.err,
            "velt-host: cannot configure VELT: Parser: parameter 'remotePort' is not found\n");
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, BadSecondConfigurationNamesItsInstance) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kGoodConfig,
                        "--config", "model=1", "--ident", "A", "--ident", "B"});
  EXPECT_EQ(result.err, "velt-host: cannot configure B: Parser: unknown format\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, OutOfRangeValueShowsTheParsersText) {
  ScratchFolder scratch;
  const HostProcess::Result result = HostProcess::Run(
      {"--storage", scratch.File("storage.ini"), "--config", kGoodConfig + " token_queue_size=0"});
  EXPECT_EQ(result.err,
            "velt-host: cannot configure VELT: parameter 'token_queue_size' out of range\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, MissingPluginNamesThePathAndTheLoadersReason) {
  ScratchFolder scratch;
  const std::string plugin = scratch.File("absent/libvelt.so");
  const HostProcess::Result result =
      HostProcess::Run({"--plugin", plugin, "--storage", scratch.File("storage.ini")});
  EXPECT_EQ(result.err, "velt-host: cannot load plug-in " + plugin + ": " + plugin +
                            ": cannot open shared object file: No such file or directory\n");
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, LibraryWithoutEntryPointIsNoPlugin) {
  const HostProcess::Result result = HostProcess::Run({"--plugin", "libz.so.1", "info"});
  EXPECT_EQ(result.err.rfind("velt-host: plug-in libz.so.1 has no GetInterfaceFactory: ", 0), 0U)
      << result.err;
  EXPECT_NE(result.err.find("undefined symbol: GetInterfaceFactory\n"), std::string::npos);
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, UnknownInstanceFailsTheRun) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kGoodConfig, "-c",
                        ".use Press", "-c", "get_stat"});
  EXPECT_EQ(result.err, "velt-host: no instance named 'Press'\n");
  EXPECT_EQ(result.out, "Disconnected\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, CommandsWithoutAnyInstanceFail) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "-c", "get_stat"});
  EXPECT_EQ(result.err, "velt-host: no instance\n");
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, UnknownDotCommandFailsTheRun) {
  ScratchFolder scratch;
  const HostProcess::Result result = HostProcess::Run(
      {"--storage", scratch.File("storage.ini"), "--config", kGoodConfig}, ".lsit\nget_stat\n");
  EXPECT_EQ(result.err, "velt-host: unknown command '.lsit' (.help lists the host's commands)\n");
  EXPECT_EQ(result.out, "Disconnected\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, UnknownDriverCommandFailsTheRun) {
  ScratchFolder scratch;
  const HostProcess::Result result = HostProcess::Run(
      {"--storage", scratch.File("storage.ini"), "--config", kGoodConfig}, "gte_stat\n");
  EXPECT_EQ(result.err,
            "velt-host: unknown command 'gte_stat' (help lists the instance's commands, .help "
            "the host's)\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, BadCommandLineExitsWithTwo) {
  HostProcess::Result result = HostProcess::Run({"--bogus"});
  EXPECT_EQ(result.err, "velt-host: unknown option '--bogus'\n" + kTryHelp);
  EXPECT_EQ(result.out, "");
  EXPECT_EQ(result.status, std::optional<int>(2));

  result = HostProcess::Run({"--config"});
  EXPECT_EQ(result.err, "velt-host: option '--config' needs a value\n" + kTryHelp);
  EXPECT_EQ(result.status, std::optional<int>(2));

  result = HostProcess::Run({"--ident", "A"});
  EXPECT_EQ(result.err, "velt-host: more --ident options (1) than instances (0)\n" + kTryHelp);
  EXPECT_EQ(result.status, std::optional<int>(2));

  result = HostProcess::Run({"xml", "--config", kGoodConfig});
  EXPECT_EQ(
      result.err,
      "velt-host: xml takes no --config, --config-file, --ident, --storage or -c\n" + kTryHelp);
  EXPECT_EQ(result.status, std::optional<int>(2));

  result = HostProcess::Run({"play"});
  EXPECT_EQ(result.err, "velt-host: unknown command 'play'\n" + kTryHelp);
  EXPECT_EQ(result.status, std::optional<int>(2));
}

TEST(ErrorExit, MissingConfigurationFile) {
  ScratchFolder scratch;
  const std::string file = scratch.File("absent.cfg");
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config-file", file});
  EXPECT_EQ(result.err, "velt-host: cannot read the configuration file " + file +
                            ": No such file or directory\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, StorageFolderMustExist) {
  ScratchFolder scratch;
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("absent/storage.ini"), "--config", kGoodConfig});
  EXPECT_EQ(result.err,
            "velt-host: the storage folder " + scratch.File("absent") + " does not exist\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}

TEST(ErrorExit, CorruptStorageFileIsReportedAndLeftAsItIs) {
  ScratchFolder scratch;
  scratch.Write("storage.ini", "this is not a storage file\n");
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kGoodConfig});
  EXPECT_EQ(
      result.err.rfind(
          "velt-host: cannot read the storage file " + scratch.File("storage.ini") + ":1: ", 0),
      0U)
      << result.err;
  EXPECT_EQ(scratch.Read("storage.ini"), "this is not a storage file\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}
