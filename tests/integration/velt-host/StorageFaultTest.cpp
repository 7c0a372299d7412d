// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// velt-host and its storage file: a write that fails is reported on standard
// error once per apply and fails the run, while the applied values stay in
// force; stored values that break their ranges are reported at start and
// used as they stand.

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <optional>
#include <string>

#include "HostProcess.h"
#include "ScratchFolder.h"

namespace {

const std::string kConfig =
    "CfgVer=1 model=1 socketType=UDP remoteIpAddress=127.0.0.1 remotePort=9";
constexpr int kCannotMount = 77;

std::string NotUpdated(const std::string& path, const std::string& reason) {
  return "velt-host: the storage file " + path + " was not updated (" + reason +
         "); the value just applied holds until restart\n";
}

}  // namespace

TEST(StorageFault, AReadOnlyFileIsReportedOncePerApplyAndTheRunFails) {
  ScratchFolder scratch;
  scratch.Write("storage.ini", "[\"VELT\"]\n\"gap\" = int 4\n");
  const std::string path = scratch.File("storage.ini");
  ASSERT_EQ(::chmod(path.c_str(), 0444), 0);
  const HostProcess::Result result = HostProcess::Run(
      {"--storage", path, "--config", kConfig, "-c", ".write ?SP_Gap?unsignedInt 5", "-c",
       ".write ?SP_Done?boolean 1", "-c", ".read ?SP_Gap?unsignedInt", "-c",
       ".write ?SP_Done?boolean 1", "-c", "get_stat"});
  EXPECT_EQ(result.err, NotUpdated(path, "cannot write: Permission denied") +
                            NotUpdated(path, "cannot write: Permission denied"));
  EXPECT_EQ(result.out, "5\nDisconnected\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
  EXPECT_EQ(scratch.Read("storage.ini"), "[\"VELT\"]\n\"gap\" = int 4\n");
}

// velt-host in a mount namespace of its own, its storage on a 64 KiB tmpfs
// that a filler file has nearly filled: the first apply creates the file,
// the second finds no room.
TEST(StorageFault, AFullDiskIsReportedAndTheAppliedValueHolds) {
  if (::access("/usr/bin/unshare", X_OK) != 0) {
    GTEST_SKIP() << "no /usr/bin/unshare";
  }
  ScratchFolder scratch;
  const std::string folder = scratch.File("small");
  ASSERT_EQ(::mkdir(folder.c_str(), 0700), 0);
  const std::string path = folder + "/storage.ini";
  const std::string script = "mount -t tmpfs -o size=64k tmpfs '" + folder +
                             "' 2>/dev/null || exit " + std::to_string(kCannotMount) +
                             "\nhead -c 60000 /dev/zero > '" + folder + "/filler'\nexec '" +
                             VELT_HOST_PROGRAM + "' --storage '" + path + "' --config '" + kConfig +
                             "' -c '.write ?SP_Gap?unsignedInt 5' -c '.write ?SP_Done?boolean 1'"
                             " -c '.write ?SP_Gap?unsignedInt 6' -c '.write ?SP_Done?boolean 1'"
                             " -c '.read ?SP_Gap?unsignedInt'\n";
  HostProcess process({"-m", "sh", "-c", script}, {}, "/usr/bin/unshare");
  process.CloseInput();
  const std::string out = process.ReadOutput();
  const std::string err = process.ReadErrors();
  const std::optional<int> status = process.Wait();
  if (status == std::optional<int>(kCannotMount) || status == std::optional<int>(1)) {
    if (out.empty() && err.find("velt-host") == std::string::npos) {
      GTEST_SKIP() << "cannot mount a tmpfs in a mount namespace here: " << err;
    }
  }
  EXPECT_EQ(err, NotUpdated(path, "cannot write: No space left on device"));
  EXPECT_EQ(out, "6\n");
  EXPECT_EQ(status, std::optional<int>(1));
}

TEST(StorageFault, StoredValuesOutOfTheirRangesAreReportedAtStartAndUsed) {
  ScratchFolder scratch;
  scratch.Write("storage.ini",
                "[\"VELT\"]\n"
                "\"broadcast_type\" = text \"Both\"\n"
                "\"gap\" = int -5\n"
                "\"hex_tokens\" = bool true\n"
                "\"local_port\" = int -1\n"
                "\"remote_ip_address\" = text \"" +
                    std::string(300, '1') +
                    "\"\n"
                    "\"remote_port\" = int 70000\n"
                    "\"rx_prefix\" = text \"0G\"\n"
                    "\"rx_suffix\" = text \"0D0A\"\n"
                    "\"socket_type\" = text \"udp\\x01\"\n"
                    "\"token_queue_size\" = int 0\n"
                    "[\"OTHER\"]\n"
                    "\"gap\" = int -7\n");
  const HostProcess::Result result =
      HostProcess::Run({"--storage", scratch.File("storage.ini"), "--config", kConfig, "-c",
                        ".read ?SP_Gap?unsignedInt", "-c", ".read ?SP_TokenQueueSize?unsignedInt",
                        "-c", ".read ?SP_RemoteIP?string-16"});
  EXPECT_EQ(result.err,
            "velt-host: warning: VELT: the stored socket_type \"udp\\x01\" is neither UDP nor "
            "TCP; the channel uses it as it stands\n"
            "velt-host: warning: VELT: the stored remote_ip_address of 300 bytes is longer than "
            "255 bytes; the channel reads it as empty\n"
            "velt-host: warning: VELT: the stored remote_port 70000 is outside 0 to 65535; the "
            "channel uses it as it stands\n"
            "velt-host: warning: VELT: the stored local_port -1 is outside 0 to 65535; the "
            "channel uses it as it stands\n"
            "velt-host: warning: VELT: the stored broadcast_type \"Both\" is neither Global nor "
            "Local; the channel uses it as it stands\n"
            "velt-host: warning: VELT: the stored rx_prefix \"0G\" is not hex text; the channel "
            "uses it as it stands\n"
            "velt-host: warning: VELT: the stored gap -5 is negative; the channel uses it as it "
            "stands\n"
            "velt-host: warning: VELT: the stored token_queue_size 0 is outside 1 to 10000; the "
            "channel uses it as it stands\n");
  EXPECT_EQ(result.out, "4294967291\n0\n\n");
  EXPECT_EQ(result.status, std::optional<int>(0));
}

TEST(StorageFault, AStoragePathThatIsNoRegularFileStopsVeltHostAtOnce) {
  ScratchFolder scratch;
  const std::string fifo = scratch.File("storage.ini");
  ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
  HostProcess::Result result = HostProcess::Run({"--storage", fifo, "--config", kConfig});
  EXPECT_EQ(result.err, "velt-host: cannot read the storage file " + fifo +
                            ": cannot read: not a regular file but a FIFO\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
  result = HostProcess::Run({"--storage", "/dev/zero", "--config", kConfig});
  EXPECT_EQ(result.err,
            "velt-host: cannot read the storage file /dev/zero: cannot read: not a regular file "
            "but a character device\n");
  EXPECT_EQ(result.status, std::optional<int>(1));
}
