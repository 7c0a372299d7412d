// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/HostCommandLine.h"

#include <gtest/gtest.h>

#include <chrono>
#include <string>
#include <vector>

using velthost::Action;
using velthost::HostCommandLine;

namespace {

using Words = std::vector<std::string>;

std::string ErrorOf(const Words& arguments) {
  HostCommandLine commandLine;
  EXPECT_FALSE(commandLine.Parse(arguments));
  return commandLine.Error();
}

}  // namespace

TEST(HostCommandLine, NoArgumentsIsTheConsoleWithDefaults) {
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({}));
  const velthost::HostOptions& options = commandLine.Options();
  EXPECT_EQ(options.action, Action::kConsole);
  EXPECT_EQ(options.pluginPath, "");
  EXPECT_EQ(options.storagePath, "");
  EXPECT_TRUE(options.channels.empty());
  EXPECT_TRUE(options.names.empty());
  EXPECT_TRUE(options.commands.empty());
  EXPECT_FALSE(options.quiet);
  EXPECT_FALSE(options.connectBackoff.has_value());
}

TEST(HostCommandLine, ConfigsAndFilesKeepTheirOrderAndGetDefaultNames) {
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({"--config", "A", "--config-file", "b.cfg", "--config=C"}));
  const velthost::HostOptions& options = commandLine.Options();
  ASSERT_EQ(options.channels.size(), 3U);
  EXPECT_EQ(options.channels[0].text, "A");
  EXPECT_FALSE(options.channels[0].fromFile);
  EXPECT_EQ(options.channels[1].text, "b.cfg");
  EXPECT_TRUE(options.channels[1].fromFile);
  EXPECT_EQ(options.channels[2].text, "C");
  EXPECT_FALSE(options.channels[2].fromFile);
  EXPECT_EQ(options.names, (Words{"VELT", "VELT2", "VELT3"}));
}

TEST(HostCommandLine, IdentsNameTheInstancesInOrderAndTheRestByPosition) {
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse(
      {"--ident", "Left", "--config", "A", "--config", "B", "--ident=Right", "--config", "C"}));
  EXPECT_EQ(commandLine.Options().names, (Words{"Left", "Right", "VELT3"}));
}

TEST(HostCommandLine, DefaultNamesCountFromTheSecond) {
  EXPECT_EQ(HostCommandLine::DefaultName(0), "VELT");
  EXPECT_EQ(HostCommandLine::DefaultName(1), "VELT2");
  EXPECT_EQ(HostCommandLine::DefaultName(9), "VELT10");
}

TEST(HostCommandLine, OptionsWithValues) {
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({"--plugin", "/p/libvelt.so", "--storage=/s/store.ini", "-q", "-c",
                                 "get_stat", "-c", "", "-c", ".list"}));
  const velthost::HostOptions& options = commandLine.Options();
  EXPECT_EQ(options.pluginPath, "/p/libvelt.so");
  EXPECT_EQ(options.storagePath, "/s/store.ini");
  EXPECT_TRUE(options.quiet);
  EXPECT_EQ(options.commands, (Words{"get_stat", "", ".list"}));
}

TEST(HostCommandLine, ActionsWithPluginAndQuiet) {
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({"xml"}));
  EXPECT_EQ(commandLine.Options().action, Action::kXml);
  ASSERT_TRUE(commandLine.Parse({"--plugin", "x.so", "info"}));
  EXPECT_EQ(commandLine.Options().action, Action::kInfo);
  EXPECT_EQ(commandLine.Options().pluginPath, "x.so");
  ASSERT_TRUE(commandLine.Parse({"demo", "--quiet"}));
  EXPECT_EQ(commandLine.Options().action, Action::kDemo);
  EXPECT_TRUE(commandLine.Options().quiet);
}

TEST(HostCommandLine, HelpAndVersionEndTheScan) {
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({"--quiet", "--help", "--bogus"}));
  EXPECT_EQ(commandLine.Options().action, Action::kHelp);
  ASSERT_TRUE(commandLine.Parse({"--version"}));
  EXPECT_EQ(commandLine.Options().action, Action::kVersion);
  EXPECT_EQ(HostCommandLine::Version(), "velt-host " VELT_VERSION);
}

TEST(HostCommandLine, UnknownOptionAndCommandAreRefused) {
  EXPECT_EQ(ErrorOf({"--bogus"}), "unknown option '--bogus'");
  EXPECT_EQ(ErrorOf({"-x"}), "unknown option '-x'");
  EXPECT_EQ(ErrorOf({"--quiet=yes"}), "unknown option '--quiet=yes'");
  EXPECT_EQ(ErrorOf({"run"}), "unknown command 'run'");
  EXPECT_EQ(ErrorOf({"xml", "info"}), "unexpected argument 'info'");
}

TEST(HostCommandLine, MissingValuesAreRefused) {
  EXPECT_EQ(ErrorOf({"--plugin"}), "option '--plugin' needs a value");
  EXPECT_EQ(ErrorOf({"--plugin="}), "option '--plugin' needs a value");
  EXPECT_EQ(ErrorOf({"--storage"}), "option '--storage' needs a value");
  EXPECT_EQ(ErrorOf({"--config"}), "option '--config' needs a value");
  EXPECT_EQ(ErrorOf({"--config-file="}), "option '--config-file' needs a value");
  EXPECT_EQ(ErrorOf({"--config", "A", "--ident"}), "option '--ident' needs a value");
  EXPECT_EQ(ErrorOf({"--config", "A", "--ident="}), "option '--ident' needs a non-empty name");
  EXPECT_EQ(ErrorOf({"-c"}), "option '-c' needs a value");
}

TEST(HostCommandLine, PathsMayBeGivenOnce) {
  EXPECT_EQ(ErrorOf({"--plugin", "a", "--plugin", "b"}), "option '--plugin' given twice");
  EXPECT_EQ(ErrorOf({"--storage=a", "--storage=b"}), "option '--storage' given twice");
}

TEST(HostCommandLine, IdentsBeyondTheInstancesAreRefused) {
  EXPECT_EQ(ErrorOf({"--ident", "A"}), "more --ident options (1) than instances (0)");
  EXPECT_EQ(ErrorOf({"--config", "x", "--ident", "A", "--ident", "B"}),
            "more --ident options (2) than instances (1)");
}

TEST(HostCommandLine, TwoInstancesOfOneNameAreRefused) {
  EXPECT_EQ(ErrorOf({"--config", "x", "--config", "y", "--ident", "A", "--ident", "A"}),
            "two instances are named 'A'");
  EXPECT_EQ(ErrorOf({"--config", "x", "--config", "y", "--ident", "VELT2"}),
            "two instances are named 'VELT2'");
}

TEST(HostCommandLine, ActionsTakeNoConsoleOptions) {
  EXPECT_EQ(ErrorOf({"xml", "--config", "x"}),
            "xml takes no --config, --config-file, --ident, --storage or -c");
  EXPECT_EQ(ErrorOf({"info", "-c", "help"}),
            "info takes no --config, --config-file, --ident, --storage or -c");
  EXPECT_EQ(ErrorOf({"--storage", "s", "demo"}),
            "demo takes no --config, --config-file, --ident, --storage or -c");
}

TEST(HostCommandLine, ConnectBackoffTakesMillisecondsUpToAnHour) {
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse({"--connect-backoff", "250"}));
  EXPECT_EQ(commandLine.Options().connectBackoff, std::chrono::milliseconds(250));
  ASSERT_TRUE(commandLine.Parse({"--connect-backoff=0"}));
  EXPECT_EQ(commandLine.Options().connectBackoff, std::chrono::milliseconds(0));
  ASSERT_TRUE(commandLine.Parse({"--connect-backoff=3600000"}));
  EXPECT_EQ(commandLine.Options().connectBackoff, std::chrono::milliseconds(3600000));
}

TEST(HostCommandLine, ConnectBackoffOutOfRangeOrNoNumberIsRefused) {
  for (const char* value : {"3600001", "-1", "", "1s", " 5", "99999999", "1e3"}) {
    EXPECT_EQ(
        ErrorOf({"--connect-backoff", value}),
        std::string("option '--connect-backoff' needs milliseconds from 0 to 3600000, not '") +
            value + "'");
  }
  EXPECT_EQ(ErrorOf({"--connect-backoff"}), "option '--connect-backoff' needs a value");
  EXPECT_EQ(ErrorOf({"--connect-backoff=5", "--connect-backoff=6"}),
            "option '--connect-backoff' given twice");
  EXPECT_EQ(ErrorOf({"demo", "--connect-backoff", "5"}), "demo takes no --connect-backoff");
}

TEST(HostCommandLine, TwoHundredFiftySixInstancesAreNamedAndCheckedOnce) {
  Words arguments;
  for (int i = 0; i < 256; ++i) {
    arguments.insert(arguments.end(), {"--config", "x"});
  }
  HostCommandLine commandLine;
  ASSERT_TRUE(commandLine.Parse(arguments));
  ASSERT_EQ(commandLine.Options().names.size(), 256U);
  EXPECT_EQ(commandLine.Options().names[255], "VELT256");
  arguments.insert(arguments.end(), {"--ident", "A", "--ident", "VELT256"});
  EXPECT_EQ(ErrorOf(arguments), "two instances are named 'VELT256'");
}

TEST(HostCommandLine, UsageNamesEveryOption) {
  const std::string usage = HostCommandLine::Usage();
  for (const char* option :
       {"--plugin PATH", "--storage PATH", "--config STRING", "--config-file FILE", "--ident NAME",
        "-c COMMAND", "-q, --quiet", "--connect-backoff MS", "--help", "--version", " xml ",
        " info ", " demo "}) {
    EXPECT_NE(usage.find(option), std::string::npos) << option;
  }
}
