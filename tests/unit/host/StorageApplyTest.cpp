// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// How the permanent storage finds the values of one apply (those set while a
// thread holds host mutexes), writes them in one replacement, and reports a
// write that fails.

#include <fcntl.h>
#include <gtest/gtest.h>
#include <linux/fs.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <fstream>
#include <future>
#include <iterator>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "DurableFile.h"
#include "HeldHostLocks.h"
#include "HostMutex.h"
#include "HostPermanentStorage.h"
#include "StorageFailure.h"
#include "TempDirectory.h"

namespace {

std::string FileText(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

// Counts the replacements of the file; fails them while failing is set.
struct CountingWriter {
  int writes = 0;
  bool failing = false;
  std::string failure = "cannot write: No space left on device";

  HostPermanentStorage::FileWriter Writer() {
    return [this](const std::string& path, const std::string& contents, std::string& error) {
      ++writes;
      if (failing) {
        error = failure;
        return false;
      }
      return DurableFile::Replace(path, contents, error);
    };
  }
};

class StorageApply : public ::testing::Test {
 protected:
  StorageApply() : path(dir.File("store.txt")) {}

  // The three values of one apply, set while mutex is held.
  static void Apply(HostPermanentStorage& storage, HostMutex& mutex, int round) {
    mutex.Lock();
    storage.SetIntValue("VELT", "gap", round);
    storage.SetIntValue("VELT", "remote_port", 1000 + round);
    storage.SetStringValue("VELT", "tx_prefix", std::to_string(round).c_str());
    mutex.Unlock();
  }

  // Keeps every failure storage reports in failures.
  void CollectFailures(HostPermanentStorage& storage) {
    storage.SetFailureHook([this](const StorageFailure& failure) { failures.push_back(failure); });
  }

  // Stores apply 1 and gives the file's text.
  std::string StoreFirstApply() {
    HostPermanentStorage storage(path);
    Apply(storage, mutex, 1);
    return FileText(path);
  }

  // Apply 2 over a file made unwritable must fail for reason and leave the
  // file as it was.
  void ExpectApplyRefused(const std::string& before, const std::string& reason) {
    HostPermanentStorage storage(path);
    CollectFailures(storage);
    Apply(storage, mutex, 2);
    ASSERT_EQ(failures.size(), 1U);
    EXPECT_EQ(failures[0].reason, reason);
    EXPECT_EQ(FileText(path), before);
    EXPECT_EQ(DurableFile::SweepTemporaries(path), 0);
  }

  TempDirectory dir;
  std::string path;
  CountingWriter counter;
  HostMutex mutex;
  std::vector<StorageFailure> failures;
};

}  // namespace

TEST_F(StorageApply, ValuesSetUnderAHostMutexReachTheFileTogetherWhenItIsReleased) {
  HostPermanentStorage storage(path, counter.Writer());
  mutex.Lock();
  storage.SetIntValue("VELT", "gap", 7);
  storage.SetBoolValue("VELT", "hex_tokens", true);
  storage.SetStringValue("VELT", "rx_prefix", "0A");
  EXPECT_EQ(counter.writes, 0);
  EXPECT_EQ(FileText(path), "");
  // Reads give the newest values before they are written.
  EXPECT_EQ(storage.GetIntValue("VELT", "gap"), 7);
  EXPECT_STREQ(storage.GetStringValue("VELT", "rx_prefix"), "0A");
  mutex.Unlock();
  EXPECT_EQ(counter.writes, 1);
  EXPECT_NE(FileText(path).find("[\"VELT\"]\n"
                                "\"gap\" = int 7\n"
                                "\"hex_tokens\" = bool true\n"
                                "\"rx_prefix\" = text \"0A\"\n"),
            std::string::npos)
      << FileText(path);
}

TEST_F(StorageApply, NestedHoldsWriteAtTheLastRelease) {
  HostPermanentStorage storage(path, counter.Writer());
  HostMutex inner;
  mutex.Lock();
  storage.SetIntValue("VELT", "gap", 1);
  inner.Lock();
  storage.SetIntValue("VELT", "remote_port", 2);
  inner.Unlock();
  EXPECT_EQ(counter.writes, 0);
  storage.SetIntValue("VELT", "local_port", 3);
  mutex.Unlock();
  EXPECT_EQ(counter.writes, 1);
  HostPermanentStorage again(path);
  EXPECT_EQ(again.GetIntValue("VELT", "gap"), 1);
  EXPECT_EQ(again.GetIntValue("VELT", "remote_port"), 2);
  EXPECT_EQ(again.GetIntValue("VELT", "local_port"), 3);
}

TEST_F(StorageApply, AValueSetOutsideAnyHostMutexIsWrittenAtOnce) {
  HostPermanentStorage storage(path, counter.Writer());
  storage.SetIntValue("VELT", "gap", 5);
  EXPECT_EQ(counter.writes, 1);
  storage.SetIntValue("VELT", "remote_port", 6);
  EXPECT_EQ(counter.writes, 2);
  EXPECT_EQ(HostPermanentStorage(path).GetIntValue("VELT", "remote_port"), 6);
}

TEST_F(StorageApply, AnApplyOfValuesAlreadyStoredWritesNothing) {
  HostPermanentStorage storage(path, counter.Writer());
  Apply(storage, mutex, 1);
  Apply(storage, mutex, 1);
  EXPECT_EQ(counter.writes, 1);
  mutex.Lock();
  mutex.Unlock();
  EXPECT_EQ(counter.writes, 1);
}

TEST_F(StorageApply, AThreadsReleaseWritesOnlyTheValuesItSet) {
  HostPermanentStorage storage(path, counter.Writer());
  HostMutex other;
  std::promise<void> firstSet;
  std::promise<void> secondWritten;
  std::thread first([&] {
    mutex.Lock();
    storage.SetIntValue("A", "gap", 1);
    firstSet.set_value();
    secondWritten.get_future().wait();
    storage.SetIntValue("A", "remote_port", 2);
    mutex.Unlock();
  });
  firstSet.get_future().wait();
  other.Lock();
  storage.SetIntValue("B", "gap", 3);
  other.Unlock();
  const std::string afterSecond = FileText(path);
  secondWritten.set_value();
  first.join();
  EXPECT_EQ(afterSecond.find("[\"A\"]"), std::string::npos) << afterSecond;
  EXPECT_NE(afterSecond.find("[\"B\"]\n\"gap\" = int 3\n"), std::string::npos) << afterSecond;
  EXPECT_NE(FileText(path).find("[\"A\"]\n\"gap\" = int 1\n\"remote_port\" = int 2\n"),
            std::string::npos)
      << FileText(path);
  EXPECT_EQ(counter.writes, 2);
}

TEST_F(StorageApply, AFailedWriteIsReportedOnceAndItsValuesHoldAndAreWrittenLater) {
  HostPermanentStorage storage(path, counter.Writer());
  Apply(storage, mutex, 1);
  CollectFailures(storage);
  counter.failing = true;
  Apply(storage, mutex, 2);
  ASSERT_EQ(failures.size(), 1U);
  EXPECT_EQ(failures[0].path, path);
  EXPECT_EQ(failures[0].reason, "cannot write: No space left on device");
  EXPECT_EQ(failures[0].values, 3);
  EXPECT_EQ(failures[0].Text(), "the storage file " + path +
                                    " was not updated (cannot write: No space left on device); "
                                    "the 3 values just applied hold until restart");
  EXPECT_EQ(storage.LastError(), "cannot write: No space left on device");
  EXPECT_EQ(storage.GetIntValue("VELT", "gap"), 2);
  EXPECT_EQ(HostPermanentStorage(path).GetIntValue("VELT", "gap"), 1);

  // The next apply writes everything, the values that failed included.
  counter.failing = false;
  mutex.Lock();
  storage.SetIntValue("VELT", "local_port", 9);
  mutex.Unlock();
  EXPECT_EQ(failures.size(), 1U);
  EXPECT_EQ(storage.LastError(), "");
  HostPermanentStorage again(path);
  EXPECT_EQ(again.GetIntValue("VELT", "gap"), 2);
  EXPECT_EQ(again.GetIntValue("VELT", "remote_port"), 1002);
  EXPECT_STREQ(again.GetStringValue("VELT", "tx_prefix"), "2");
  EXPECT_EQ(again.GetIntValue("VELT", "local_port"), 9);
}

TEST_F(StorageApply, AFailedSingleValueIsReportedInTheSingular) {
  HostPermanentStorage storage(path, counter.Writer());
  CollectFailures(storage);
  counter.failing = true;
  counter.failure = "cannot flush: Input/output error";
  storage.SetIntValue("VELT", "gap", 4);
  ASSERT_EQ(failures.size(), 1U);
  EXPECT_EQ(failures[0].Text(), "the storage file " + path +
                                    " was not updated (cannot flush: Input/output error); the "
                                    "value just applied holds until restart");
}

TEST_F(StorageApply, AReadOnlyFileIsNotReplaced) {
  const std::string before = StoreFirstApply();
  ASSERT_EQ(::chmod(path.c_str(), 0444), 0);
  ExpectApplyRefused(before, "cannot write: Permission denied");
}

TEST_F(StorageApply, ValuesOfAHoldNotReleasedAreWrittenWhenTheStorageGoes) {
  auto storage = std::make_unique<HostPermanentStorage>(path, counter.Writer());
  mutex.Lock();
  storage->SetIntValue("VELT", "gap", 11);
  storage.reset();
  EXPECT_EQ(counter.writes, 1);
  mutex.Unlock();  // finds the storage gone and does nothing
  EXPECT_EQ(counter.writes, 1);
  EXPECT_EQ(HostPermanentStorage(path).GetIntValue("VELT", "gap"), 11);
}

TEST_F(StorageApply, AFileThatWouldPassTheLimitIsNotWritten) {
  HostPermanentStorage storage(path, counter.Writer());
  CollectFailures(storage);
  const std::string large(HostPermanentStorage::kLargestFile, 'x');
  storage.SetStringValue("VELT", "rx_prefix", large.c_str());
  EXPECT_EQ(counter.writes, 0);
  ASSERT_EQ(failures.size(), 1U);
  EXPECT_EQ(failures[0].reason, "cannot write: the file would be larger than 16777216 bytes");
}

TEST(HeldHostLocks, ActionsRunInOrderAfterTheLastReleaseOnThatThread) {
  std::vector<int> ran;
  HostMutex outer;
  HostMutex inner;
  EXPECT_FALSE(HeldHostLocks::Any());
  HeldHostLocks::AtLastUnlock([&ran] { ran.push_back(0); });
  EXPECT_EQ(ran, std::vector<int>{0});
  outer.Lock();
  inner.Lock();
  EXPECT_TRUE(HeldHostLocks::Any());
  HeldHostLocks::AtLastUnlock([&ran] { ran.push_back(1); });
  std::thread([] { EXPECT_FALSE(HeldHostLocks::Any()); }).join();
  inner.Unlock();
  HeldHostLocks::AtLastUnlock([&ran] { ran.push_back(2); });
  EXPECT_EQ(ran, std::vector<int>{0});
  outer.Unlock();
  EXPECT_FALSE(HeldHostLocks::Any());
  EXPECT_EQ(ran, (std::vector<int>{0, 1, 2}));
  // A release without a hold never makes the count negative.
  HeldHostLocks::Left();
  outer.Lock();
  EXPECT_TRUE(HeldHostLocks::Any());
  outer.Unlock();
  EXPECT_FALSE(HeldHostLocks::Any());
}

namespace {

// Makes a file immutable (chattr +i) for as long as the object lives.
class Immutable {
 public:
  explicit Immutable(const std::string& path) : fd_(::open(path.c_str(), O_RDONLY | O_CLOEXEC)) {
    int flags = 0;
    set_ = fd_ >= 0 && ::ioctl(fd_, FS_IOC_GETFLAGS, &flags) == 0 &&
           ::ioctl(fd_, FS_IOC_SETFLAGS, &(flags |= FS_IMMUTABLE_FL)) == 0;
  }
  Immutable(const Immutable&) = delete;
  Immutable& operator=(const Immutable&) = delete;
  Immutable(Immutable&&) = delete;
  Immutable& operator=(Immutable&&) = delete;
  ~Immutable() {
    int flags = 0;
    if (set_ && ::ioctl(fd_, FS_IOC_GETFLAGS, &flags) == 0) {
      flags &= ~FS_IMMUTABLE_FL;
      ::ioctl(fd_, FS_IOC_SETFLAGS, &flags);
    }
    if (fd_ >= 0) {
      ::close(fd_);
    }
  }
  bool Set() const { return set_; }

 private:
  int fd_;
  bool set_ = false;
};

}  // namespace

TEST_F(StorageApply, AnImmutableFileIsNotReplaced) {
  const std::string before = StoreFirstApply();
  const Immutable immutable(path);
  if (!immutable.Set()) {
    GTEST_SKIP() << "cannot make a file immutable here (needs root and a file system that can)";
  }
  ExpectApplyRefused(before, "cannot write: Operation not permitted");
}
