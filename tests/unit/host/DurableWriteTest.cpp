// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <iostream>
#include <random>
#include <string>
#include <thread>

#include "DurableFile.h"
#include "HostPermanentStorage.h"
#include "StorageError.h"
#include "TempDirectory.h"

namespace {

// The text written at step i: long enough that a torn file would show.
std::string ValueAt(int step) { return "value-" + std::to_string(step) + std::string(3000, '#'); }

bool IsAValueWritten(const std::string& text, int& step) {
  const std::string prefix = "value-";
  if (text.compare(0, prefix.size(), prefix) != 0) {
    return false;
  }
  step = std::stoi(text.substr(prefix.size()));
  return text == ValueAt(step);
}

// Writes steps from first on in a loop until killed (bounded, should the
// kill never come).
[[noreturn]] void WriteForever(const std::string& path, int first) {
  try {
    HostPermanentStorage storage(path);
    for (int step = first; step < first + 100000; ++step) {
      storage.SetStringValue("s", "text", ValueAt(step).c_str());
      storage.SetIntValue("s", "step", step);
    }
  } catch (...) {
    ::_exit(3);
  }
  ::_exit(0);
}

}  // namespace

TEST(DurableWrite, AWriterKilledAtRandomInstantsLeavesTheOldOrTheNewFile) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  {
    HostPermanentStorage storage(path);
    storage.SetStringValue("s", "text", "initial");
    storage.SetIntValue("s", "step", 0);
  }
  std::mt19937 random(20240229U);
  std::uniform_int_distribution<int> delayMicros(0, 60000);
  int lastStep = 0;
  int lastNumber = 0;
  for (int round = 0; round < 15; ++round) {
    const pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
      WriteForever(path, lastStep + 1);
    }
    std::this_thread::sleep_for(std::chrono::microseconds(delayMicros(random)));
    ASSERT_EQ(::kill(child, SIGKILL), 0);
    int status = 0;
    ASSERT_EQ(::waitpid(child, &status, 0), child);

    try {
      HostPermanentStorage storage(path);
      const std::string text = storage.GetStringValue("s", "text");
      const int step = storage.GetIntValue("s", "step");
      int textStep = 0;
      if (text != "initial") {
        ASSERT_TRUE(IsAValueWritten(text, textStep)) << "round " << round << ": torn value";
      }
      // Each kill leaves the last complete file: values never go back, and a
      // step's number is written only after its text.
      EXPECT_GE(textStep, lastStep) << "round " << round;
      EXPECT_GE(step, lastNumber) << "round " << round;
      EXPECT_LE(step, textStep) << "round " << round;
      lastStep = textStep;
      lastNumber = step;
    } catch (const StorageError& e) {
      FAIL() << "round " << round << ": the file does not parse: " << e.what();
    }
  }
  std::cout << "last step seen after a kill: " << lastStep << "\n";
}

TEST(DurableWrite, ReplaceSwapsTheWholeFileAndLeavesNoTemporaryFile) {
  TempDirectory dir;
  const std::string path = dir.File("file.txt");
  std::string error;
  ASSERT_TRUE(DurableFile::Replace(path, "first", error)) << error;
  ASSERT_TRUE(DurableFile::Replace(path, "second", error)) << error;
  EXPECT_EQ(error, "");
  std::string contents;
  EXPECT_EQ(DurableFile::Read(path, 100, contents, error), DurableFile::ReadResult::Read);
  EXPECT_EQ(contents, "second");
  int entries = 0;
  for (const auto& entry : std::filesystem::directory_iterator(dir.Path())) {
    (void)entry;
    ++entries;
  }
  EXPECT_EQ(entries, 1);
}

TEST(DurableWrite, ReplaceKeepsTheFilesPermissions) {
  TempDirectory dir;
  const std::string path = dir.File("file.txt");
  std::string error;
  ASSERT_TRUE(DurableFile::Replace(path, "first", error));
  struct stat info {};
  ASSERT_EQ(::stat(path.c_str(), &info), 0);
  EXPECT_EQ(info.st_mode & 0777, 0600U);
  ASSERT_EQ(::chmod(path.c_str(), 0640), 0);
  ASSERT_TRUE(DurableFile::Replace(path, "second", error));
  ASSERT_EQ(::stat(path.c_str(), &info), 0);
  EXPECT_EQ(info.st_mode & 0777, 0640U);
}

TEST(DurableWrite, ReadTellsAMissingFileFromAnUnreadableOne) {
  TempDirectory dir;
  std::string contents = "unchanged";
  std::string error;
  EXPECT_EQ(DurableFile::Read(dir.File("absent"), 100, contents, error),
            DurableFile::ReadResult::Missing);
  EXPECT_EQ(DurableFile::Read(dir.Path(), 100, contents, error), DurableFile::ReadResult::Failed);
  EXPECT_EQ(error, "cannot read: not a regular file but a folder");
}
