// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include <dirent.h>
#include <gtest/gtest.h>
#include <sys/socket.h>

#include <chrono>
#include <cstdint>
#include <thread>

#include "HostSocket.h"
#include "HostSocketFactory.h"
#include "LoopbackIo.h"

namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

// Descriptors open in this process.
int OpenDescriptors() {
  DIR* const folder = ::opendir("/proc/self/fd");
  if (folder == nullptr) {
    return -1;
  }
  int count = 0;
  while (::readdir(folder) != nullptr) {
    ++count;
  }
  ::closedir(folder);
  return count;
}

// A socket of a factory and a loopback port that refuses connections.
class Refused : public ::testing::Test {
 protected:
  explicit Refused(milliseconds ceiling = milliseconds(1000))
      : factory_(HostSocket::Timeouts{milliseconds(3000), milliseconds(3000), ceiling}) {}

  void SetUp() override {
    closed_ = LoopbackIo::ClosedTcpPort(port_);
    socket_ = factory_.CreateSocket(0, 1, 0);
    ASSERT_NE(socket_, nullptr) << factory_.LastError();
  }

  // A failed attempt, then a second Connect made inside the first window
  // (the 10 ms after the first attempt began). A thread that was held up
  // past the window tries again once the window has ended, a bounded number
  // of times. True when a pair was made inside the window; attempts gets the
  // attempts the second Connect made.
  bool FailTwiceInsideTheWindow(ISocket* socket, std::uint64_t& attempts) {
    for (int tries = 0; tries < 20; ++tries) {
      std::this_thread::sleep_for(milliseconds(25));
      const auto start = Clock::now();
      EXPECT_EQ(socket->Connect("127.0.0.1", port_), -1);
      const std::uint64_t before = factory_.ConnectAttempts();
      EXPECT_EQ(socket->Connect("127.0.0.1", port_), -1);
      if (Clock::now() - start < ConnectPacing::kFirstWindow) {
        attempts = factory_.ConnectAttempts() - before;
        return true;
      }
      // Held up: wait out every window this made before the next pair.
      std::this_thread::sleep_for(factory_.Pacing().Ceiling());
    }
    return false;
  }

  HostSocketFactory factory_;
  FileDescriptor closed_;
  std::uint16_t port_ = 0;
  ISocket* socket_ = nullptr;
};

class RefusedWithoutPacing : public Refused {
 protected:
  RefusedWithoutPacing() : Refused(milliseconds(0)) {}
};

class RefusedWithShortCeiling : public Refused {
 protected:
  RefusedWithShortCeiling() : Refused(milliseconds(40)) {}
};

}  // namespace

TEST(HostSocketPacing, DefaultCeilingIsOneSecond) {
  EXPECT_EQ(HostSocket::Timeouts().connectBackoff, milliseconds(1000));
  const HostSocketFactory factory;
  EXPECT_EQ(factory.Pacing().Ceiling(), milliseconds(1000));
}

TEST_F(Refused, ConnectInsideTheWindowFailsWithoutAnAttemptOrADescriptor) {
  std::uint64_t attempts = 99;
  ASSERT_TRUE(FailTwiceInsideTheWindow(socket_, attempts));
  EXPECT_EQ(attempts, 0U);
  EXPECT_EQ(socket_->IsBroken(), 1);
  // Inside the window nothing is opened, however often the driver asks.
  const int descriptors = OpenDescriptors();
  const std::uint64_t before = factory_.ConnectAttempts();
  const auto start = Clock::now();
  int refusedAtOnce = 0;
  while (Clock::now() - start < milliseconds(5) && refusedAtOnce < 1000) {
    refusedAtOnce += socket_->Connect("127.0.0.1", port_) == -1 ? 1 : 0;
  }
  if (factory_.ConnectAttempts() == before) {
    EXPECT_EQ(OpenDescriptors(), descriptors);
  }
  EXPECT_GT(refusedAtOnce, 0);
}

TEST_F(Refused, ASocketMadeAgainKeepsTheTargetsWindow) {
  EXPECT_EQ(socket_->Connect("127.0.0.1", port_), -1);
  const auto start = Clock::now();
  factory_.DeleteSocket(socket_, 0);
  ISocket* const again = factory_.CreateSocket(0, 1, 0);
  ASSERT_NE(again, nullptr);
  const std::uint64_t before = factory_.ConnectAttempts();
  EXPECT_EQ(again->Connect("127.0.0.1", port_), -1);
  if (Clock::now() - start < ConnectPacing::kFirstWindow) {
    EXPECT_EQ(factory_.ConnectAttempts(), before);
  }
  EXPECT_EQ(factory_.Pacing().Remembered(), 1U);
}

TEST_F(Refused, ANewTargetIsTriedAtOnce) {
  std::uint16_t otherPort = 0;
  const FileDescriptor other = LoopbackIo::ClosedTcpPort(otherPort);
  EXPECT_EQ(socket_->Connect("127.0.0.1", port_), -1);
  EXPECT_EQ(factory_.ConnectAttempts(), 1U);
  EXPECT_EQ(socket_->Connect("127.0.0.1", otherPort), -1);
  EXPECT_EQ(factory_.ConnectAttempts(), 2U);
  EXPECT_EQ(factory_.Pacing().Remembered(), 2U);
}

TEST_F(Refused, ConnectAfterTheWindowIsARealAttempt) {
  EXPECT_EQ(socket_->Connect("127.0.0.1", port_), -1);
  std::this_thread::sleep_for(ConnectPacing::kFirstWindow + milliseconds(5));
  EXPECT_EQ(socket_->Connect("127.0.0.1", port_), -1);
  EXPECT_EQ(factory_.ConnectAttempts(), 2U);
}

TEST_F(Refused, SuccessForgetsTheWindow) {
  EXPECT_EQ(socket_->Connect("127.0.0.1", port_), -1);
  ASSERT_EQ(::listen(closed_.Get(), 4), 0);
  std::this_thread::sleep_for(ConnectPacing::kFirstWindow + milliseconds(5));
  ASSERT_EQ(socket_->Connect("127.0.0.1", port_), 0);
  EXPECT_EQ(socket_->IsBroken(), 0);
  EXPECT_EQ(factory_.Pacing().Remembered(), 0U);
}

TEST_F(RefusedWithoutPacing, EveryConnectIsARealAttempt) {
  for (int i = 1; i <= 5; ++i) {
    EXPECT_EQ(socket_->Connect("127.0.0.1", port_), -1);
    EXPECT_EQ(factory_.ConnectAttempts(), static_cast<std::uint64_t>(i));
  }
  EXPECT_EQ(factory_.Pacing().Remembered(), 0U);
}

TEST_F(RefusedWithShortCeiling, APeerThatStartsListeningIsConnectedWithinTheCeiling) {
  // Fail for a while, retrying as the driver does, every 10 ms. Windows
  // that kept doubling would have reached 640 ms, from about 630 ms on.
  const auto failing = Clock::now() + milliseconds(650);
  while (Clock::now() < failing) {
    EXPECT_EQ(socket_->Connect("127.0.0.1", port_), -1);
    std::this_thread::sleep_for(milliseconds(10));
  }
  // Without pacing 65 attempts; with windows of 10, 20, 40, 40, ... ms
  // about 17.
  EXPECT_LE(factory_.ConnectAttempts(), 25U);
  ASSERT_EQ(::listen(closed_.Get(), 4), 0);
  const auto listening = Clock::now();
  while (socket_->Connect("127.0.0.1", port_) != 0 &&
         Clock::now() - listening < milliseconds(5000)) {
    std::this_thread::sleep_for(milliseconds(10));
  }
  const auto took = Clock::now() - listening;
  EXPECT_EQ(socket_->IsBroken(), 0);
  // The ceiling plus one retry; the bound is loose for slow builds, and the
  // 640 ms window of a pacing without ceiling would exceed it.
  EXPECT_LT(took, milliseconds(400)) << std::chrono::duration_cast<milliseconds>(took).count();
}
