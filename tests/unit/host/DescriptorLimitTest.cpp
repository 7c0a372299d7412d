// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "DescriptorLimit.h"

#include <gtest/gtest.h>
#include <sys/resource.h>

#include <string>

namespace {

// Keeps the process's limit of open files and puts it back when it goes.
class SavedLimit {
 public:
  SavedLimit() { ::getrlimit(RLIMIT_NOFILE, &saved_); }
  SavedLimit(const SavedLimit&) = delete;
  SavedLimit& operator=(const SavedLimit&) = delete;
  SavedLimit(SavedLimit&&) = delete;
  SavedLimit& operator=(SavedLimit&&) = delete;
  ~SavedLimit() { ::setrlimit(RLIMIT_NOFILE, &saved_); }

  const rlimit& Saved() const { return saved_; }
  bool SetSoft(rlim_t soft) const {
    rlimit limit = saved_;
    limit.rlim_cur = soft;
    return ::setrlimit(RLIMIT_NOFILE, &limit) == 0;
  }

 private:
  rlimit saved_{};
};

}  // namespace

TEST(DescriptorLimit, ChannelsNeedFourEachAndAReserve) {
  EXPECT_EQ(DescriptorLimit::ForChannels(0), 64U);
  EXPECT_EQ(DescriptorLimit::ForChannels(256), 1088U);
}

TEST(DescriptorLimit, TheSoftLimitIsRaisedToWhatIsNeededAndNeverLowered) {
  const SavedLimit saved;
  if (saved.Saved().rlim_max != RLIM_INFINITY && saved.Saved().rlim_max < 300) {
    GTEST_SKIP() << "the hard limit of open files is below 300";
  }
  ASSERT_TRUE(saved.SetSoft(128));
  std::string error;
  EXPECT_TRUE(DescriptorLimit::Ensure(200, error)) << error;
  EXPECT_EQ(DescriptorLimit::Current(), 200U);
  EXPECT_TRUE(DescriptorLimit::Ensure(100, error)) << error;
  EXPECT_EQ(DescriptorLimit::Current(), 200U);
  EXPECT_EQ(error, "");
}

TEST(DescriptorLimit, MoreThanTheHardLimitIsRefusedWithBothFigures) {
  const SavedLimit saved;
  if (saved.Saved().rlim_max == RLIM_INFINITY) {
    GTEST_SKIP() << "the hard limit of open files is unlimited";
  }
  const auto hard = static_cast<std::size_t>(saved.Saved().rlim_max);
  std::string error;
  EXPECT_FALSE(DescriptorLimit::Ensure(hard + 1, error));
  EXPECT_EQ(error, "up to " + std::to_string(hard + 1) +
                       " open files are needed, but the limit is " + std::to_string(hard) +
                       " (ulimit -Hn)");
  EXPECT_EQ(DescriptorLimit::Current(), static_cast<std::size_t>(saved.Saved().rlim_cur));
}
