// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

// A console session ends cleanly on SIGTERM, SIGINT, .quit and the end of its
// input: the instances are stopped (their connections close) and the exit
// status tells whether every command succeeded.

#include <gtest/gtest.h>
#include <signal.h>

#include <optional>
#include <string>

#include "HostProcess.h"
#include "LoopbackPeer.h"
#include "ScratchFolder.h"

namespace {

using Line = std::optional<std::string>;

class Shutdown : public ::testing::Test {
 protected:
  Shutdown()
      : peer_(LoopbackPeer::Setup()),
        host_({"--storage", scratch_.File("storage.ini"), "--config", peer_.Config()}) {}

  void Connect() {
    ASSERT_TRUE(peer_.Ok()) << peer_.StartError();
    ASSERT_EQ(host_.Ask("connect ON"), Line("OK"));
    ASSERT_TRUE(host_.AskUntil("get_stat", "Connected"));
  }

  ScratchFolder scratch_;
  LoopbackPeer peer_;
  HostProcess host_;
};

}  // namespace

TEST_F(Shutdown, SigtermEndsTheSessionWithZero) {
  Connect();
  host_.Signal(SIGTERM);
  EXPECT_EQ(host_.Wait(), std::optional<int>(0));
  EXPECT_TRUE(peer_.WaitClosed());
  EXPECT_EQ(host_.ReadOutput(), "");
  EXPECT_EQ(host_.ReadErrors(), "");
}

TEST_F(Shutdown, SigintEndsTheSessionWithZero) {
  Connect();
  host_.Signal(SIGINT);
  EXPECT_EQ(host_.Wait(), std::optional<int>(0));
  EXPECT_TRUE(peer_.WaitClosed());
  EXPECT_EQ(host_.ReadErrors(), "");
}

TEST_F(Shutdown, SignalAfterAFailedCommandEndsWithOne) {
  EXPECT_EQ(host_.Ask("connect maybe"), Line("ERROR: wrong value"));
  host_.Signal(SIGTERM);
  EXPECT_EQ(host_.Wait(), std::optional<int>(1));
}

TEST_F(Shutdown, SigtermEndsARunningWatch) {
  Connect();
  host_.Send(".watch\n");
  EXPECT_EQ(host_.ReadLine(std::chrono::milliseconds(200)), std::nullopt);
  host_.Signal(SIGTERM);
  EXPECT_EQ(host_.Wait(), std::optional<int>(0));
  EXPECT_EQ(host_.ReadErrors(), "");
}

TEST_F(Shutdown, EndOfInputEndsTheSession) {
  Connect();
  host_.CloseInput();
  EXPECT_EQ(host_.Wait(), std::optional<int>(0));
  EXPECT_TRUE(peer_.WaitClosed());
}

TEST_F(Shutdown, QuitEndsTheSessionAndSkipsTheRest) {
  Connect();
  host_.Send(".quit\nget_stat\n");
  EXPECT_EQ(host_.Wait(), std::optional<int>(0));
  EXPECT_EQ(host_.ReadOutput(), "");
  EXPECT_TRUE(peer_.WaitClosed());
}
