// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <arpa/inet.h>
#include <gtest/gtest.h>

#include <chrono>
#include <vector>

#include "ConnectPacing.h"

namespace {

using std::chrono::milliseconds;
using Target = ConnectPacing::Target;

const ConnectPacing::Clock::time_point kStart{std::chrono::hours(1)};

Target At(std::uint32_t host, std::uint16_t port, std::uint16_t localPort = 0) {
  return Target{htonl(host), port, localPort};
}

// The windows that follow count consecutive failures, each made the moment
// the previous window ended, as a driver retrying every few milliseconds
// does.
std::vector<long long> Windows(ConnectPacing& pacing, const Target& target, int count) {
  std::vector<long long> windows;
  auto now = kStart;
  for (int i = 0; i < count; ++i) {
    pacing.Failed(target, now);
    const milliseconds window = pacing.WindowLeft(target, now);
    windows.push_back(window.count());
    now += window;
  }
  return windows;
}

}  // namespace

TEST(ConnectPacing, WindowDoublesFromTenMillisecondsUpToTheCeiling) {
  ConnectPacing pacing(milliseconds(1000));
  EXPECT_EQ(Windows(pacing, At(0x7F000001, 80), 10),
            (std::vector<long long>{10, 20, 40, 80, 160, 320, 640, 1000, 1000, 1000}));
}

TEST(ConnectPacing, DefaultCeilingIsOneSecond) {
  EXPECT_EQ(ConnectPacing::kDefaultCeiling, milliseconds(1000));
  ConnectPacing pacing;
  EXPECT_EQ(pacing.Ceiling(), milliseconds(1000));
  EXPECT_EQ(Windows(pacing, At(0x7F000001, 80), 9).back(), 1000);
}

TEST(ConnectPacing, ACeilingBelowTheFirstWindowIsTheOnlyWindow) {
  ConnectPacing pacing(milliseconds(4));
  EXPECT_EQ(Windows(pacing, At(0x7F000001, 80), 3), (std::vector<long long>{4, 4, 4}));
}

TEST(ConnectPacing, CeilingOfZeroNeverHoldsAnAttemptBack) {
  ConnectPacing pacing(milliseconds(0));
  const Target target = At(0x7F000001, 80);
  pacing.Failed(target, kStart);
  EXPECT_TRUE(pacing.MayAttempt(target, kStart));
  EXPECT_EQ(pacing.Remembered(), 0U);
}

TEST(ConnectPacing, AttemptsInsideTheWindowAreHeldBackUntilItsEnd) {
  ConnectPacing pacing(milliseconds(1000));
  const Target target = At(0x7F000001, 80);
  EXPECT_TRUE(pacing.MayAttempt(target, kStart));
  pacing.Failed(target, kStart);
  EXPECT_FALSE(pacing.MayAttempt(target, kStart));
  EXPECT_FALSE(pacing.MayAttempt(target, kStart + milliseconds(9)));
  EXPECT_EQ(pacing.WindowLeft(target, kStart + milliseconds(9)), milliseconds(1));
  EXPECT_TRUE(pacing.MayAttempt(target, kStart + milliseconds(10)));
}

TEST(ConnectPacing, SuccessForgetsTheTarget) {
  ConnectPacing pacing(milliseconds(1000));
  const Target target = At(0x7F000001, 80);
  Windows(pacing, target, 6);
  pacing.Succeeded(target);
  EXPECT_EQ(pacing.Remembered(), 0U);
  EXPECT_TRUE(pacing.MayAttempt(target, kStart));
  EXPECT_EQ(Windows(pacing, target, 2), (std::vector<long long>{10, 20}));
}

TEST(ConnectPacing, EveryTargetHasAWindowOfItsOwn) {
  ConnectPacing pacing(milliseconds(1000));
  const Target absent = At(0x7F000001, 80);
  Windows(pacing, absent, 5);
  const auto now = kStart + milliseconds(1);
  // Another port, another address, or another local port of the socket is
  // another target: its first attempt is made at once.
  EXPECT_TRUE(pacing.MayAttempt(At(0x7F000001, 81), now));
  EXPECT_TRUE(pacing.MayAttempt(At(0x7F000002, 80), now));
  EXPECT_TRUE(pacing.MayAttempt(At(0x7F000001, 80, 5000), now));
  pacing.Failed(At(0x7F000001, 81), now);
  EXPECT_EQ(pacing.WindowLeft(At(0x7F000001, 81), now), milliseconds(10));
}

TEST(ConnectPacing, ATargetLeftAloneForACeilingAfterItsWindowStartsAgain) {
  ConnectPacing pacing(milliseconds(100));
  const Target target = At(0x7F000001, 80);
  EXPECT_EQ(Windows(pacing, target, 5), (std::vector<long long>{10, 20, 40, 80, 100}));
  // The last window ended at 250 ms; a failure just inside a ceiling after
  // that still doubles, one at a ceiling or later starts from the first.
  pacing.Failed(target, kStart + milliseconds(349));
  EXPECT_EQ(pacing.WindowLeft(target, kStart + milliseconds(349)), milliseconds(100));
  pacing.Failed(target, kStart + milliseconds(549));
  EXPECT_EQ(pacing.WindowLeft(target, kStart + milliseconds(549)), milliseconds(10));
}

TEST(ConnectPacing, TheTableKeepsOnlyTargetsTriedRecently) {
  ConnectPacing pacing(milliseconds(100));
  auto now = kStart;
  for (std::uint16_t port = 1; port <= 5000; ++port) {
    pacing.Failed(At(0x7F000001, port), now);
    now += milliseconds(1);
  }
  // Each target is forgotten a window and a ceiling (110 ms) after its
  // failure, once the table next grows to its sweep size; a few hundred at
  // most are remembered at any time.
  EXPECT_LE(pacing.Remembered(), 300U);
  EXPECT_GE(pacing.Remembered(), 110U);
  EXPECT_FALSE(pacing.MayAttempt(At(0x7F000001, 5000), now - milliseconds(1)));
}
