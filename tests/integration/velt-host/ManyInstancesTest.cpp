// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host with hundreds of instances in one process: the limit of open
// files is raised for them or the start is refused with a clear message, and
// 256 instances start, connect, list and stop.

#include <gtest/gtest.h>
#include <sys/resource.h>

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "HostProcess.h"
#include "ScratchFolder.h"

namespace {

const std::string kUdpConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";

// velt-host's arguments for count UDP instances and the commands.
std::vector<std::string> Arguments(const ScratchFolder& scratch, int count,
                                   const std::vector<std::string>& commands) {
  std::vector<std::string> arguments = {"--storage", scratch.File("storage.ini")};
  for (int i = 0; i < count; ++i) {
    arguments.insert(arguments.end(), {"--config", kUdpConfig});
  }
  for (const std::string& command : commands) {
    arguments.insert(arguments.end(), {"-c", command});
  }
  return arguments;
}

// The shell words that run velt-host with arguments after limit (an ulimit
// command).
std::vector<std::string> Limited(const std::string& limit,
                                 const std::vector<std::string>& arguments) {
  std::vector<std::string> words = {"-c", limit + " && exec \"$0\" \"$@\"", VELT_HOST_PROGRAM};
  words.insert(words.end(), arguments.begin(), arguments.end());
  return words;
}

}  // namespace

TEST(ManyInstances, TooFewOpenFilesForTheInstancesIsRefusedAtStart) {
  ScratchFolder scratch;
  HostProcess process(Limited("ulimit -n 100", Arguments(scratch, 40, {"tokens_available"})), {},
                      "/bin/sh");
  EXPECT_EQ(process.ReadErrors(),
            "velt-host: cannot run 40 instances: up to 224 open files are needed, but the limit "
            "is 100 (ulimit -Hn)\n");
  EXPECT_EQ(process.ReadOutput(), "");
  EXPECT_EQ(process.Wait(), std::optional<int>(1));
}

TEST(ManyInstances, ALowSoftLimitIsRaisedForTheInstances) {
  // Sixty instances hold 120 descriptors: with the soft limit of 100 the
  // last ones could make neither their socket nor their task.
  ScratchFolder scratch;
  HostProcess process(Limited("ulimit -Sn 100", Arguments(scratch, 60, {})), {}, "/bin/sh");
  process.Send(".use VELT60\n");
  EXPECT_EQ(process.Ask("connect ON"), std::optional<std::string>("OK"));
  EXPECT_TRUE(process.AskUntil("get_stat", "Connected"));
  process.CloseInput();
  EXPECT_EQ(process.Wait(), std::optional<int>(0));
  EXPECT_EQ(process.ReadErrors(), "");
}

TEST(ManyInstances, TwoHundredFiftySixInstancesStartConnectListAndStop) {
  constexpr int kInstances = 256;
  // What velt-host asks for: four open files per instance and 64 more.
  constexpr rlim_t kNeeded = 4 * kInstances + 64;
  rlimit limit{};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limit), 0);
  if (limit.rlim_max != RLIM_INFINITY && limit.rlim_max < kNeeded) {
    GTEST_SKIP() << "the hard limit of open files (" << limit.rlim_max << ") is below the "
                 << kNeeded << " that 256 instances need";
  }
  ScratchFolder scratch;
  const auto start = std::chrono::steady_clock::now();
  HostProcess process(Arguments(scratch, kInstances, {}));
  for (int i = 1; i <= kInstances; ++i) {
    process.Send(".use " + (i == 1 ? std::string("VELT") : "VELT" + std::to_string(i)) + "\n");
    ASSERT_EQ(process.Ask("connect ON"), std::optional<std::string>("OK")) << i;
  }
  // Each worker connects on its next pass.
  for (int i = 1; i <= kInstances; ++i) {
    process.Send(".use " + (i == 1 ? std::string("VELT") : "VELT" + std::to_string(i)) + "\n");
    ASSERT_TRUE(process.AskUntil("get_stat", "Connected")) << i;
  }
  process.Send(".list\n");
  std::vector<std::string> lines;
  while (lines.size() < kInstances) {
    const std::optional<std::string> line = process.ReadLine();
    ASSERT_TRUE(line.has_value()) << "after " << lines.size() << " lines";
    lines.push_back(*line);
  }
  process.CloseInput();
  EXPECT_EQ(process.Wait(), std::optional<int>(0));
  EXPECT_EQ(process.ReadErrors(), "");
  const auto took = std::chrono::steady_clock::now() - start;
  // The name column is as wide as the longest name; the last instance used
  // is the current one.
  EXPECT_EQ(lines.front(), "  VELT    UDP 127.0.0.1:9 connected");
  EXPECT_EQ(lines[9], "  VELT10  UDP 127.0.0.1:9 connected");
  EXPECT_EQ(lines.back(), "* VELT256 UDP 127.0.0.1:9 connected");
  for (const std::string& line : lines) {
    EXPECT_EQ(line.substr(line.size() - 10), " connected") << line;
  }
  EXPECT_LT(took, std::chrono::seconds(60));
}
