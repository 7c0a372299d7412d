// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "protlib/TimeStamp.h"

#include <gtest/gtest.h>

#include <sys/time.h>

namespace {

unsigned long long WallClockMilliseconds() {
  timeval now{};
  gettimeofday(&now, nullptr);
  return static_cast<unsigned long long>(now.tv_sec) * 1000ULL +
         static_cast<unsigned long long>(now.tv_usec) / 1000ULL;
}

}  // namespace

TEST(CurrentTimeStamp, MillisecondsSinceEpochFromWallClock) {
  const unsigned long long before = WallClockMilliseconds();
  const unsigned long long stamp = ProtUtilsN::currentTimeStamp();
  const unsigned long long after = WallClockMilliseconds();
  EXPECT_GE(stamp, before);
  EXPECT_LE(stamp, after);
  // 2020-01-01 as a sanity floor: the value is milliseconds, not seconds.
  EXPECT_GT(stamp, 1577836800000ULL);
}
