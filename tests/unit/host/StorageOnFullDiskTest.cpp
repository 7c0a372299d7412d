// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// The permanent storage on a real full file system and on a read-only one:
// a 64 KiB tmpfs mounted in a mount namespace of a child process, so that
// nothing outside the test sees it. Where the test may not mount (no
// privilege), it is skipped; StorageApply covers the same reports with an
// injected failure.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <fstream>
#include <functional>
#include <iterator>
#include <string>
#include <vector>

#include "DurableFile.h"
#include "HostMutex.h"
#include "HostPermanentStorage.h"
#include "TempDirectory.h"

namespace {

constexpr int kCannotMount = 77;

std::string FileText(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

// Runs body in a child with a 64 KiB tmpfs at folder, in a mount namespace
// of its own; returns what body wrote to its report, or nothing with
// skipped set when the child could not mount.
std::string InSmallFileSystem(const std::string& folder, const std::function<std::string()>& body,
                              bool& skipped) {
  std::array<int, 2> report{};
  if (::pipe(report.data()) != 0) {
    return "no pipe";
  }
  const pid_t child = ::fork();
  if (child == 0) {
    ::close(report[0]);
    if (::unshare(CLONE_NEWNS) != 0 ||
        ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0 ||
        ::mount("tmpfs", folder.c_str(), "tmpfs", 0, "size=64k,mode=0700") != 0) {
      ::_exit(kCannotMount);
    }
    const std::string text = body();
    const ssize_t written = ::write(report[1], text.data(), text.size());
    ::_exit(written == static_cast<ssize_t>(text.size()) ? 0 : 1);
  }
  ::close(report[1]);
  std::string text;
  std::array<char, 4096> chunk{};
  for (ssize_t n = 0; (n = ::read(report[0], chunk.data(), chunk.size())) > 0;) {
    text.append(chunk.data(), static_cast<std::size_t>(n));
  }
  ::close(report[0]);
  int status = 0;
  ::waitpid(child, &status, 0);
  skipped = WIFEXITED(status) && WEXITSTATUS(status) == kCannotMount;
  return text;
}

// Applies tx_prefix (and gap) under a host mutex; reports the failures.
std::string ApplyAndReport(HostPermanentStorage& storage, const std::string& prefix, int gap) {
  std::string reports;
  storage.SetFailureHook([&reports](const StorageFailure& failure) {
    reports += failure.reason + " / " + std::to_string(failure.values) + "\n";
  });
  HostMutex lock;
  lock.Lock();
  storage.SetStringValue("VELT", "tx_prefix", prefix.c_str());
  storage.SetIntValue("VELT", "gap", gap);
  lock.Unlock();
  return reports;
}

}  // namespace

TEST(StorageOnFullDisk, AnApplyThatDoesNotFitIsReportedAndTheOldFileStays) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  bool skipped = false;
  const std::string report = InSmallFileSystem(
      dir.Path(),
      [&path] {
        HostPermanentStorage storage(path);
        std::string text = ApplyAndReport(storage, "0A", 1);
        const std::string before = FileText(path);
        text += ApplyAndReport(storage, std::string(70 * 1024, 'A'), 2);
        text += FileText(path) == before ? "old file kept\n" : "file changed\n";
        text += "temporary files: " + std::to_string(DurableFile::SweepTemporaries(path)) + "\n";
        text += "gap in force: " + std::to_string(storage.GetIntValue("VELT", "gap")) + "\n";
        return text;
      },
      skipped);
  if (skipped) {
    GTEST_SKIP() << "cannot mount a tmpfs in a mount namespace here";
  }
  EXPECT_EQ(report,
            "cannot write: No space left on device / 2\n"
            "old file kept\n"
            "temporary files: 0\n"
            "gap in force: 2\n");
}

TEST(StorageOnFullDisk, AnApplyOnAReadOnlyFileSystemIsReported) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  bool skipped = false;
  const std::string report = InSmallFileSystem(
      dir.Path(),
      [&path, &dir] {
        std::string text;
        {
          HostPermanentStorage storage(path);
          text += ApplyAndReport(storage, "0A", 1);
        }
        if (::mount(nullptr, dir.Path().c_str(), nullptr, MS_REMOUNT | MS_RDONLY, nullptr) != 0) {
          return std::string("cannot remount read-only");
        }
        HostPermanentStorage storage(path);
        text += ApplyAndReport(storage, "0B", 2);
        text +=
            "stored gap: " + std::to_string(HostPermanentStorage(path).GetIntValue("VELT", "gap")) +
            "\n";
        return text;
      },
      skipped);
  if (skipped) {
    GTEST_SKIP() << "cannot mount a tmpfs in a mount namespace here";
  }
  EXPECT_EQ(report,
            "cannot write: Read-only file system / 2\n"
            "stored gap: 1\n");
}
