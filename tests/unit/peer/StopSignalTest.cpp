// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-peer/StopSignal.h"

#include <gtest/gtest.h>
#include <poll.h>
#include <unistd.h>

#include <chrono>
#include <thread>

using std::chrono::milliseconds;
using veltpeer::StopSignal;
using veltpeer::WaitResult;

TEST(StopSignal, WaitTimesOutAtItsDeadline) {
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  const auto begin = StopSignal::Clock::now();
  EXPECT_EQ(stop.Wait(-1, 0, begin + milliseconds(30)), WaitResult::kTimedOut);
  EXPECT_GE(StopSignal::Clock::now() - begin, milliseconds(30));
  EXPECT_FALSE(stop.Raised());
}

TEST(StopSignal, RaiseFromAnotherThreadWakesAWait) {
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  std::thread raiser([&] {
    std::this_thread::sleep_for(milliseconds(30));
    stop.Raise();
  });
  EXPECT_EQ(stop.Wait(-1, 0, StopSignal::Clock::time_point::max()), WaitResult::kStopped);
  raiser.join();
  EXPECT_TRUE(stop.Raised());
  EXPECT_FALSE(stop.Expired());
  EXPECT_FALSE(stop.SleepFor(milliseconds(1000)));
  stop.Raise();
  EXPECT_TRUE(stop.Raised());
}

TEST(StopSignal, EndOfLifeCountsAsRaised) {
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  // Before the end of life a sleep runs its course (the end lies far enough
  // ahead that no scheduling delay reaches it).
  stop.EndAt(StopSignal::Clock::now() + std::chrono::seconds(60));
  EXPECT_TRUE(stop.SleepFor(milliseconds(5)));
  EXPECT_FALSE(stop.Raised());
  const auto begin = StopSignal::Clock::now();
  stop.EndAt(begin + milliseconds(30));
  EXPECT_EQ(stop.Wait(-1, 0, StopSignal::Clock::time_point::max()), WaitResult::kStopped);
  EXPECT_GE(StopSignal::Clock::now() - begin, milliseconds(30));
  EXPECT_TRUE(stop.Expired());
  EXPECT_TRUE(stop.Raised());
}

TEST(StopSignal, ReadyDescriptorIsReported) {
  StopSignal stop;
  std::string error;
  ASSERT_TRUE(stop.Open(error)) << error;
  int ends[2] = {-1, -1};
  ASSERT_EQ(::pipe(ends), 0);
  const veltpeer::FileDescriptor readEnd(ends[0]);
  const veltpeer::FileDescriptor writeEnd(ends[1]);
  EXPECT_EQ(stop.Wait(readEnd.Get(), POLLIN, StopSignal::Clock::now() + milliseconds(10)),
            WaitResult::kTimedOut);
  EXPECT_EQ(stop.Wait(writeEnd.Get(), POLLOUT, StopSignal::Clock::time_point::max()),
            WaitResult::kReady);
}
