// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// What the permanent storage accepts as its file: a regular file of at most
// 16 MiB, read without waiting on a FIFO or reading a device; and the
// temporary files of killed writes, removed at the next load.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <set>
#include <string>

#include "DurableFile.h"
#include "HostPermanentStorage.h"
#include "StorageError.h"
#include "TempDirectory.h"

namespace {

// The text of the StorageError that loading path throws; empty if none.
std::string LoadError(const std::string& path) {
  try {
    HostPermanentStorage storage(path);
  } catch (const StorageError& e) {
    return e.what();
  }
  return {};
}

void MakeFile(const std::string& path, const std::string& contents) {
  std::ofstream(path, std::ios::binary) << contents;
}

}  // namespace

TEST(StorageFileLimits, AFifoIsRefusedWithoutWaitingForAWriter) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  ASSERT_EQ(::mkfifo(path.c_str(), 0600), 0);
  EXPECT_EQ(LoadError(path), path + ": cannot read: not a regular file but a FIFO");
}

TEST(StorageFileLimits, ADeviceIsRefusedWithoutReadingIt) {
  EXPECT_EQ(LoadError("/dev/zero"),
            "/dev/zero: cannot read: not a regular file but a character device");
  EXPECT_EQ(LoadError("/dev/urandom"),
            "/dev/urandom: cannot read: not a regular file but a character device");
}

TEST(StorageFileLimits, AFileLargerThanSixteenMebibytesIsRefusedUnread) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  MakeFile(path, "");
  ASSERT_EQ(::truncate(path.c_str(), static_cast<off_t>(HostPermanentStorage::kLargestFile + 1)),
            0);
  EXPECT_EQ(LoadError(path), path + ": cannot read: larger than 16777216 bytes");
}

TEST(StorageFileLimits, AFileOfSixteenMebibytesLoads) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  const std::string line = "#" + std::string(1022, '-') + "\n";
  std::string contents;
  while (contents.size() + 1024 <= HostPermanentStorage::kLargestFile - 64) {
    contents += line;
  }
  contents += "[\"s\"]\n\"n\" = int 4\n";
  contents += std::string(HostPermanentStorage::kLargestFile - contents.size(), '\n');
  ASSERT_EQ(contents.size(), HostPermanentStorage::kLargestFile);
  MakeFile(path, contents);
  EXPECT_EQ(LoadError(path), "");
  EXPECT_EQ(HostPermanentStorage(path).GetIntValue("s", "n"), 4);
}

TEST(StorageFileLimits, ReadStopsAtTheLimitAlsoWhenTheSizeIsNotKnownBeforehand) {
  TempDirectory dir;
  const std::string path = dir.File("file");
  MakeFile(path, "0123456789");
  std::string contents;
  std::string error;
  EXPECT_EQ(DurableFile::Read(path, 10, contents, error), DurableFile::ReadResult::Read);
  EXPECT_EQ(contents, "0123456789");
  EXPECT_EQ(DurableFile::Read(path, 9, contents, error), DurableFile::ReadResult::Failed);
  EXPECT_EQ(error, "cannot read: larger than 9 bytes");
  EXPECT_EQ(contents, "");
  // A file of the proc file system tells the size 0 and holds more.
  error.clear();
  EXPECT_EQ(DurableFile::Read("/proc/self/status", 100, contents, error),
            DurableFile::ReadResult::Failed);
  EXPECT_EQ(error, "cannot read: larger than 100 bytes");
  EXPECT_EQ(contents, "");
}

TEST(StorageFileLimits, ReplaceNeverPutsAFileInPlaceOfSomethingElse) {
  TempDirectory dir;
  const std::string fifo = dir.File("fifo");
  ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
  std::string error;
  EXPECT_FALSE(DurableFile::Replace(fifo, "text", error));
  EXPECT_EQ(error, "cannot replace: not a regular file but a FIFO");
  EXPECT_FALSE(DurableFile::Replace(dir.Path(), "text", error));
  EXPECT_EQ(error, "cannot replace: not a regular file but a folder");
  struct stat info {};
  ASSERT_EQ(::stat(fifo.c_str(), &info), 0);
  EXPECT_TRUE(S_ISFIFO(info.st_mode));
}

TEST(StorageFileLimits, LoadRemovesTheTemporaryFilesOfKilledWritesOnly) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  MakeFile(path, "[\"s\"]\n\"n\" = int 1\n");
  MakeFile(dir.File("store.txt.tmp-a1B2c3"), "[\"s\"]\n\"n\" = int 2\n");
  MakeFile(dir.File("store.txt.tmp-ZZZZZZ"), "[\"s\"]\n");
  MakeFile(dir.File("store.txt.tmp-abc"), "");                            // not six letters
  MakeFile(dir.File("store.txt.tmp-abcdefg"), "");                        // seven
  MakeFile(dir.File("store.txt.tmp-ab-def"), "");                         // not a letter or digit
  MakeFile(dir.File("other.txt.tmp-abcdef"), "");                         // another file's
  ASSERT_EQ(::mkdir(dir.File("store.txt.tmp-folder").c_str(), 0700), 0);  // not a file
  HostPermanentStorage storage(path);
  EXPECT_EQ(storage.SweptTemporaries(), 2);
  EXPECT_EQ(storage.GetIntValue("s", "n"), 1);
  std::set<std::string> left;
  for (const auto& entry : std::filesystem::directory_iterator(dir.Path())) {
    left.insert(entry.path().filename().string());
  }
  EXPECT_EQ(left, (std::set<std::string>{"store.txt", "store.txt.tmp-abc", "store.txt.tmp-abcdefg",
                                         "store.txt.tmp-ab-def", "other.txt.tmp-abcdef",
                                         "store.txt.tmp-folder"}));
}

TEST(StorageFileLimits, ACorruptFileIsNotSweptAway) {
  TempDirectory dir;
  const std::string path = dir.File("store.txt");
  MakeFile(path, "not storage\n");
  MakeFile(dir.File("store.txt.tmp-abcdef"), "");
  EXPECT_EQ(LoadError(path),
            path + ":1: expected a [\"section\"] header or a \"name\" = TYPE VALUE entry");
  std::ifstream file(path);
  std::string text;
  std::getline(file, text);
  EXPECT_EQ(text, "not storage");
  EXPECT_FALSE(std::filesystem::exists(dir.File("store.txt.tmp-abcdef")));
}
